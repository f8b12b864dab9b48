/* A host runtime for programs whose host brings none. The library registers a clean-up procedure for every session that
 * it opens with a host runtime (the end of <ktorba/ktorba.h>); on Windows it goes nowhere without one. This one keeps
 * the procedures and calls those that are left when the program ends: so sessions do not outlive it.
 *
 * Who announces it, and when: the program, and nobody else, at the start of main(), before the first session is opened:
 *
 *   ktHostRuntime_Announce(SetPDRNModule, atexit);
 *
 * A library or a plug-in does not: whether there is a runtime is for the program to say. A program that exports a
 * PDRNRegisterCleanUpProc of its own is its own host, and the announcement gives way to it; one that tells its runtime
 * by SetPDRNModule or SetPDRNTLSIndex does so afterwards, or better makes no announcement. A program with both
 * libraries, libktorba and libktorba_elaborating, announces to each.
 *
 * Any thread may call anything. For C from C89 on with <stdint.h>, and C++. */
#ifndef KTORBA_HOST_RUNTIME_H
#define KTORBA_HOST_RUNTIME_H

#include <stdint.h>

#ifndef KTHR_API
#define KTHR_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Tells a library of this runtime, which stays in the process from then on.
 *   setModule   the library's SetPDRNModule
 *   atExit      atexit as the program sees it, or null. By it the procedures are called while every library still
 *               works. Without it they are called when this library ends, which on Windows may be after others have.
 * Returns 1, or 0 when the program brings a runtime of its own: then nothing has been done. */
KTHR_API int32_t ktHostRuntime_Announce(void (*setModule)(void* module), int (*atExit)(void (*function)(void)));

/* Calls the procedures that are registered, the latest first, each once. What is registered meanwhile is called too. */
KTHR_API void ktHostRuntime_CleanUp(void);

/* What the library calls, and a program may: with mode 2 it has `procedure` called with `handle` in the end, with mode
 * 0 no longer. A pair that is registered twice is called once. Returns 1, or 0: memory ran out, there was nothing to
 * withdraw, the procedure is null or the mode is another. */
KTHR_API int32_t PDRNRegisterCleanUpProc(int32_t (*procedure)(uint32_t handle), uint32_t handle, int32_t mode);

#ifdef __cplusplus
}
#endif

#endif
