# Runs an example in a fresh copy of the data and compares its output.
file(REMOVE_RECURSE ${WORK})
file(COPY ${DATA}/ DESTINATION ${WORK})
list(REMOVE_ITEM COMMAND "")
execute_process(COMMAND ${COMMAND} WORKING_DIRECTORY ${WORK}
    OUTPUT_VARIABLE output RESULT_VARIABLE status)
file(READ ${EXPECTED} expected)
if(NOT status EQUAL 0 OR NOT output STREQUAL expected)
    message(FATAL_ERROR "exit status ${status}, and printed\n${output}\ninstead of\n${expected}")
endif()
