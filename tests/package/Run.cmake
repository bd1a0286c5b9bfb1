# run(COMMAND...): stops the test where the command fails; leaves what it printed in `output`.
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

# Stops the test as skipped where a program of the system is missing.
macro(need_program name)
    find_program(found_${name} ${name})
    if(NOT found_${name})
        message(STATUS "skipped: ${name} is not installed")
        return()
    endif()
endmacro()

function(expect_output text)
    if(NOT output MATCHES "${text}")
        message(FATAL_ERROR "expected \"${text}\" in: ${output}")
    endif()
endfunction()
