/* What is known about scripts without a generator: checks, tokens, programs with their listings, whether they fit, as
 * functions of libktorba_tools. Editors, other languages and instrument software stand on it.
 *
 * Rules that hold for every function:
 *   - It returns 0 or one of the negative codes of KTTOOLS_CODES. A function that fails has written none of its results
 *     but the document, which is written whenever memory suffices and then tells the reason.
 *   - Texts come with their length in bytes and may hold anything; a length of 0 may come with a null pointer. They are
 *     borrowed until the function returns, but for what ktTools_Compile says.
 *   - Documents go out as UTF-8 JSON with a NUL behind it and "schema": 1; a number of a later schema means that fields
 *     were removed or changed, not that fields were added. The caller frees them with ktTools_FreeDocument.
 *   - Any thread may call any function; an object is used by one thread at a time, different objects by any. There is
 * no global state, nothing is printed, and no exception and no exit leaves the library.
 *
 * A generator is described by a JSON object, all of whose fields may be left out:
 *   "sampleWidthBits" (16; or 32), "sampleRateHz" (1e6), "memorySizeBytes" (67108864), "memoryWordBytes" (16),
 *   "minFetchSamples" (64), "sequenceWords" (4096), "maxPrimingWords" (512), "primingDepthSamples" (0: the default)
 * and waveforms by an array of objects with "name" and "samples", their number. What is not of these types, or has
 * another name, is refused with KTTOOLS_E_JSON.
 *
 * Places in documents are ranges: "start" and "end" (behind the last byte), each with "offset" (bytes from 0), "line"
 * and "column" (bytes) from 1, and "utf16" (the column in UTF-16 code units, from 0); null for a text as a whole. A
 * byte order mark at a text's start is not counted. */
#ifndef KTORBA_SCRIPT_TOOLS_H
#define KTORBA_SCRIPT_TOOLS_H

#include <stdint.h>

#ifndef KTTOOLS_API
#define KTTOOLS_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* clang-format off */
#define KTTOOLS_CODES(X) \
  X(KTTOOLS_E_ARGUMENT, -71001, "null pointer, or a number out of range") \
  X(KTTOOLS_E_MEMORY,   -71002, "there is not enough memory") \
  X(KTTOOLS_E_JSON,     -71003, "what is described in JSON is not what it should be; the document says why") \
  X(KTTOOLS_E_SCRIPT,   -71004, "the text has errors, or does not fit the waveforms; the document has them") \
  X(KTTOOLS_E_INTERNAL, -71005, "defect of the library; the document has what it said") \
  X(KTTOOLS_E_SAMPLES,  -71006, "the samples of a waveform that plays have not been lent")

enum {
  KTTOOLS_SUCCESS = 0 /* first: C89 and C++98 take no comma behind the last */
#define KTTOOLS_CODE_ENUM(name, code, text) , name = code
  KTTOOLS_CODES(KTTOOLS_CODE_ENUM)
#undef KTTOOLS_CODE_ENUM
};
/* clang-format on */

/* A document of the library's; both are 0 where there is none. */
typedef struct ktTools_Document {
  char* text;      /* UTF-8, a NUL behind it */
  uint64_t length; /* bytes, without the NUL */
} ktTools_Document;

/* What a run of bytes is. Blanks and line ends are in no token. */
enum {
  KTTOOLS_TOKEN_KEYWORD = 1,
  KTTOOLS_TOKEN_NAME = 2, /* of a waveform or a script, or an unknown word */
  KTTOOLS_TOKEN_NUMBER = 3,
  KTTOOLS_TOKEN_MARKER = 4,
  KTTOOLS_TOKEN_TRIGGER = 5,
  KTTOOLS_TOKEN_MARK = 6, /* a parenthesis or a comma */
  KTTOOLS_TOKEN_COMMENT = 7,
  KTTOOLS_TOKEN_FAULT = 8, /* what no script can hold */
  KTTOOLS_TOKEN_UNREAD = 9 /* behind the last script: all that is left, one token */
};

typedef struct ktTools_Token {
  uint64_t offset; /* bytes from the text's start */
  uint64_t length; /* bytes */
  int32_t kind;    /* KTTOOLS_TOKEN_... */
} ktTools_Token;

