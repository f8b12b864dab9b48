/* A simulated generator behind the platform's own C interfaces, and the controls by which a test or a tool drives it.
 *
 * The device stands behind two libraries, libKtFpga.so and libktifwu.so (KtFpga.dll, ktifwu.dll): a host program that
 * drives real hardware runs on it unchanged once these two are on its loader path or linked into it. The functions
 * here make simulated FPGAs, let their time pass, raise triggers, read what was played and make calls fail.
 *
 * Rules that hold for every function:
 *   - It returns 0 or one of the negative codes of KTSIM_CODES; ktSim_DescribeCode gives the words. A function that
 *     fails has changed nothing, and has written none of its results, unless it says otherwise.
 *   - Pointers are borrowed until the function returns. Results that say "may be null" are then not given.
 *   - Any thread may call any function. Calls on one simulated FPGA, these and those of the platform interfaces, run
 *     one after another; different FPGAs do not wait for one another.
 *   - The simulator starts no thread and, unless ktSim_SetWallClock was called, looks at no clock: the same calls
 *     give the same samples, bit for bit.
 *
 * Units: addresses and sizes of memory in bytes unless they say words; sequence addresses in 128-bit instructions;
 * sample numbers count from 0 at the latest initiate of the generator; hardware triggers are 1 to 8 (trigger h of the
 * hardware is "trigger<h-1>" of the script language; 1 is the one that initiate latches); marker n is bit n. */
#ifndef KTORBA_SIMULATOR_H
#define KTORBA_SIMULATOR_H

#include <stdint.h>

#include "ktorba/bool.h"

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Codes: returned by the functions here and, through the platform interfaces, by the device. ---- */

/* clang-format off */
#define KTSIM_CODES(X) \
  X(KTSIM_E_SESSION,           -70001, "no simulated FPGA has this session or target number") \
  X(KTSIM_E_GENERATOR,         -70002, "no simulated generator has this number") \
  X(KTSIM_E_ARGUMENT,          -70003, "null pointer or value out of range") \
  X(KTSIM_E_MEMORY,            -70004, "the simulator could not get memory") \
  X(KTSIM_E_NAME,              -70005, "no FIFO or register has this name and type") \
  X(KTSIM_E_FIFO,              -70006, "no FIFO has this number, or its direction is another") \
  X(KTSIM_E_FIFO_STOPPED,      -70007, "the FIFO has not been started since it was made, configured or stopped") \
  X(KTSIM_E_FIFO_BUSY,         -70008, "acquired elements have not been released, or more are released than acquired") \
  X(KTSIM_E_TIMEOUT,           -70009, "the FIFO did not drain, or fill, within the time-out") \
  X(KTSIM_E_CONTEXT,           -70010, "no context has this number, or it has no register block") \
  X(KTSIM_E_CHILD,             -70011, "the context has no such child") \
  X(KTSIM_E_REGISTER,          -70012, "no register there, or not in this direction") \
  X(KTSIM_E_COMMAND,           -70013, "register 7 knows no such command") \
  X(KTSIM_E_FAULT,             -70014, "code for calls that were told to fail and got no code of their own") \
  X(KTSIM_E_INTERNAL,          -70015, "defect of the simulator") \
  X(KTSIM_F_INSTRUCTION,       -70101, "device fault: malformed instruction; the sequencer stopped") \
  X(KTSIM_F_NO_SAMPLES,        -70102, "device fault: instructions that never emit a sample; the sequencer stopped") \
  X(KTSIM_F_WRITE_RANGE,       -70103, "device fault: memory write outside the memory; not performed") \
  X(KTSIM_F_WRITE_INTERRUPTED, -70104, "device fault: memory write announced while one was in progress")

enum {
  KTSIM_SUCCESS = 0 /* first: C89 and C++98 take no comma behind the last */
#define KTSIM_CODE_ENUM(name, code, text) , name = code
  KTSIM_CODES(KTSIM_CODE_ENUM)
#undef KTSIM_CODE_ENUM
};
/* clang-format on */

/* The words of KTSIM_CODES for a code, "success" for 0, "unknown code" for any other. Never null; never freed. */
const char* ktSim_DescribeCode(int32_t code);

/* ---- FPGAs and generators ---- */

/* What a host opens its session with. */
typedef struct ktSim_Fpga {
  uint32_t fpgaSession; /* also names the FPGA in the functions here */
  uint32_t ifwSession;
  uint32_t ifwTarget;
  uint32_t parentContext; /* parent of the generators' contexts; a child of the root, context 0 */
} ktSim_Fpga;

/* Makes an FPGA without generators. */
int32_t ktSim_CreateFpga(ktSim_Fpga* fpga);

