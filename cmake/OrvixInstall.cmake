# What `cmake --install` gives; docs/sdk.md describes it.
include(CMakePackageConfigHelpers)

install(TARGETS OrvixCore OrvixCoreUI braeutil MSSCCI BuildOptions EXPORT OrvixCore
  RUNTIME DESTINATION bin
  ARCHIVE DESTINATION lib
  INCLUDES DESTINATION include)
install(TARGETS orvix RUNTIME DESTINATION bin)
install(FILES $<TARGET_FILE:archive_msscci> DESTINATION bin)
install(FILES $<TARGET_FILE:archive> DESTINATION bin/plugins)

install(DIRECTORY include/ companions/braeutil/include/ DESTINATION include FILES_MATCHING PATTERN "*.h"
  PATTERN BraeDiagnostics.h EXCLUDE) # only the development build has it
# Side by side as in the tree, so that the links between them lead somewhere.
install(DIRECTORY samples docs DESTINATION share/OrvixCore)

set(package lib/cmake/OrvixCore)
configure_package_config_file(cmake/OrvixCoreConfig.cmake.in ${PROJECT_BINARY_DIR}/OrvixCoreConfig.cmake
  INSTALL_DESTINATION ${package} NO_SET_AND_CHECK_MACRO NO_CHECK_REQUIRED_COMPONENTS_MACRO)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/OrvixCoreConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/OrvixCoreConfig.cmake ${PROJECT_BINARY_DIR}/OrvixCoreConfigVersion.cmake
  DESTINATION ${package})
install(EXPORT OrvixCore NAMESPACE OrvixCore:: FILE OrvixCoreTargets.cmake DESTINATION ${package})
