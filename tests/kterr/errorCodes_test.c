/* The header of codes as a C program includes it. */
#include "ktorba/error_codes.h"

enum ktorba_error_code codeOfInvalidParameter(void);
enum ktorba_error_code codeOfInvalidParameter(void) { return ktorba_nKTAPALS100_tStatus_kInvalidParameter; }