/* Forgets the FPGA with its generators, memories and recordings; its numbers are not used again. A call that another
 * thread has under way on it ends first. */
int32_t ktSim_DestroyFpga(uint32_t fpgaSession);

typedef struct ktSim_Traits {
  uint32_t sampleWidthBits;          /* 16 or 32 */
  uint32_t memoryWordBytes;          /* 8 to 64, a whole number of samples */
  uint32_t memorySizeBytes;          /* sample memory; backed when it is written */
  uint32_t minFetchSamples;          /* register 0, 0 to 255; reported, not enforced */
  uint32_t sequenceWords;            /* sequence memory, 128-bit instructions, 1 to 2^24 */
  uint32_t maxPrimingWords;          /* register 5, 0 to 65535; reported, not enforced */
  uint32_t downloadElementBits;      /* 8 to 512, whole bytes; 0: register 27 reads 0 and elements have 32 bits */
  ktorba_bool hasStreamingRegisters; /* registers 18 to 26 exist */
  uint16_t versionMajor;             /* of the register block; hosts expect the streaming registers from 4.3 on */
  uint16_t versionMinor;
  uint16_t contextType;       /* by which the parent finds the context */
  uint16_t reportedType;      /* first value of the context's information */
  int32_t instance;           /* 0 to 255; -1: the generator's index on its FPGA */
  int32_t downloadFifoNumber; /* register 17 and last part of the FIFO's name, 0 to 255; -1: the same index */
} ktSim_Traits;

/* 16-bit samples, memory of 64 MiB in words of 16 bytes, fetches from 64 samples, 4096 instructions, priming up to
 * 512 words, elements of 32 bits (register 27 reads 0), streaming registers, version 4.3, type 101, instance and FIFO
 * number by index. */
void ktSim_DefaultTraits(ktSim_Traits* traits);

/* Gives the least and the greatest value of every number in ktSim_Traits. Sample widths are 16 and 32 alone, and a
 * memory word is a whole number of samples as an element is one of bytes (0 aside). Either may be null. Any thread. */
void ktSim_TraitLimits(ktSim_Traits* least, ktSim_Traits* greatest);

/* Adds a generator: its context below parentContext, its register block, a FIFO named "wfm gen.download fifo " and its
 * number, its memories. At most 255 on one FPGA. Null traits stand for the default ones. */
int32_t ktSim_AddGenerator(uint32_t fpgaSession, const ktSim_Traits* traits, uint32_t* generator);

/* ---- Contexts, FIFOs and registers beside the generators' own ---- */

/* Adds a context of the given type below another one. Context 0 is the root. */
int32_t ktSim_AddContext(uint32_t fpgaSession, uint32_t parent, uint16_t type, uint32_t* context);

/* Lists an existing context once more, as the last child of `parent`: twice in the tree, or a cycle. */
int32_t ktSim_ListContext(uint32_t fpgaSession, uint32_t parent, uint32_t context);

/* The framework changes its mind: once the next call has asked for the number of this context's children without
 * taking them (capacity 0), so many contexts of type 0 are added behind them; a negative number takes the last ones
 * off the list instead. */
int32_t ktSim_ChangeChildrenAfterCount(uint32_t fpgaSession, uint32_t context, int32_t change);

/* Adds a FIFO that gives back what is written into it, in order; read and write functions both work on it. Its
 * peer-to-peer endpoint is its number + 1000. */
int32_t ktSim_AddLoopbackFifo(uint32_t fpgaSession, const char* name, uint32_t* fifo);

/* Makes KtFpgaDll_FindRegisterPrivate find `offset` by this name. */
int32_t ktSim_AddRegisterName(uint32_t fpgaSession, const char* name, uint32_t offset);

/* ---- Time. The device stands still unless one of these makes it play. ---- */

/* Plays up to `samples` samples. Fewer are played only when generation is not running or ends (script end, device
 * fault). `played` may be null. An endless script plays as many as are asked for, however long that takes. */
int32_t ktSim_Advance(uint32_t generator, uint64_t samples, uint64_t* played);

/* The same, straight into the caller's memory instead of the chosen output: `samples` in the generator's width
 * (int16_t or uint32_t), `markers` one byte per sample. Either may be null: then it is not given.
 * Where generation ends early, marker bytes behind the played samples may have been cleared. */
int32_t ktSim_AdvanceInto(uint32_t generator, uint64_t count, void* samples, uint8_t* markers, uint64_t* played);

/* Plays so many samples before each call that reads or writes registers of this generator (a list counts once), so
 * that a host that only polls makes progress. 0 ends it. */
int32_t ktSim_SetAutoAdvance(uint32_t generator, uint64_t samplesPerAccess);

