# cmake -DNM=... -DLIBRARY=... -DMAP=... -P checkExports.cmake
# Compares what a library exports with its version script, whose names come from the headers: a function that is
# declared and not defined, or defined with another name, is missing here.
file(READ ${MAP} map)
string(REGEX MATCHALL "kt[A-Za-z]+_[A-Za-z0-9_]+|KtFpgaDll_[A-Za-z0-9]+" declared "${map}")
list(SORT declared)
execute_process(COMMAND ${NM} -D --defined-only --format=posix ${LIBRARY}
  OUTPUT_VARIABLE symbols COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "[^\n]+\n" symbols "${symbols}")
list(TRANSFORM symbols REPLACE " .*" "")
list(SORT symbols)
list(LENGTH symbols count)
if(count EQUAL 0 OR NOT symbols STREQUAL declared)
  message(FATAL_ERROR "Exported:\n${symbols}\nDeclared:\n${declared}")
endif()
