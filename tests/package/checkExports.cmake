# cmake -DNM=... -DLIBRARY=... -DHEADER=... -P checkExports.cmake, or with -DOBJDUMP=... for a DLL
# Compares the names that a library exports with those that the public header declares: none missing, none more.
file(STRINGS ${HEADER} declarations REGEX "^KTORBA_API ")
string(REGEX MATCHALL "[A-Za-z0-9_]+\\(" declared "${declarations}")
list(TRANSFORM declared REPLACE "\\(" "")
list(SORT declared)
list(LENGTH declared count)
if(NOT count EQUAL 27)
  message(FATAL_ERROR "The header declares ${count} functions, not 23 and 4 hooks: ${declared}")
endif()

include(${CMAKE_CURRENT_LIST_DIR}/../../cmake/readExports.cmake)
if(NOT symbols STREQUAL declared)
  message(FATAL_ERROR "Exported:\n${symbols}\nDeclared:\n${declared}")
endif()
