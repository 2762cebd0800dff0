# Runs ravel-make-sample into OUTPUT and fails unless the file equals EXPECTED.
execute_process(COMMAND ${TOOL} ${OUTPUT} RESULT_VARIABLE result)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "ravel-make-sample failed: ${result}")
endif()
execute_process(COMMAND ${CMAKE_COMMAND} -E compare_files ${OUTPUT} ${EXPECTED} RESULT_VARIABLE different)
if(NOT different EQUAL 0)
  message(FATAL_ERROR "${OUTPUT} differs from ${EXPECTED}: regenerate the sample "
                      "(ravel-make-sample samples/oneseg-brazil.ts) and review the change")
endif()
