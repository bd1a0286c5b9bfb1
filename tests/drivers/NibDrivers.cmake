# The drivers that tests run on, each chosen by the environment of the test's process. A driver that
# is missing has its tests skipped, with the reason.
#
# nib_discover_on_drivers(PROGRAM [FILTER]) registers the tests of a program, those that FILTER (in
# gtest's form) names when given, once for each driver, labelled driver-NAME.

# ANGLE and the old SwiftShader, which no distribution has as libraries; scripts/setup drivers puts
# them here.
set(NIB_DRIVERS_FOLDER ${PROJECT_SOURCE_DIR}/build/drivers)

set(NIB_DRIVERS surfaceless x11)
if(NIB_TEST_ALL_DRIVERS)
    list(APPEND NIB_DRIVERS softpipe zink wayland angle angle-lavapipe swiftshader)
endif()

# Mesa's llvmpipe, without a window system and in windows of whatever X server DISPLAY names.
set(NIB_DRIVER_surfaceless EGL_PLATFORM=surfaceless)
set(NIB_DRIVER_x11 EGL_PLATFORM=x11)
# Mesa's other software renderer; and GL on Vulkan, for which it has a software driver, too.
set(lavapipe /usr/share/vulkan/icd.d/lvp_icd.x86_64.json)
set(NIB_DRIVER_softpipe EGL_PLATFORM=x11 GALLIUM_DRIVER=softpipe)
set(NIB_DRIVER_zink EGL_PLATFORM=x11 LIBGL_ALWAYS_SOFTWARE=1 MESA_LOADER_DRIVER_OVERRIDE=zink
    VK_ICD_FILENAMES=${lavapipe})
# llvmpipe in a window of the compositor that WAYLAND_DISPLAY names.
set(NIB_DRIVER_wayland EGL_PLATFORM=wayland)
# ANGLE on the Vulkan driver that comes with it and on Mesa's; SwiftShader's own OpenGL ES.
set(angle ${NIB_DRIVERS_FOLDER}/angle)
set(swiftshader ${NIB_DRIVERS_FOLDER}/swiftshader)
set(NIB_DRIVER_angle
    NIB_DRIVER_FOLDER=${angle} LD_LIBRARY_PATH=${angle} ANGLE_DEFAULT_PLATFORM=swiftshader)
set(NIB_DRIVER_angle-lavapipe
    NIB_DRIVER_FOLDER=${angle} LD_LIBRARY_PATH=${angle} VK_ICD_FILENAMES=${lavapipe})
set(NIB_DRIVER_swiftshader NIB_DRIVER_FOLDER=${swiftshader} LD_LIBRARY_PATH=${swiftshader})

function(nib_discover_on_drivers program)
    foreach(driver IN LISTS NIB_DRIVERS)
        set(environment NIB_DRIVER=${driver} ${NIB_DRIVER_${driver}})
        set(tests ${program}_${driver})
        # One test at a time where there are windows, since they cover one another.
        set(lock "")
        if("EGL_PLATFORM=x11" IN_LIST environment)
            set(lock RESOURCE_LOCK display)
        endif()
        gtest_discover_tests(${program} NO_PRETTY_VALUES DISCOVERY_TIMEOUT 120 TEST_SUFFIX .${driver}
            TEST_LIST ${tests} TEST_FILTER "${ARGN}"
            PROPERTIES TIMEOUT 300 SKIP_RETURN_CODE 77 LABELS "driver-${driver}" ${lock})
        # Apart, because the discovery splits lists.
        set(file ${CMAKE_CURRENT_BINARY_DIR}/${tests}_environment.cmake)
        file(CONFIGURE OUTPUT ${file} @ONLY CONTENT
            "set_tests_properties(\${@tests@} PROPERTIES ENVIRONMENT \"@environment@\")\n")
        set_property(DIRECTORY APPEND PROPERTY TEST_INCLUDE_FILES ${file})
    endforeach()
endfunction()
