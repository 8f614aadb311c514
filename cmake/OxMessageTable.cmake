# cmake -DOXTOOL=... -DMESSAGES=... -DOUTPUT=... -P OxMessageTable.cmake
# Writes the table of the messages the library logs (oxtool messages --markdown).
execute_process(COMMAND ${OXTOOL} messages --markdown --messages ${MESSAGES}
    OUTPUT_FILE ${OUTPUT} RESULT_VARIABLE result)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "oxtool messages ended with ${result}: a number has no text in ${MESSAGES}")
endif()
