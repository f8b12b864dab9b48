# cmake -DPROGRAM=... -DSOURCE=... -DGUIDE=... -P checkGuide.cmake
# The guide shows this very program, and what it says that the program prints.
file(READ ${SOURCE} source)
file(READ ${GUIDE} guide)
execute_process(COMMAND ${PROGRAM} OUTPUT_VARIABLE output COMMAND_ERROR_IS_FATAL ANY)
foreach(text IN ITEMS source output)
  string(FIND "${guide}" "${${text}}" place)
  if(place EQUAL -1)
    message(FATAL_ERROR "The guide does not show the ${text}:\n${${text}}")
  endif()
endforeach()
