# What `cmake --install` puts where: headers, the two libraries, the tool, and what CMake and
# pkg-config need to find them. The installed tree may be moved as a whole.
include(CMakePackageConfigHelpers)

# Components: Libraries to run programs, Development to build them, Tool for the program nib.
install(DIRECTORY include/nib DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT Development
    FILES_MATCHING PATTERN "*.h")

# The libraries find each other beside themselves, the tool finds them from its own place.
if(NOT ANDROID)
    set_target_properties(NibRenderer NibBase PROPERTIES INSTALL_RPATH "$ORIGIN")
endif()
install(TARGETS NibRenderer NibBase EXPORT NibRendererTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT Libraries NAMELINK_COMPONENT Development)
if(TARGET nib)
    file(RELATIVE_PATH toLibraries
        ${CMAKE_INSTALL_FULL_BINDIR} ${CMAKE_INSTALL_FULL_LIBDIR})
    set_target_properties(nib PROPERTIES INSTALL_RPATH "$ORIGIN/${toLibraries}")
    install(TARGETS nib RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT Tool)
endif()

# find_package(NibRenderer): the targets NibRenderer::NibRenderer and NibRenderer::NibBase.
set(packageDirectory ${CMAKE_INSTALL_LIBDIR}/cmake/NibRenderer)
configure_package_config_file(cmake/NibRendererConfig.cmake.in NibRendererConfig.cmake
    INSTALL_DESTINATION ${packageDirectory} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(NibRendererConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(EXPORT NibRendererTargets NAMESPACE NibRenderer:: DESTINATION ${packageDirectory}
    COMPONENT Development)
install(
    FILES ${PROJECT_BINARY_DIR}/NibRendererConfig.cmake
          ${PROJECT_BINARY_DIR}/NibRendererConfigVersion.cmake
    DESTINATION ${packageDirectory} COMPONENT Development)

# pkg-config nibrenderer, with paths that start at the file itself.
if(NOT ANDROID)
    file(RELATIVE_PATH toPrefix ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
    string(REGEX REPLACE "/$" "" NIB_PC_TO_PREFIX "${toPrefix}")
    file(RELATIVE_PATH NIB_PC_INCLUDEDIR ${CMAKE_INSTALL_PREFIX} ${CMAKE_INSTALL_FULL_INCLUDEDIR})
    file(RELATIVE_PATH NIB_PC_LIBDIR ${CMAKE_INSTALL_PREFIX} ${CMAKE_INSTALL_FULL_LIBDIR})
    configure_file(cmake/nibrenderer.pc.in nibrenderer.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/nibrenderer.pc
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT Development)
endif()
