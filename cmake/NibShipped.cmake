# How the two shipped libraries are made: what is fixed for their size, for the time their load takes,
# and for what others see of them.

# Of their code, also where a test or a benchmark links it directly. Debug builds do without.
add_library(NibShippedCode INTERFACE)
target_compile_options(NibShippedCode INTERFACE
    # A tenth smaller than -O3; docs/performance.md has what that costs and what it does not.
    $<$<CONFIG:Release>:-O2 -fno-plt>
    # Sections of their own, so that the linker leaves out what nothing uses.
    $<$<NOT:$<CONFIG:Debug>>:-ffunction-sections -fdata-sections>
    # Exported functions may be put into each other, as Clang does anyway.
    $<$<NOT:$<CONFIG:Debug>>:-fno-semantic-interposition>)

# What runs for every task, every mesh and every matrix, where the compiler's last steps pay.
function(nib_optimize_fully)
    set_property(SOURCE ${ARGN} APPEND PROPERTY COMPILE_OPTIONS $<$<CONFIG:Release>:-O3>)
endfunction()

# Tools that watch a program keep names of their own in the libraries, and look for them by name.
set(NIB_EXPORTS_ALL OFF)
if(NIB_SANITIZE OR NIB_FUZZ_COVERAGE OR CMAKE_CXX_FLAGS MATCHES "coverage|sanitize")
    set(NIB_EXPORTS_ALL ON)
endif()

# Only what is ours is exported. A library stays once it is loaded: its threads run on, and threads of
# the program end in its code.
function(nib_link_shipped library)
    target_link_libraries(${library} PRIVATE NibShippedCode)
    target_link_options(${library} PRIVATE -Wl,--gc-sections -Wl,-z,nodelete)
    if(NOT NIB_EXPORTS_ALL)
        set(exports ${PROJECT_SOURCE_DIR}/cmake/exports.map)
        target_link_options(${library} PRIVATE -Wl,--version-script=${exports})
        set_property(TARGET ${library} APPEND PROPERTY LINK_DEPENDS ${exports})
    endif()
endfunction()

# Functions of the library that it calls itself, or has in a table, are bound when it is linked: no
# look-up by name is left for the load. Type information and variables stay one in the process. Not
# for the base library: a program may take over the log, into which that writes, too.
function(nib_bind_own_functions library)
    if(NOT NIB_EXPORTS_ALL)
        target_link_options(${library} PRIVATE -Wl,-Bsymbolic-functions)
    endif()
endfunction()
