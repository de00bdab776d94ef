# What `cmake --install` gives; docs/sdk.md describes it. The files for debuggers are the component "debug",
# everything else is "sdk".
include(CMakePackageConfigHelpers)
set(CMAKE_INSTALL_DEFAULT_COMPONENT_NAME sdk)

# orvix_install_debug_file(<module> <folder>): installs the debug information of a module, a target or a file, beside
# the module in <folder>. Of GCC it is a file that is split off at installation: the installed module is stripped and
# names it.
function(orvix_install_debug_file module folder)
  if(IS_ABSOLUTE ${module})
    set(file ${module})
    cmake_path(GET file FILENAME name)
    cmake_path(REPLACE_EXTENSION file LAST_ONLY .pdb OUTPUT_VARIABLE pdb)
  else()
    set(file $<TARGET_FILE:${module}>)
    set(name $<TARGET_FILE_NAME:${module}>)
    set(pdb $<TARGET_PDB_FILE:${module}>)
  endif()
  if(MSVC)
    install(FILES ${pdb} DESTINATION ${folder} COMPONENT debug OPTIONAL)
    return()
  endif()
  set(debug_file ${PROJECT_BINARY_DIR}/debug/${name}.debug)
  install(CODE "
    file(MAKE_DIRECTORY \"${PROJECT_BINARY_DIR}/debug\")
    execute_process(COMMAND_ERROR_IS_FATAL ANY
      COMMAND \"${CMAKE_OBJCOPY}\" --only-keep-debug \"${file}\" \"${debug_file}\")"
    ALL_COMPONENTS)
  install(CODE "
    execute_process(COMMAND_ERROR_IS_FATAL ANY
      COMMAND \"${CMAKE_OBJCOPY}\" --strip-all \"--add-gnu-debuglink=${debug_file}\" \"${file}\"
        \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${folder}/${name}\")")
  install(FILES ${debug_file} DESTINATION ${folder} COMPONENT debug)
endfunction()

install(TARGETS OrvixCore OrvixCoreUI braeutil MSSCCI Settings Waiting BuildOptions EXPORT OrvixCore
  RUNTIME DESTINATION bin
  ARCHIVE DESTINATION lib
  INCLUDES DESTINATION include)
install(TARGETS orvix desk scc_host64 RUNTIME DESTINATION bin)
install(FILES $<TARGET_FILE:scc_proxy> DESTINATION bin)
install(PROGRAMS ${CMAKE_BINARY_DIR}/bin/scc_host32.exe DESTINATION bin)
install(FILES $<TARGET_FILE:archive_msscci> DESTINATION bin)
install(FILES $<TARGET_FILE:archive> $<TARGET_FILE:git> DESTINATION bin/plugins)
foreach(target OrvixCore OrvixCoreUI braeutil orvix desk archive_msscci scc_proxy scc_host64)
  orvix_install_debug_file(${target} bin)
endforeach()
orvix_install_debug_file(${CMAKE_BINARY_DIR}/bin/scc_host32.exe bin)
orvix_install_debug_file(archive bin/plugins)
orvix_install_debug_file(git bin/plugins)

install(DIRECTORY include/ companions/braeutil/include/ DESTINATION include FILES_MATCHING PATTERN "*.h"
  PATTERN BraeDiagnostics.h EXCLUDE) # only the development build has it

# How Visual Studio shows the records. It finds the file in OrvixCore.pdb; a project may also have it among its sources.
set(natvis ${PROJECT_SOURCE_DIR}/cmake/OrvixCore.natvis)
if(MSVC)
  target_link_options(OrvixCore PRIVATE /NATVIS:${natvis})
  set_property(TARGET OrvixCore APPEND PROPERTY LINK_DEPENDS ${natvis})
endif()
install(FILES ${natvis} DESTINATION share/OrvixCore)

install(FILES cmake/SDK-README.md DESTINATION . RENAME README.md)
install(FILES CHANGELOG.md DESTINATION .)
# Side by side as in the tree, so that the links between them lead somewhere.
install(DIRECTORY samples templates docs DESTINATION share/OrvixCore
  PATTERN build EXCLUDE PATTERN Doxyfile EXCLUDE PATTERN "*.dox" EXCLUDE) # the reference is built from the tree

set(package lib/cmake/OrvixCore)
configure_package_config_file(cmake/OrvixCoreConfig.cmake.in ${PROJECT_BINARY_DIR}/OrvixCoreConfig.cmake
  INSTALL_DESTINATION ${package} NO_SET_AND_CHECK_MACRO NO_CHECK_REQUIRED_COMPONENTS_MACRO)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/OrvixCoreConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/OrvixCoreConfig.cmake ${PROJECT_BINARY_DIR}/OrvixCoreConfigVersion.cmake
  DESTINATION ${package})
install(EXPORT OrvixCore NAMESPACE OrvixCore:: FILE OrvixCoreTargets.cmake DESTINATION ${package})
