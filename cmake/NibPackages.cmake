# `cpack -G DEB` in a build folder: the Debian packages libnibrenderer1, libnibrenderer-dev and nib,
# one for each component of the installation; `cpack -G TGZ`: all of it as an archive.
if(ANDROID)
    return()
endif()

set(CPACK_PACKAGE_NAME nibrenderer)
set(CPACK_PACKAGE_VENDOR "The NibRenderer developers")
set(CPACK_PACKAGE_CONTACT "The NibRenderer developers <nibrenderer@localhost>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "${PROJECT_DESCRIPTION}")
set(CPACK_RESOURCE_FILE_LICENSE ${PROJECT_SOURCE_DIR}/LICENSE)
set(CPACK_STRIP_FILES ON)
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_COMPONENTS_ALL Libraries Development)
if(TARGET nib)
    list(APPEND CPACK_COMPONENTS_ALL Tool)
endif()

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# The tool finds the library that is packed with it, installed or not.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS
    ${PROJECT_BINARY_DIR} ${PROJECT_BINARY_DIR}/base)

set(runtime libnibrenderer${PROJECT_VERSION_MAJOR})
set(sameVersion "${runtime} (= ${PROJECT_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})")
set(CPACK_DEBIAN_LIBRARIES_PACKAGE_NAME ${runtime})
set(CPACK_DEBIAN_LIBRARIES_PACKAGE_SECTION libs)
set(CPACK_COMPONENT_LIBRARIES_DESCRIPTION "${PROJECT_DESCRIPTION}: the libraries")
set(CPACK_DEBIAN_LIBRARIES_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_LIBRARIES_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/debian/triggers)
file(WRITE ${PROJECT_BINARY_DIR}/debian/triggers "activate-noawait ldconfig\n")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libnibrenderer-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "${sameVersion}, libegl-dev, libgles-dev")
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION
    "${PROJECT_DESCRIPTION}: headers, CMake package and pkg-config file")
set(CPACK_DEBIAN_TOOL_PACKAGE_NAME nib)
set(CPACK_DEBIAN_TOOL_PACKAGE_SECTION graphics)
set(CPACK_DEBIAN_TOOL_PACKAGE_DEPENDS "${sameVersion}")
set(CPACK_COMPONENT_TOOL_DESCRIPTION "${PROJECT_DESCRIPTION}: the command-line tool")

include(CPack)
