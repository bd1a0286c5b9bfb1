# Fails where SOURCE, compiled for arm64 by CLANG as the library is, multiplies and adds in one
# instruction. No library of that processor is needed: the headers of this one, INCLUDES, are told
# that it is still the one they know.
if(NOT CLANG)
    message("Skipped: there is no clang++, which compiles for arm64")
    return()
endif()

set(headers -D__x86_64__ "-D__builtin_ia32_pause()=0")
foreach(folder IN LISTS INCLUDES)
    list(APPEND headers -isystem ${folder})
endforeach()
list(FILTER FLAGS INCLUDE REGEX "^-ffp-")

execute_process(
    COMMAND ${CLANG} --target=aarch64-linux-gnu -std=c++20 -O3 -DNDEBUG -w ${FLAGS} ${headers}
        -I${ROOT} -I${ROOT}/include -S ${SOURCE} -o -
    OUTPUT_VARIABLE assembly ERROR_VARIABLE errors RESULT_VARIABLE result)
if(result)
    message(FATAL_ERROR "${SOURCE} does not compile for arm64:\n${errors}")
endif()
if(NOT assembly MATCHES "\tfmul\tv[0-9]+.4s")
    message(FATAL_ERROR "${SOURCE} multiplies nothing in vector registers")
endif()
if(assembly MATCHES "\t(fn?m(add|sub)|fml[as])[^\n]*")
    message(FATAL_ERROR "${SOURCE} multiplies and adds in one: ${CMAKE_MATCH_0}")
endif()