/* Scripts compiled for a generator, with their waveforms placed in its memory. */
typedef struct ktTools_Program ktTools_Program;

/* "0.1.0"; never freed. */
KTTOOLS_API const char* ktTools_Version(void);

/* The words for a code of KTTOOLS_CODES, "" for any other number; never freed. */
KTTOOLS_API const char* ktTools_DescribeCode(int32_t code);

/* Frees what the library gave; null, and documents of nothing, are left alone. The document is empty then. */
KTTOOLS_API void ktTools_FreeDocument(ktTools_Document* document);
KTTOOLS_API void ktTools_FreeTokens(ktTools_Token* tokens);
KTTOOLS_API void ktTools_FreeProgram(ktTools_Program* program);

/* Checks a text: "diagnostics" is an array, in the order of the text, of objects with "severity" ("error" or
 * "warning"), "range", "message", "help", "related" (objects with "range" and "message"), "fixes" (objects with
 * "range", "text" to put there and "confidence", "certain" or "maybe"), "constant" and "code" of the library. The first
 * error of each script is the compiler's own. Returns 0 whether there are errors or not. */
KTTOOLS_API int32_t ktTools_Check(const char* text, uint64_t length, const char* generator, uint64_t generatorLength,
                                  ktTools_Document* document);

/* Gives the tokens of a text, of a faulty one as well, in its order; they do not overlap. The array is the caller's,
 * who frees it with ktTools_FreeTokens. */
KTTOOLS_API int32_t ktTools_Tokenize(const char* text, uint64_t length, ktTools_Token** tokens, uint64_t* count);

/* Compiles the scripts of a text and places the waveforms that they play. The document has "diagnostics" as
 * ktTools_Check gives them. The program is the caller's, who frees it with ktTools_FreeProgram; it keeps a copy of the
 * text. */
KTTOOLS_API int32_t ktTools_Compile(const char* text, uint64_t length, const char* generator, uint64_t generatorLength,
                                    const char* waveforms, uint64_t waveformsLength, ktTools_Program** program,
                                    ktTools_Document* document);

/* How many scripts the program has; 0 of null. */
KTTOOLS_API uint64_t ktTools_ScriptCount(const ktTools_Program* program);

/* Gives the instructions of a script, counted from 0: four words of 32 bits each, lowest first. The words stay the
 * program's. */
KTTOOLS_API int32_t ktTools_Words(const ktTools_Program* program, uint64_t script, const uint32_t** words,
                                  uint64_t* instructions);

/* Lists a script: "name", and "instructions", an array by address of objects with "meaning", "samples" and
 * "memoryWords" of one pass, and "line" and "column" of the script's instruction. */
KTTOOLS_API int32_t ktTools_List(const ktTools_Program* program, uint64_t script, ktTools_Document* document);

/* Whether waveforms and scripts fit the generator, and how long the scripts play. The request says what a host does
 * besides placing the waveforms in their order; it is an object, all of whose fields may be left out:
 *   "triggers"    an array of texts, "trigger3@5000" or "trigger3@20ms": raised at a sample or a time after the start
 *   "cleared"     an array of names: waveforms that it gives up once all are placed
 *   "streaming"   the name of the streaming waveform
 * The document has
 *   "fits"; "waveforms", objects with "name", "samples" and "refusal", why they have no place, null where they have;
 *   "memoryBytes", of sample memory with all of them, {"used", "available"}, and "largestFreeBytes";
 *   "memoryMap", of it without those that were cleared: "blocks", objects in their order with "waveform", null for a
 *     hole, "firstByte", "bytes" and "samples", for which a hole has room; "freeBytes", "unusableBytes" behind the last
 *     memory word, "holes", their number, "largestHoleBytes", "fragmentation", the share of the free bytes that is
 *     outside the largest hole, and "longest": "waveform", the longest one, and "moreSamples", by how many it could be
 *     longer while all others stay; null where there is no waveform;
 *   "streaming", null or an object with "waveform", "samples", "seconds" that its full ring lasts, and "refusal";
 *   "scripts", objects with "name", "instructions" {"used", "available"}, "plays", "primingWords", "primingSamples" and
 *     "primingSeconds", that are read before it starts, "primesWholeScript", and "refusal"; those that cannot be built
 *     are missing there, and told in "diagnostics" as ktTools_Check gives them;
 *   "idleTriggers", the names of triggers that are raised while no script asks for them.
 *
 * "plays" is an object with "kind":
 *   "exact", with "samples" and "seconds";
 *   "endless", or "tooLong": more than 2^64 - 2 samples;
 *   "waiting", for a trigger that is not raised: "trigger", "inLoop", whether a loop repeats until then, "line" and
 *     "column", "sinceSample" and "sinceSeconds".
 *
 * Numbers of samples in "plays" are texts of digits; seconds are texts of a decimal number, exact where that takes at
 * most 30 decimals, else rounded to 15. Returns 0 whether it fits or not, KTTOOLS_E_SCRIPT when the text has errors. */
