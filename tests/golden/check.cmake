# Runs ravel-dump over a capture and compares what it prints with the committed
# golden file. With -DUPDATE=ON it rewrites the golden file instead (on purpose
# only, after reading the difference).
execute_process(
  COMMAND ${TOOL} ${ARGS} ${CAPTURE}
  RESULT_VARIABLE status
  OUTPUT_VARIABLE printed
  ERROR_VARIABLE report)
if(NOT status EQUAL 0)
  message(FATAL_ERROR "ravel-dump exited with ${status}:\n${report}")
endif()
if(UPDATE)
  file(WRITE ${GOLDEN} "${printed}")
  return()
endif()
file(READ ${GOLDEN} expected)
if(NOT printed STREQUAL expected)
  file(WRITE ${GOLDEN}.actual "${printed}")
  message(FATAL_ERROR "ravel-dump output differs from ${GOLDEN}; see ${GOLDEN}.actual "
                      "(diff them; regenerate with -DUPDATE=ON only on purpose)")
endif()
