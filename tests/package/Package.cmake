# One step of the package's test; see CMakeLists.txt beside it for the variables.

include(${CMAKE_CURRENT_LIST_DIR}/Run.cmake)

# What a test draws is drawn without a window system, and cached beside the test.
set(environment ${CMAKE_COMMAND} -E env --unset=DISPLAY --unset=LD_LIBRARY_PATH
    EGL_PLATFORM=surfaceless NIB_CACHE_DIR=${WORK}/cache/sdk)

function(run_consumers folder)
    run(${environment} ${folder}/consumer)
    expect_output("consumer: ok")
    run(${environment} ${folder}/base_consumer)
    expect_output("base consumer: ok")
endfunction()

# Builds the programs of somebody who has the installation below a prefix, and runs them.
function(use_prefix prefix)
    run(${CMAKE_COMMAND} -S ${CONSUMER} -B ${WORK}/use -G ${GENERATOR}
        -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_PREFIX_PATH=${prefix}
        -DCMAKE_FIND_USE_PACKAGE_REGISTRY=OFF)
    run(${CMAKE_COMMAND} --build ${WORK}/use)
    run_consumers(${WORK}/use)
endfunction()

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
    use_prefix(${PREFIX})

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

elseif(STEP STREQUAL "subdirectory")
    file(REMOVE_RECURSE ${WORK})
    # As deep as the port's build, whose objects are the same.
    set(build ${WORK}/build)
    run(${CMAKE_COMMAND} -S ${CONSUMER} -B ${build} -G ${GENERATOR} -DCMAKE_CXX_FLAGS=-O0
        -DCMAKE_CXX_COMPILER=${COMPILER} -DNIB_SOURCE=${SOURCE})
    run(${CMAKE_COMMAND} --build ${build})
    run_consumers(${build})
    # The tree inside another build adds the libraries, not its tests and tools.
    if(EXISTS ${build}/NibRenderer/tests OR EXISTS ${build}/NibRenderer/tools)
        message(FATAL_ERROR "tests or tools are built within another project")
    endif()

elseif(STEP STREQUAL "deb")
    need_program(dpkg-shlibdeps)
    file(REMOVE_RECURSE ${WORK})
    run(${CMAKE_CPACK_COMMAND} -G DEB --config ${BUILD}/CPackConfig.cmake -B ${WORK}/packages)
    file(GLOB packages ${WORK}/packages/*.deb)
    set(fields)
    foreach(package IN LISTS packages)
        run(dpkg-deb -x ${package} ${WORK}/root)
        run(dpkg-deb -f ${package} Package Version Depends)
        string(APPEND fields "${output}")
    endforeach()
    set(output "${fields}")
    expect_output("Package: libnibrenderer1\nVersion: 1\\.0\\.0-1\nDepends: [^\n]*libegl1")
    expect_output("Package: libnibrenderer-dev\nVersion: 1\\.0\\.0-1\nDepends: libnibrenderer1 ")
    expect_output("Package: nib\nVersion: 1\\.0\\.0-1\nDepends: libnibrenderer1 ")
    use_prefix(${WORK}/root/usr)

elseif(STEP STREQUAL "vcpkg")
    run(${CMAKE_COMMAND} -DPORT_DIR=${SOURCE}/packaging/vcpkg/nibrenderer -DWORK=${WORK}
        -DGENERATOR=${GENERATOR} -DCOMPILER=${COMPILER}
        -P ${CMAKE_CURRENT_LIST_DIR}/vcpkg/RunPort.cmake)
    use_prefix(${WORK}/packages)

elseif(STEP STREQUAL "conan")
    need_program(python3)
    run(${CMAKE_COMMAND} -E env PYTHONPATH=${CMAKE_CURRENT_LIST_DIR}/conan
        PYTHONDONTWRITEBYTECODE=1 python3 ${CMAKE_CURRENT_LIST_DIR}/conan/run_recipe.py
        ${SOURCE}/packaging/conan/conanfile.py ${WORK} ${COMPILER} ${GENERATOR})
    expect_output("nibrenderer/1\.0\.0: ok")
    use_prefix(${WORK}/package)

elseif(STEP STREQUAL "aar")
    need_program(python3)
    file(REMOVE_RECURSE ${WORK})
    file(MAKE_DIRECTORY ${WORK})
    set(libraries ${BUILD}/libNibRenderer.so ${BUILD}/base/libNibBase.so)
    run(python3 ${SOURCE}/scripts/make-aar --any-machine -o ${WORK}/nib.aar ${libraries})
    run(${CMAKE_COMMAND} -E chdir ${WORK} ${CMAKE_COMMAND} -E tar xf nib.aar)
    # The layout that Android's build tools look for.
    foreach(module NibBase NibRenderer)
        set(folder ${WORK}/prefab/modules/${module})
        file(READ ${folder}/module.json settings)
        string(JSON library GET "${settings}" library_name)
        string(JSON exported LENGTH "${settings}" export_libraries)
        string(APPEND found "${library}:${exported} ")
        file(READ ${folder}/libs/android.arm64-v8a/abi.json settings)
        foreach(key abi api ndk stl static)
            string(JSON value GET "${settings}" ${key})
            string(APPEND found "${value} ")
        endforeach()
        if(NOT EXISTS ${folder}/libs/android.arm64-v8a/lib${module}.so
           OR NOT EXISTS ${folder}/include/nib/nib.h)
            message(FATAL_ERROR "${module} lacks its library or its headers")
        endif()
    endforeach()
    set(each "arm64-v8a 23 26 c\\+\\+_shared OFF ")
    set(output "${found}")
    expect_output("^libNibBase:0 ${each}libNibRenderer:1 ${each}$")
    file(READ ${WORK}/prefab/prefab.json output)
    expect_output("\"schema_version\": 2")
    expect_output("\"name\": \"NibRenderer\"")
    expect_output("\"version\": \"1\\.0\\.0\"")
    file(READ ${WORK}/AndroidManifest.xml output)
    expect_output("android:minSdkVersion=\"23\"")
    # Libraries of this machine are no Android libraries; nothing is left of the attempt.
    execute_process(COMMAND python3 ${SOURCE}/scripts/make-aar -o ${WORK}/wrong.aar ${libraries}
        RESULT_VARIABLE result ERROR_VARIABLE output)
    expect_output("libNibRenderer.so: built for machine [0-9]+, not for arm64")
    file(GLOB left ${WORK}/wrong.aar*)
    if(result EQUAL 0 OR left)
        message(FATAL_ERROR "a library of this machine was packed for Android")
    endif()

elseif(STEP STREQUAL "tool")
    run(${environment} ${PREFIX}/${BINDIR}/nib --version)
    expect_output("1\\.0\\.0")

else()
    message(FATAL_ERROR "no such step: ${STEP}")
endif()