KTTOOLS_API int32_t ktTools_Fit(const char* text, uint64_t length, const char* generator, uint64_t generatorLength,
                                const char* waveforms, uint64_t waveformsLength, const char* request,
                                uint64_t requestLength, ktTools_Document* document);

/* ---- What plays when, computed: of any length, without a generator ----
 *
 * Samples are counted from 0, the first one that plays; a script begins with a wait of the generator's shortest fetch.
 * KTTOOLS_NO_SAMPLE stands for what lies beyond every number: without end, or beyond 64 bits. */

#define KTTOOLS_NO_SAMPLE (~(uint64_t)0)
#define KTTOOLS_NO_WAVEFORM (~(uint32_t)0)

/* trigger1 to trigger7 of the scripts, raised at a sample: it counts for a wait or a loop that asks for it there or
 * later. */
typedef struct ktTools_Trigger {
  uint64_t sample;
  int32_t trigger; /* 1 to 7 */
} ktTools_Trigger;

/* A script with the triggers that are raised. It is an object of its own: the program may be freed before it. */
typedef struct ktTools_Timeline ktTools_Timeline;

/* How long it plays. */
enum {
  KTTOOLS_LENGTH_EXACT = 1,    /* `samples` */
  KTTOOLS_LENGTH_TOO_LONG = 2, /* it ends, or goes on, beyond 2^64 - 2 samples */
  KTTOOLS_LENGTH_ENDLESS = 3,
  KTTOOLS_LENGTH_WAITING = 4 /* for a trigger that never comes */
};

typedef struct ktTools_Length {
  int32_t kind;          /* KTTOOLS_LENGTH_... */
  int32_t trigger;       /* that it waits for; 0 where it does not, as all of these */
  uint64_t samples;      /* 0 unless it is exact */
  uint64_t waitingSince; /* the sample from which on only this wait, or this loop, plays */
  uint32_t address;      /* of the wait or of the loop's start */
  uint32_t line;         /* of it in the text, from 1 */
  uint32_t column;       /* bytes, from 1 */
} ktTools_Length;

enum { KTTOOLS_RUN_WAVEFORM = 1, KTTOOLS_RUN_WAIT = 2, KTTOOLS_RUN_WAIT_FOR_TRIGGER = 3 };

/* The samples of one instruction in one pass; all passes of a wait for a trigger are one run. A generate or wait with
 * several marker positions is several instructions. The start and the end of a script are waits, too; the place of the
 * one and the other is that of the script. */
typedef struct ktTools_Run {
  uint64_t firstSample;
  uint64_t sampleCount;     /* KTTOOLS_NO_SAMPLE: without end */
  uint64_t firstInWaveform; /* the waveform's sample that it begins with; 0 for waits */
  uint64_t pass;            /* of its loop, from 0 */
  uint64_t round;           /* of a script that is one repeat forever, from 0 */
  int32_t kind;             /* KTTOOLS_RUN_... */
  int32_t trigger;          /* that a wait ends on, 1 to 7; 0 for none, and for the start of the script */
  uint32_t waveform;        /* for ktTools_WaveformName; KTTOOLS_NO_WAVEFORM for waits */
  uint32_t address;         /* of the instruction */
  uint32_t line;            /* in the text, from 1 */
  uint32_t column;          /* bytes, from 1 */
  uint32_t markers;         /* mask: bit n, marker n fires */
  uint32_t markerOffset;    /* samples from firstSample to the one at which they fire */
} ktTools_Run;

