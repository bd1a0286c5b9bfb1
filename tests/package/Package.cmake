# One step of the package's test; see CMakeLists.txt beside it for the variables.

function(run)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE output
        ERROR_VARIABLE errors)
    message(STATUS "${output}${errors}")
    if(NOT result EQUAL 0)
        list(JOIN ARGN " " command)
        message(FATAL_ERROR "${command}: ${result}")
    endif()
    set(output "${output}" PARENT_SCOPE)
endfunction()

function(expect_output text)
    if(NOT output MATCHES "${text}")
        message(FATAL_ERROR "expected \"${text}\" in: ${output}")
    endif()
endfunction()

# What a test draws is drawn without a window system, and cached beside the test.
set(environment ${CMAKE_COMMAND} -E env --unset=DISPLAY --unset=LD_LIBRARY_PATH
    EGL_PLATFORM=surfaceless NIB_CACHE_DIR=${WORK}/cache/sdk)

if(STEP STREQUAL "install")
    separate_arguments(targets UNIX_COMMAND "${TARGETS}")
    run(${CMAKE_COMMAND} --build ${BUILD} --target ${targets})
    # Installed at one place and used at another: nothing may remember where it was.
    file(REMOVE_RECURSE ${PREFIX} ${PREFIX}-first)
    run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${PREFIX}-first)
    file(RENAME ${PREFIX}-first ${PREFIX})

elseif(STEP STREQUAL "files")
    foreach(file lib/libNibRenderer.so lib/libNibBase.so lib/pkgconfig/nibrenderer.pc
            lib/cmake/NibRenderer/NibRendererConfig.cmake
            lib/cmake/NibRenderer/NibRendererConfigVersion.cmake)
        string(REGEX REPLACE "^lib/" "${LIBDIR}/" file ${file})
        if(NOT EXISTS ${PREFIX}/${file})
            message(FATAL_ERROR "${file} is not installed")
        endif()
    endforeach()
    file(GLOB headers RELATIVE ${SOURCE}/include ${SOURCE}/include/nib/*.h)
    file(GLOB installed RELATIVE ${PREFIX}/include ${PREFIX}/include/nib/* ${PREFIX}/include/*.h)
    if(NOT headers STREQUAL installed)
        message(FATAL_ERROR "installed headers: ${installed}; expected: ${headers}")
    endif()
    file(GLOB_RECURSE texts ${PREFIX}/${LIBDIR}/*.cmake ${PREFIX}/${LIBDIR}/*.pc)
    foreach(text IN LISTS texts)
        file(READ ${text} content)
        foreach(place ${SOURCE} ${BUILD} ${PREFIX})
            string(FIND "${content}" "${place}" position)
            if(NOT position EQUAL -1)
                message(FATAL_ERROR "${text} remembers ${place}")
            endif()
        endforeach()
    endforeach()

elseif(STEP STREQUAL "find_package")
    file(REMOVE_RECURSE ${WORK})
    run(${CMAKE_COMMAND} -S ${CONSUMER} -B ${WORK} -G ${GENERATOR}
        -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_PREFIX_PATH=${PREFIX}
        -DCMAKE_FIND_USE_PACKAGE_REGISTRY=OFF)
    run(${CMAKE_COMMAND} --build ${WORK})
    run(${environment} ${WORK}/consumer)
    expect_output("consumer: ok")
    run(${environment} ${WORK}/base_consumer)
    expect_output("base consumer: ok")

elseif(STEP STREQUAL "other_version")
    file(REMOVE_RECURSE ${WORK})
    file(MAKE_DIRECTORY ${WORK}/source)
    file(WRITE ${WORK}/source/CMakeLists.txt
        "cmake_minimum_required(VERSION 3.22)\nproject(Other LANGUAGES CXX)\n"
        "find_package(NibRenderer 2.0 QUIET)\n"
        "if(NibRenderer_FOUND)\nmessage(FATAL_ERROR \"2.0 was found\")\nendif()\n"
        "find_package(NibRenderer 0.9 QUIET)\n"
        "if(NibRenderer_FOUND)\nmessage(FATAL_ERROR \"0.9 was found\")\nendif()\n"
        "find_package(NibRenderer 1.0.0 REQUIRED)\n")
    run(${CMAKE_COMMAND} -S ${WORK}/source -B ${WORK} -G ${GENERATOR}
        -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_PREFIX_PATH=${PREFIX})

elseif(STEP STREQUAL "pkg_config")
    find_program(PKG_CONFIG pkg-config REQUIRED)
    file(REMOVE_RECURSE ${WORK})
    file(MAKE_DIRECTORY ${WORK})
    set(packages ${CMAKE_COMMAND} -E env PKG_CONFIG_PATH=${PREFIX}/${LIBDIR}/pkgconfig
        ${PKG_CONFIG})
    run(${packages} --modversion nibrenderer)
    expect_output("^1\\.0\\.0\n$")
    run(${packages} --cflags nibrenderer)
    separate_arguments(cflags UNIX_COMMAND "${output}")
    run(${packages} --libs nibrenderer)
    separate_arguments(libs UNIX_COMMAND "${output}")
    run(${COMPILER} -std=c++17 -Wall -Wextra -Wpedantic -Werror ${cflags} ${CONSUMER}/main.cpp
        ${libs} -Wl,-rpath,${PREFIX}/${LIBDIR} -o ${WORK}/consumer)
    run(${environment} ${WORK}/consumer)
    expect_output("consumer: ok")

elseif(STEP STREQUAL "tool")
    run(${environment} ${PREFIX}/${BINDIR}/nib --version)
    expect_output("1\\.0\\.0")

else()
    message(FATAL_ERROR "no such step: ${STEP}")
endif()
