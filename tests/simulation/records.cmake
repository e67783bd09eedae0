# The same runs are recorded alike, bit for bit, by processes whose memory lies elsewhere and holds something else.
foreach(perturbed IN ITEMS 0 85)
    execute_process(COMMAND ${CMAKE_COMMAND} -E env MALLOC_PERTURB_=${perturbed}
        ${SIMULATE} --records --seed 1 --operations 20000
        OUTPUT_VARIABLE records_${perturbed} COMMAND_ERROR_IS_FATAL ANY)
endforeach()
string(REGEX MATCHALL "\n" runs "${records_0}")
list(LENGTH runs count)
if(count LESS 10 OR NOT records_0 MATCHES "[0-9][0-9][0-9] octets")
    message(FATAL_ERROR "nothing was recorded:\n${records_0}")
endif()
if(NOT records_0 STREQUAL records_85)
    message(FATAL_ERROR "the same runs left other records:\n${records_0}\nand\n${records_85}")
endif()
message("${count} runs were recorded alike")
