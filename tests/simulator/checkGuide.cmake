# cmake -DPROGRAM=... -DGUIDE=... -P checkGuide.cmake
# The guide shows what its program prints.
file(READ ${GUIDE} guide)
execute_process(COMMAND ${PROGRAM} OUTPUT_VARIABLE output COMMAND_ERROR_IS_FATAL ANY)
string(REPLACE "\r\n" "\n" output "${output}")
string(FIND "${guide}" "${output}" place)
if(output STREQUAL "" OR place EQUAL -1)
  message(FATAL_ERROR "The guide does not show the output:\n${output}")
endif()