/* Frees what ktTools_MakeTimeline gave; null is left alone. */
KTTOOLS_API void ktTools_FreeTimeline(ktTools_Timeline* timeline);

/* Lends the samples of one of the program's waveforms: int16_t or int32_t as the generator's width is, as many as the
 * program was compiled with. They are not copied: they stay as they are until the program and all timelines that are
 * made of it from now on have been freed. Only levels need them. */
KTTOOLS_API int32_t ktTools_LendSamples(ktTools_Program* program, const char* name, uint64_t nameLength,
                                        const void* samples, uint64_t count);

/* Computes what a script, counted from 0, plays. `triggers` in any order. Takes time of the order of instructions and
 * triggers, whatever the length. */
KTTOOLS_API int32_t ktTools_MakeTimeline(const ktTools_Program* program, uint64_t script,
                                         const ktTools_Trigger* triggers, uint64_t count, ktTools_Timeline** timeline);

KTTOOLS_API int32_t ktTools_PlayLength(const ktTools_Timeline* timeline, ktTools_Length* length);

/* The waveforms that the script plays; 0 of null. Their names stay the timeline's. */
KTTOOLS_API uint64_t ktTools_WaveformCount(const ktTools_Timeline* timeline);
KTTOOLS_API int32_t ktTools_WaveformName(const ktTools_Timeline* timeline, uint64_t waveform, const char** name,
                                         uint64_t* length);

/* Gives the runs from the one that holds sample `begin` on, up to `capacity` of them, and their number: 0 where nothing
 * plays any more. The array is the caller's. */
KTTOOLS_API int32_t ktTools_Runs(const ktTools_Timeline* timeline, uint64_t begin, uint64_t capacity, ktTools_Run* runs,
                                 uint64_t* count);

/* How often marker 0 to 7 fires from `begin` to `end`, end excluded; KTTOOLS_NO_SAMPLE where that passes 64 bits. */
KTTOOLS_API int32_t ktTools_MarkerCount(const ktTools_Timeline* timeline, uint32_t marker, uint64_t begin, uint64_t end,
                                        uint64_t* count);

/* The sample at which it fires for the n-th time, from 0; KTTOOLS_NO_SAMPLE where it does not. */
KTTOOLS_API int32_t ktTools_MarkerPulse(const ktTools_Timeline* timeline, uint32_t marker, uint64_t n,
                                        uint64_t* sample);

/* Computes the samples from `begin` on, of the generator's width, and a byte each of markers (bit n: marker n), into
 * the caller's arrays, up to `capacity` of both; either may be null. `count` is how many there were. */
KTTOOLS_API int32_t ktTools_Samples(ktTools_Timeline* timeline, uint64_t begin, uint64_t capacity, void* samples,
                                    uint8_t* markers, uint64_t* count);

/* The least and the greatest level of each `width` samples from `begin` on, into the caller's arrays of `columns`;
 * `count` is how many columns have samples. Exact at any width, and as quick at 10^12 samples as at 10^3. */
KTTOOLS_API int32_t ktTools_Envelope(ktTools_Timeline* timeline, uint64_t begin, uint64_t width, uint64_t columns,
                                     int32_t* lows, int32_t* highs, uint64_t* count);

/* Whether the scripts of two programs for generators of one width play the same, whatever triggers come. Scripts are
 * compared by name, or only those called `name` where that is not empty; the only scripts of two programs whatever they
 * are called. The document has "same", and "scripts": objects with "name", "same", "whole" (false: only the first 2^64
 * samples were compared) and "difference", null or an object with "kind" ("level", "markers", "triggers", "end" or
 * "missing"), "sample" (a text of digits; null beyond 2^64), and "first" and "second", null or objects with "message",
 * "line" and "column". */
KTTOOLS_API int32_t ktTools_Compare(const ktTools_Program* first, const ktTools_Program* second, const char* name,
                                    uint64_t nameLength, ktTools_Document* document);

/* The table of the library's errors: "errors", objects with "constant", "name" (in <ktorba/error_codes.h>), "code",
 * "meaning" and "help". */
KTTOOLS_API int32_t ktTools_ErrorTable(ktTools_Document* document);

#ifdef __cplusplus
}
#endif

#endif
