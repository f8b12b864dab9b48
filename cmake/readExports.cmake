# What LIBRARY exports, as the sorted list `symbols`: by OBJDUMP of a DLL, else by NM.
if(OBJDUMP)
  execute_process(COMMAND ${OBJDUMP} -p ${LIBRARY} OUTPUT_VARIABLE tables COMMAND_ERROR_IS_FATAL ANY)
  string(REGEX MATCHALL "\n\t\\[ *[0-9]+\\] [A-Za-z0-9_]+" symbols "${tables}")
  list(TRANSFORM symbols REPLACE ".* " "")
else()
  execute_process(COMMAND ${NM} -D --defined-only --format=posix ${LIBRARY}
    OUTPUT_VARIABLE symbols COMMAND_ERROR_IS_FATAL ANY)
  string(REGEX MATCHALL "[^\n]+\n" symbols "${symbols}")
  list(TRANSFORM symbols REPLACE " .*" "")
endif()
list(SORT symbols)
