# cmake -D PORTFILE=FILE -D CURRENT_PACKAGES_DIR=FOLDER -P port.cmake: runs a portfile without vcpkg. The functions of
# vcpkg print their arguments; the installation puts the files there of which a portfile has to take care.
cmake_minimum_required(VERSION 3.25)
set(PORT orvixcore)

foreach(function vcpkg_check_linkage vcpkg_cmake_configure vcpkg_cmake_config_fixup vcpkg_copy_tools)
  cmake_language(EVAL CODE "
    function(${function})
      message(STATUS \"${function} \${ARGN}\")
    endfunction()")
endforeach()

function(vcpkg_cmake_install)
  message(STATUS "vcpkg_cmake_install ${ARGN}")
  foreach(configuration "" debug/)
    foreach(file README.md CHANGELOG.md bin/OrvixCore.dll include/IOrvixServices.h share/OrvixCore/docs/sdk.md)
      file(WRITE ${CURRENT_PACKAGES_DIR}/${configuration}${file} "")
    endforeach()
  endforeach()
endfunction()

include(${PORTFILE})
message(STATUS "copyright check ${VCPKG_POLICY_SKIP_COPYRIGHT_CHECK}")
