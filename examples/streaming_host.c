/* Streaming: keeps writing a signal into one waveform, round and round, while the generator plays it. Here a sweep
 * that is a hundred times as long as the waveform; the count of samples that came out wrong has to be 0.
 *
 * examples/first_script.c explains the calls that every program makes. It is built with the library, as streaming_host;
 * against an installed library and simulator:
 *   cc streaming_host.c $(pkg-config --cflags --libs ktorba_elaborating ktorba_host_runtime ktorba_simulator) -lm &&
 * ./a.out
 */
#include <math.h>
#include <stdio.h>
#include <stdlib.h>

#include "ktorba/host_runtime.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

enum { kLength = 4096, kRounds = 100, kTotal = kRounds * kLength, kStep = 1000 };

static char reason[4096];
static tStatus status = {0, sizeof reason, NULL, reason};

static void fail(const char* what, int code, const char* why) {
  fprintf(stderr, "%s failed with %d: %s\n", what, code, why);
  exit(EXIT_FAILURE);
}

static void check_simulator(int32_t code, const char* what) {
  if (code < 0) fail(what, (int)code, ktSim_DescribeCode(code));
}
#define SIM_CHECK(call) check_simulator(call, #call)

static void check(const char* what) {
  if (status.code < 0) fail(what, (int)status.code, status.json);
}

/* Sample n of the signal: in a real host, what an instrument delivers or a program computes as it goes. */
static int16_t signal_at(uint32_t n) {
  const double t = (double)n / kTotal;
  return (int16_t)lround(30000 * sin(1e5 * t * t));
}

/* Writes the next `count` samples of the signal. The library goes on where the last write ended and wraps at the end
 * of the waveform by itself. */
static void write_next(uint32_t session, uint32_t* written, uint32_t count) {
  static int16_t piece[kLength];
  for (uint32_t i = 0; i < count; ++i) piece[i] = signal_at(*written + i);
  ktORBA_WriteWaveformI16(session, "sweep", piece, count, 1000, &status);
  *written += count;
}

/* Lets the generator play kStep samples and compares them with the signal. On hardware time passes by itself. */
static unsigned play_and_compare(uint32_t generator, uint32_t* played) {
  static int16_t out[kStep];
  uint64_t count = 0;
  unsigned wrong = 0;
  SIM_CHECK(ktSim_AdvanceInto(generator, kStep, out, NULL, &count));
  for (uint64_t i = 0; i < count; ++i) wrong += out[i] != signal_at((*played)++);
  return wrong;
}

int main(void) {
  ktHostRuntime_Announce(SetPDRNModule, atexit);
  ktSim_Fpga fpga;
  ktSim_Traits traits;
  uint32_t generator = 0;
  ktSim_DefaultTraits(&traits);
  SIM_CHECK(ktSim_CreateFpga(&fpga));
  SIM_CHECK(ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator));
  uint32_t session = 0;
  ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session, &status);

  /* Fill the waveform once, then say that it is the streaming one. Settings are applied before generation starts. */
  uint32_t written = 0, played = 0;
  write_next(session, &written, kLength);
  ktORBA_WriteScript(session, "script endless repeat forever generate sweep end repeat end script", &status);
  ktORBA_ConfigureStreamingWaveform(session, "sweep", &status);
  ktORBA_SelectActiveScript(session, "endless", &status);
  ktORBA_StartGeneration(session, &status);
  check("starting the script");
  SIM_CHECK(ktSim_Advance(generator, traits.minFetchSamples, NULL)); /* every script opens with a short wait */

  unsigned wrong = 0;
  uint8_t is_done = 0; /* the call reports an error when the generator ran out of data */
  while (played < kTotal && ktORBA_CheckGenerationStatus(session, &is_done, &status) >= 0) {
    wrong += play_and_compare(generator, &played);
    uint64_t space = 0; /* samples that have been played and may be replaced */
    ktORBA_CheckStreamingWaveformSpace(session, &space, &status);
    if (space > 0) write_next(session, &written, (uint32_t)space);
  }
  check("streaming");
  printf("streamed %u samples through a waveform of %d, %u of them wrong\n", (unsigned)played, kLength, wrong);

  ktORBA_AbortGeneration(session, &status);
  ktORBA_CloseOrbaSession(session, &status);
  check("ending the session");
  SIM_CHECK(ktSim_DestroyFpga(fpga.fpgaSession));
  return wrong == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