/* Lets the samples follow the wall clock, from now or from the next initiate on: caught up at each access to the
 * generator's registers or FIFO and at each control call, by at most 2^26 samples at a time (the rest follows at the
 * next). 0 ends it; the rate is at most 1e12. Replaces auto-advance and is replaced by it. */
int32_t ktSim_SetWallClock(uint32_t generator, double samplesPerSecond);

/* ---- Triggers ---- */

/* Latches a hardware trigger (1 to 8) now. */
int32_t ktSim_RaiseTrigger(uint32_t generator, uint32_t trigger);

/* Latches it once `sample` samples have been played since the latest initiate: a wait whose pass ends just before that
 * sample ends with it. May be asked for before generation starts. Up to 4096 may be waiting; reset forgets them. */
int32_t ktSim_RaiseTriggerAt(uint32_t generator, uint32_t trigger, uint64_t sample);

/* ---- Output. Nothing is kept unless asked for. ---- */

/* Keeps what is played, up to `capacitySamples` that have not been read; what no longer fits is counted
 * (ktSim_Counters.samplesLost) and lost. Initiate begins a new recording, dropping what was not read. 0 ends it. Memory
 * is taken as it fills. */
int32_t ktSim_RecordOutput(uint32_t generator, uint64_t capacitySamples);

/* Takes up to `capacity` of the recorded samples, the oldest first. `samples` and `markers` as in ktSim_AdvanceInto,
 * either may be null; with capacity 0 `count` gives the number that waits to be read. */
int32_t ktSim_ReadOutput(uint32_t generator, uint64_t capacity, void* samples, uint8_t* markers, uint64_t* count);

/* Receives what is played in blocks of at most 65536 samples, the last one when an advance ends. Called on the thread
 * that made the device play, while the FPGA is locked: it must not call back into this FPGA, nor throw. The
 * pointers hold until it returns. */
typedef void (*ktSim_OutputCallback)(void* user, uint64_t firstSample, const void* samples, const uint8_t* markers,
                                     uint64_t count);
/* Replaces a recording, and is ended by a null callback or a recording. */
int32_t ktSim_SetOutputCallback(uint32_t generator, ktSim_OutputCallback callback, void* user);

/* One executed instruction. */
typedef struct ktSim_TraceEntry {
  uint64_t firstSample; /* number of the first sample played after it began */
  uint32_t address;
  uint32_t words[4];
  uint32_t loopPass; /* pass of the innermost loop it stands in, from 0; a loop end belongs to the pass it ends */
} ktSim_TraceEntry;

/* Keeps a trace of up to `capacity` unread instructions; further ones are counted (traceEntriesLost) and lost. Initiate
 * begins a new trace. A wait that repeats until its trigger is one instruction. 0 ends it. */
int32_t ktSim_RecordTrace(uint32_t generator, uint64_t capacity);

/* Takes up to `capacity` entries, the oldest first; with capacity 0 `count` gives the number that waits. */
int32_t ktSim_ReadTrace(uint32_t generator, uint64_t capacity, ktSim_TraceEntry* entries, uint64_t* count);

/* ---- State ---- */

typedef struct ktSim_State {
  ktorba_bool running;        /* between initiate and script end, abort, reset or a device fault */
  ktorba_bool done;           /* status bit 0 */
  ktorba_bool underflow;      /* status bit 1 */
  ktorba_bool writeReady;     /* status bit 2: no memory write is in progress */
  ktorba_bool streaming;      /* a streaming range is loaded */
  uint8_t triggerLatches;     /* bit h-1: hardware trigger h */
  uint8_t waitingForTrigger;  /* hardware trigger of the wait now playing; 0 for any other instruction */
  uint32_t address;           /* of the instruction now playing, or the last one */
  uint32_t loopDepth;         /* loops now open */
  uint32_t lastSample;        /* the value that a wait would hold, its low bits in the sample width */
  uint64_t samplesPlayed;     /* since the latest initiate */
  uint64_t writeBytesMissing; /* of the memory write in progress */
  uint64_t fifoDepth;         /* elements, which are bytes */
  uint64_t fifoLevel;
  uint64_t streamingFreeWords; /* register 25 */
} ktSim_State;

int32_t ktSim_GetState(uint32_t generator, ktSim_State* state);

/* Since the generator was made. */
typedef struct ktSim_Counters {
  uint64_t samplesPlayed;
  uint64_t instructionsExecuted;
  uint64_t markersFired; /* marker bits that were high, summed over samples */
  uint64_t initiates;
  uint64_t memoryWrites;  /* completed ones */
  uint64_t bytesReceived; /* taken from the FIFO by memory writes */
  uint64_t registerReads;
  uint64_t registerWrites;
  uint64_t samplesLost;
  uint64_t traceEntriesLost;
  uint64_t deviceFaults;
} ktSim_Counters;

