# The undefined C symbols of the objects in OBJECTS, apart from GL, EGL and what a C++ compiler adds
# by itself, are those of symbols.txt.
cmake_minimum_required(VERSION 3.22)

file(STRINGS ${CMAKE_CURRENT_LIST_DIR}/symbols.txt lines REGEX "^[^#]")
list(JOIN lines " " allowed)
separate_arguments(allowed UNIX_COMMAND "${allowed}")

file(GLOB_RECURSE objects ${OBJECTS}/*.o)
if(NOT objects)
    message(FATAL_ERROR "no objects in ${OBJECTS}")
endif()
execute_process(COMMAND ${NM} -u ${objects} OUTPUT_VARIABLE output RESULT_VARIABLE result)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "${NM}: ${result}")
endif()
string(REGEX MATCHALL " U [^\n]+" used "${output}")
list(TRANSFORM used REPLACE "^ U " "")
list(REMOVE_DUPLICATES used)
list(SORT used)
set(unknown)
foreach(symbol IN LISTS used)
    if(NOT symbol IN_LIST allowed
       AND NOT symbol MATCHES "^_Z|^gl[A-Z]|^egl[A-Z]|^__cxa_|^__gxx_|^_Unwind_|^__dynamic_cast$"
       AND NOT symbol MATCHES "^__(errno_location|libc_single_threaded|tls_get_addr|dso_handle)$"
       # Inlined from the condition variable of this machine's C++ library; Android's does without.
       AND NOT symbol STREQUAL "pthread_cond_clockwait"
       AND NOT symbol MATCHES "^__stack_chk_fail$|^_GLOBAL_OFFSET_TABLE_$")
        list(APPEND unknown ${symbol})
    endif()
endforeach()
if(unknown)
    message(FATAL_ERROR "not known to be in Android from API level 23: ${unknown}")
endif()
list(LENGTH used count)
message(STATUS "${count} symbols")
