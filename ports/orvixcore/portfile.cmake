# vcpkg install orvixcore --overlay-ports=ports
# builds the tree that this port is part of. vcpkg does not see changes of the tree: run "vcpkg remove orvixcore"
# before you install it again.
vcpkg_check_linkage(ONLY_DYNAMIC_LIBRARY)
get_filename_component(source_path "${CMAKE_CURRENT_LIST_DIR}/../.." ABSOLUTE)

vcpkg_cmake_configure(SOURCE_PATH "${source_path}" OPTIONS -DBUILD_TESTING=OFF)
vcpkg_cmake_install()
vcpkg_cmake_config_fixup(PACKAGE_NAME OrvixCore CONFIG_PATH lib/cmake/OrvixCore)
vcpkg_copy_tools(TOOL_NAMES orvix AUTO_CLEAN)

# vcpkg wants these files once, or in another place.
file(REMOVE_RECURSE "${CURRENT_PACKAGES_DIR}/debug/include" "${CURRENT_PACKAGES_DIR}/debug/share")
file(REMOVE
  "${CURRENT_PACKAGES_DIR}/README.md" "${CURRENT_PACKAGES_DIR}/debug/README.md"
  "${CURRENT_PACKAGES_DIR}/CHANGELOG.md" "${CURRENT_PACKAGES_DIR}/debug/CHANGELOG.md")

file(INSTALL "${CMAKE_CURRENT_LIST_DIR}/usage" DESTINATION "${CURRENT_PACKAGES_DIR}/share/${PORT}")
set(VCPKG_POLICY_SKIP_COPYRIGHT_CHECK enabled) # no licence has been chosen yet
