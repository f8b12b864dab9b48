/* The two hooks: one entry under two names, which does nothing. In C, where compilers agree on what an alias repeats of
 * its target. */
#include "ktorba/ktorba.h"

void SetPDRNModuleHook(void) {}
void SetPDRNTLSIndexHook(void) __attribute__((alias("SetPDRNModuleHook")));
