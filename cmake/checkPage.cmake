# Compares FILE with what PROGRAM prints when it is given ARGUMENTS.
execute_process(COMMAND ${PROGRAM} ${ARGUMENTS} OUTPUT_VARIABLE printed RESULT_VARIABLE code)
string(REPLACE "\r\n" "\n" printed "${printed}")
file(READ ${FILE} content)
if(NOT code STREQUAL "0" OR NOT printed STREQUAL content)
  message(FATAL_ERROR "${FILE} is not what \"${PROGRAM} ${ARGUMENTS}\" prints: write it anew")
endif()
