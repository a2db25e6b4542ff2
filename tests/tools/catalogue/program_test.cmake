# Runs the catalogue tool on small sources, good and bad, and compares what it prints.
function(expect name status output errors)
    execute_process(
        COMMAND ${TOOL} ${ARGN}
        WORKING_DIRECTORY ${DIRECTORY}
        RESULT_VARIABLE actualStatus
        OUTPUT_VARIABLE actualOutput
        ERROR_VARIABLE actualErrors
    )
    foreach(what Status Output Errors)
        string(TOLOWER ${what} expected)
        if(NOT "${actual${what}}" MATCHES "${${expected}}")
            message(FATAL_ERROR "${name}: ${expected} is '${actual${what}}', expected '${${expected}}'")
        endif()
    endforeach()
endfunction()

file(WRITE ${DIRECTORY}/lists.codes "list pair = Low | High\n")
file(WRITE ${DIRECTORY}/good.codes "maker Ford\nP1001, P1002 Sensor Circuit {pair}\n")
file(WRITE ${DIRECTORY}/bad.codes "maker Ford\nP1001 Sensor\n\nP10G1 Sensor\nmaker Audi\n")

expect(dump 0 "^Ford\tP1001\tSensor Circuit Low\nFord\tP1002\tSensor Circuit High\n$" "^$" --dump lists.codes good.codes)
expect(counts 0 "maker\tFord\t2\n" "^$" --counts lists.codes good.codes)
expect(output 0 "^$" "^$" --output good.cpp lists.codes good.codes)
expect(
    refused 1 "^$" "^bad.codes:4: 'P10G1' is no trouble code\nbad.codes:5: the file has named its maker already\n$" --dump
    bad.codes
)
expect(missing 1 "^$" "^nowhere.codes:0: the file cannot be read\n" --dump nowhere.codes)
expect(noSources 2 "^$" "^usage: " --dump)
expect(unknownOption 2 "^$" "^usage: " --counst good.codes)

file(READ ${DIRECTORY}/good.cpp table)
if(NOT table MATCHES "Sensor Circuit High")
    message(FATAL_ERROR "the written table lacks a text")
endif()
