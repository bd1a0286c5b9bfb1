# Builds the tree that this port stands in. EGL and GLES come from the system (libegl-dev,
# libgles-dev; the NDK on Android).
get_filename_component(SOURCE_PATH "${CURRENT_PORT_DIR}/../../.." ABSOLUTE)

# The library exists once in a process: it owns the process's EGL display.
vcpkg_check_linkage(ONLY_DYNAMIC_LIBRARY)

vcpkg_cmake_configure(
    SOURCE_PATH "${SOURCE_PATH}"
    OPTIONS
        -DNIB_BUILD_TESTS=OFF
        -DNIB_BUILD_TOOLS=OFF
        -DNIB_BUILD_EXAMPLES=OFF
        -DNIB_INSTALL=ON)
vcpkg_cmake_install()
vcpkg_cmake_config_fixup(PACKAGE_NAME NibRenderer CONFIG_PATH lib/cmake/NibRenderer)
vcpkg_fixup_pkgconfig()

file(REMOVE_RECURSE "${CURRENT_PACKAGES_DIR}/debug/include" "${CURRENT_PACKAGES_DIR}/debug/share")
file(INSTALL "${CMAKE_CURRENT_LIST_DIR}/usage" DESTINATION "${CURRENT_PACKAGES_DIR}/share/${PORT}")
vcpkg_install_copyright(FILE_LIST "${SOURCE_PATH}/LICENSE")
