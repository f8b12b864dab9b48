#cmake - DHEADER = ... - DCODES = ... - P checkErrorNames.cmake
#Every error that a function's comment names is one of the header of codes.
file(READ ${HEADER} header) file(READ ${CODES} codes)
    string(REGEX MATCHALL "(ktorba_codes_k|nKTAPALS100_tStatus_k|_kError)[A-Za-z]+" names "${header}")
        list(REMOVE_DUPLICATES names) if (NOT names) message(FATAL_ERROR "No error is named in ${HEADER}") endif()
            foreach (name IN LISTS names) if (NOT codes MATCHES "${name} =") list(APPEND unknown ${name}) endif()
                endforeach() if (unknown) message(FATAL_ERROR "Not in ${CODES}: ${unknown}") endif()
