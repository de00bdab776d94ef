# What every target of the tree has in common. Projects of their own in the tree include it too.
cmake_path(GET CMAKE_CURRENT_LIST_DIR PARENT_PATH orvix_root)
set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)

# All run-time files together, under the same names from every tool chain.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
foreach(configuration RELEASE DEBUG)
  set(CMAKE_RUNTIME_OUTPUT_DIRECTORY_${configuration} ${CMAKE_BINARY_DIR}/bin)
endforeach()
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)
set(CMAKE_SHARED_LIBRARY_PREFIX "")
set(CMAKE_SHARED_MODULE_PREFIX "")

# How a module is built; installed as well, for plug-ins and hosts outside the tree. One C++ run-time inside each module
# for GCC, so that a DLL needs only Windows and its companions.
add_library(BuildOptions INTERFACE)
target_compile_features(BuildOptions INTERFACE cxx_std_20)
target_compile_definitions(BuildOptions INTERFACE UNICODE _UNICODE NOMINMAX WIN32_LEAN_AND_MEAN _WIN32_WINNT=0x0A00)
if(MSVC)
  target_compile_options(BuildOptions INTERFACE /utf-8 /permissive- /EHsc)
  target_compile_definitions(BuildOptions INTERFACE _CRT_SECURE_NO_WARNINGS)
else()
  target_link_options(BuildOptions INTERFACE -static -static-libgcc -static-libstdc++)
endif()

# The tree's own sources also compile without a warning, and with the debug information that OrvixInstall.cmake
# installs: with GCC functions and lines, which cost no time, and with paths that begin at the root of the tree.
add_library(orvix_build INTERFACE)
target_link_libraries(orvix_build INTERFACE BuildOptions)
if(MSVC)
  set(CMAKE_MSVC_DEBUG_INFORMATION_FORMAT ProgramDatabase)
  target_compile_options(orvix_build INTERFACE /W4 /WX)
  # /DEBUG alone would switch off what a release leaves out.
  target_link_options(orvix_build INTERFACE /DEBUG $<$<NOT:$<CONFIG:Debug>>:/OPT:REF,ICF>)
else()
  target_compile_options(orvix_build INTERFACE -Wall -Wextra -Wshadow -Wconversion -Werror
    $<$<CONFIG:Release>:-g1 -fdebug-prefix-map=${orvix_root}=.>)
endif()

# orvix_precompile(<target>): the target takes the common headers precompiled. With GCC only: definitions of a single
# target do no harm there, while Microsoft's compiler wants one set of definitions for all.
function(orvix_precompile target)
  if(MINGW)
    target_precompile_headers(${target} REUSE_FROM orvix_precompiled)
    # GCC 12 takes inlined code of a precompiled header for the target's own and warns about copies in wchar.h.
    target_compile_options(${target} PRIVATE
      $<$<CONFIG:Release>:-Wno-array-bounds> $<$<CONFIG:Release>:-Wno-stringop-overread>)
  endif()
endfunction()
if(MINGW)
  file(CONFIGURE OUTPUT ${PROJECT_BINARY_DIR}/precompiled.cpp CONTENT "")
  add_library(orvix_precompiled OBJECT ${PROJECT_BINARY_DIR}/precompiled.cpp)
  target_precompile_headers(orvix_precompiled PRIVATE ${orvix_root}/cmake/Precompiled.h)
  target_link_libraries(orvix_precompiled PRIVATE orvix_build)
endif()

# orvix_windows_path(<variable> <path>): the path as a Windows program sees it. Wine maps "/" to drive Z.
function(orvix_windows_path variable path)
  if(CMAKE_HOST_WIN32)
    set(${variable} ${path} PARENT_SCOPE)
  else()
    set(${variable} Z:${path} PARENT_SCOPE)
  endif()
endfunction()

option(ORVIX_COVERAGE "GCC: the library counts which of its lines and branches run; see scripts/coverage" OFF)

# orvix_floor(<name> USES <floor>... SOURCES <file>...)
# One folder of the library, as the static library orvix_<name>. Its include path is its own folder and the floors that
# it uses, with the floors below those: an include of a higher floor does not compile.
function(orvix_floor name)
  cmake_parse_arguments(arg "" "" "USES;SOURCES" ${ARGN})
  add_library(orvix_${name} STATIC ${arg_SOURCES})
  target_include_directories(orvix_${name} PUBLIC ${CMAKE_CURRENT_SOURCE_DIR})
  target_compile_definitions(orvix_${name} PRIVATE ORVIXCORE_BUILD)
  list(TRANSFORM arg_USES PREPEND orvix_)
  target_link_libraries(orvix_${name} PUBLIC ${arg_USES} PRIVATE orvix_build)
  if(ORVIX_COVERAGE)
    # The checks of the debug build would be branches. Its precompiled headers belong to them.
    target_compile_options(orvix_${name} PRIVATE --coverage -fno-sanitize=undefined)
    target_link_options(orvix_${name} PUBLIC --coverage)
  else()
    orvix_precompile(orvix_${name})
  endif()
endfunction()

# orvix_link_floors(<target>): links every floor whole, as OrvixCore.dll needs it and test programs that use what the
# DLL does not export.
function(orvix_link_floors target)
  target_link_libraries(${target} PRIVATE orvix_core)
  set_property(TARGET ${target} PROPERTY LINK_LIBRARY_OVERRIDE
    WHOLE_ARCHIVE,orvix_records,orvix_notify,orvix_config,orvix_providers,orvix_core)
endfunction()
