# Compares what PROGRAM prints with the committed listing EXPECTED, and shows the difference.
execute_process(COMMAND ${PROGRAM} OUTPUT_FILE ${FOUND} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND diff -u ${EXPECTED} ${FOUND} COMMAND_ERROR_IS_FATAL ANY)
