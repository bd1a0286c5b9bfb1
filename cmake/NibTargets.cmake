find_package(ZLIB REQUIRED)

# Sources are collected by folder: a new .cpp in a subsystem's folder belongs to the library.
function(nib_sources out)
    set(found)
    foreach(folder IN LISTS ARGN)
        file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${folder}/*.cpp)
        list(APPEND found ${sources})
    endforeach()
    set(${out} ${found} PARENT_SCOPE)
endfunction()

# NibRendererObjects: the library's code once, for the shared library and for the unit tests, which
# link it with a simulated EGL and GL in place of the real ones.
function(nib_add_renderer)
    nib_sources(sources ${ARGN})
    nib_sources(arithmetic math)
    nib_optimize_fully(${arithmetic} thread/TaskMemory.cpp thread/WorkerThreadImpl.cpp
        gles/Crc32.cpp gles/GraphicsObject.cpp gles/ParameterBindingImpl.cpp)
    add_library(NibRendererObjects OBJECT ${sources})
    target_include_directories(NibRendererObjects PUBLIC
        ${CMAKE_CURRENT_SOURCE_DIR} ${CMAKE_CURRENT_SOURCE_DIR}/include)
    target_compile_definitions(NibRendererObjects PRIVATE NIB_BUILDING_RENDERER)
    target_link_libraries(NibRendererObjects PUBLIC NibBase ZLIB::ZLIB PRIVATE NibBuildFlags NibShippedCode)

    add_library(NibRenderer SHARED)
    add_library(NibRenderer::NibRenderer ALIAS NibRenderer)
    target_link_libraries(NibRenderer
        PRIVATE NibRendererObjects NibBuildFlags ZLIB::ZLIB ${NIB_GL_LIBRARIES} PUBLIC NibBase)
    nib_link_shipped(NibRenderer)
    nib_bind_own_functions(NibRenderer)
    target_include_directories(NibRenderer PUBLIC
        $<BUILD_INTERFACE:${CMAKE_CURRENT_SOURCE_DIR}/include>
        $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
    target_compile_features(NibRenderer INTERFACE cxx_std_17)
    set_target_properties(NibRenderer PROPERTIES
        VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR})
    if(NOT NIB_SANITIZE)
        target_link_options(NibRenderer PRIVATE -Wl,--no-undefined)
    endif()
endfunction()

if(ANDROID)
    set(NIB_GL_LIBRARIES EGL GLESv3 android log dl)
else()
    find_library(NIB_EGL_LIBRARY EGL REQUIRED)
    find_library(NIB_GLES_LIBRARY GLESv2 REQUIRED)
    set(NIB_GL_LIBRARIES ${NIB_EGL_LIBRARY} ${NIB_GLES_LIBRARY} ${CMAKE_DL_LIBS})
endif()