int32_t ktSim_GetCounters(uint32_t generator, ktSim_Counters* counters);

#define KTSIM_NO_ADDRESS UINT32_C(0xFFFFFFFF)

typedef struct ktSim_DeviceFault {
  int32_t code;     /* KTSIM_F_... */
  uint32_t address; /* of the instruction; KTSIM_NO_ADDRESS for other faults */
  uint64_t sample;  /* samples played when it happened */
  char text[160];   /* what was wrong, with the values */
} ktSim_DeviceFault;

/* The `index`-th device fault from 0. The first 64 are kept; KTSIM_E_ARGUMENT for an index that is not. */
int32_t ktSim_GetDeviceFault(uint32_t generator, uint64_t index, ktSim_DeviceFault* fault);

/* Forgets the faults; ktSim_Counters.deviceFaults starts again at 0. */
int32_t ktSim_ClearDeviceFaults(uint32_t generator);

/* Copies out of, or into, sample memory, whatever the sequencer does. */
int32_t ktSim_ReadSampleMemory(uint32_t generator, uint64_t address, void* bytes, uint64_t count);
int32_t ktSim_WriteSampleMemory(uint32_t generator, uint64_t address, const void* bytes, uint64_t count);

/* The same for sequence memory; `words` holds four 32-bit words per instruction. */
int32_t ktSim_ReadSequenceMemory(uint32_t generator, uint64_t address, uint32_t* words, uint64_t instructions);
int32_t ktSim_WriteSequenceMemory(uint32_t generator, uint64_t address, const uint32_t* words, uint64_t instructions);

/* The value last written to a register, or the value that a read would give; counts as no access. */
int32_t ktSim_PeekRegister(uint32_t generator, uint32_t number, uint64_t* value);

/* ---- Faults on demand ---- */

/* Lets the `nth` call from now (1 is the next) of a platform function fail once with `code`; a null name counts calls
 * of every platform function. A negative code is returned in place of doing anything; a positive one after the call was
 * carried out, as its warning; 0 stands for KTSIM_E_FAULT. `elaboration` is the JSON text that a framework function
 * gives with it; null for a plain one that names the simulator. Any number may be armed; where two meet in one call the
 * first armed is reported. Framework calls whose status already holds an error are counted too. */
int32_t ktSim_FailCall(uint32_t fpgaSession, const char* function, uint64_t nth, int32_t code, const char* elaboration);

/* Disarms what has not happened yet. */
int32_t ktSim_ClearFailures(uint32_t fpgaSession);

/* Lets a register read `value`, until it is restored, whatever the device would give. */
int32_t ktSim_OverrideRegister(uint32_t generator, uint32_t number, uint64_t value);
int32_t ktSim_RestoreRegister(uint32_t generator, uint32_t number);

/* While held, memory writes take their data and never report that they are complete. */
int32_t ktSim_HoldMemoryWrites(uint32_t generator, ktorba_bool hold);

#define KTSIM_DRAIN_AT_ONCE UINT64_MAX

/* How fast memory writes take bytes from the FIFO. KTSIM_DRAIN_AT_ONCE, as at the start: as they arrive. Otherwise
 * so many bytes before each access to the generator's registers or FIFO, and per millisecond that a FIFO call is
 * willing to wait; that waiting takes no real time. 0: not at all. */
int32_t ktSim_SetDrainRate(uint32_t generator, uint64_t bytesPerMs);

/* ---- Record of platform calls ---- */

/* Keeps one line per platform call on this FPGA, up to so many lines; 0 ends it and forgets them.
 *
 * Lines: the function's name and its arguments in order, "KtFpgaDll_ConfigureFifo2 fifo=0 depth=40960"; register access
 * in short, "read 17", "write 7 <- 8", and for lists "write 10 <- 4096, 11 <- 32, ..." ("1:17" is register 17 of the
 * second generator). Session and target numbers, pointers and time-outs are left out, since they differ from run to
 * run. A call that did not return 0 ends in " = " and its code. */
int32_t ktSim_RecordCalls(uint32_t fpgaSession, uint64_t capacityLines);

/* Takes the lines, each ended by a line feed, as NUL-terminated text, and forgets them. `length` gives the text's bytes
 * without the NUL; when `capacity` is not above it nothing is written and nothing forgotten (the result is still 0), so
 * a first call with a null buffer and capacity 0 learns it. */
int32_t ktSim_ReadCalls(uint32_t fpgaSession, char* text, uint64_t capacity, uint64_t* length);

/* Calls of platform functions on this FPGA so far, those that failed included. */
int32_t ktSim_GetCallCount(uint32_t fpgaSession, uint64_t* count);

#ifdef __cplusplus
}
#endif

#endif
