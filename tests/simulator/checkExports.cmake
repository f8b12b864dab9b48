# cmake -DNM=... -DLIBRARY=... -DMAP=... -P checkExports.cmake
# Compares what a library exports with its version script, whose names come from the headers: a function that is
# declared and not defined, or defined with another name, is missing here.
file(READ ${MAP} map)
string(REGEX MATCHALL "kt[A-Za-z]+_[A-Za-z0-9_]+|KtFpgaDll_[A-Za-z0-9]+" declared "${map}")
list(SORT declared)
include(${CMAKE_CURRENT_LIST_DIR}/../../cmake/readExports.cmake)
list(LENGTH symbols count)
if(count EQUAL 0 OR NOT symbols STREQUAL declared)
  message(FATAL_ERROR "Exported:\n${symbols}\nDeclared:\n${declared}")
endif()
