/* A first program: plays a script on a simulated generator, so it runs on any machine.
 *
 * The functions with the prefix ktORBA_ are the library. Those with the prefix ktSim_ stand for what a real setup has
 * instead: an FPGA that the host has opened, time that passes, and an output that someone looks at.
 *
 * It is built with the library, as first_script; against an installed library and simulator:
 *   cc first_script.c $(pkg-config --cflags --libs ktorba_elaborating ktorba_host_runtime ktorba_simulator) -lm &&
 * ./a.out
 */
#include <math.h>
#include <stdio.h>
#include <stdlib.h>

#include "ktorba/host_runtime.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

enum { kBurstLength = 250, kOutputCapacity = 4096 };

static void fail(const char* what, int code, const char* why) {
  fprintf(stderr, "%s failed with %d: %s\n", what, code, why);
  exit(EXIT_FAILURE);
}

/* Every function of both interfaces returns 0 or a negative code. docs/errors.md tells what the codes mean. */
static void check_simulator(int32_t code, const char* what) {
  if (code < 0) fail(what, (int)code, ktSim_DescribeCode(code));
}
#define SIM_CHECK(call) check_simulator(call, #call)

/* The library puts the code into a status record too, and a text that says in JSON what was wrong and where. A call
 * with a record that holds an error does nothing: so a program may make a row of calls and look once. */
static char reason[4096];
static tStatus status = {0, sizeof reason, NULL, reason};

static void check(const char* what) {
  if (status.code < 0) fail(what, (int)status.code, status.json);
}

/* Ten periods of a sine whose amplitude swells and fades: 16-bit samples, as this generator plays them. */
static void make_burst(int16_t burst[kBurstLength]) {
  const double pi = 3.14159265358979323846;
  for (int i = 0; i < kBurstLength; ++i) {
    const double t = (double)i / kBurstLength;
    burst[i] = (int16_t)lround(32767 * sin(pi * t) * sin(2 * pi * 10 * t));
  }
}

/* Comments run to the end of the line; a marker is a digital output that is high for one sample, counted from the start
 * of its instruction. */
static const char kScript[] =
    "script pulses                        // its name, by which it is selected\n"
    "  repeat 3\n"
    "    generate burst marker0(125)      // the whole waveform; marker 0 in its middle\n"
    "    wait 150                         // samples; the output holds the last value\n"
    "  end repeat\n"
    "  generate burst subset(0, 125)      // from sample 0, 125 samples: the rising half\n"
    "end script\n";

int main(void) {
  /* Who closes the sessions of a program that ends early: here nobody else, so the runtime that comes with the library.
   */
  ktHostRuntime_Announce(SetPDRNModule, atexit);

  /* On hardware, the host opens the FPGA with the FPGA's own library and gets these numbers from there. */
  ktSim_Fpga fpga;
  uint32_t generator = 0;
  SIM_CHECK(ktSim_CreateFpga(&fpga));
  SIM_CHECK(ktSim_AddGenerator(fpga.fpgaSession, NULL, &generator));
  SIM_CHECK(ktSim_RecordOutput(generator, kOutputCapacity));
  /* Simulated time stands still by itself: let 100 samples pass with every look at the generator. */
  SIM_CHECK(ktSim_SetAutoAdvance(generator, 100));

  /* One session drives one generator, here the first (0) below its parent in the FPGA's design. */
  uint32_t session = 0;
  ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session, &status);

  /* Writing to a name that does not exist allocates the waveform; the write may take a second. */
  int16_t burst[kBurstLength];
  make_burst(burst);
  ktORBA_WriteWaveformI16(session, "burst", burst, kBurstLength, 1000, &status);

  /* Scripts are compiled when they are written, against the waveforms there are then, and sent when selected. */
  ktORBA_WriteScript(session, kScript, &status);
  ktORBA_SelectActiveScript(session, "pulses", &status);
  ktORBA_StartGeneration(session, &status);
  check("starting the script");

  uint8_t is_done = 0;
  while (!is_done && ktORBA_CheckGenerationStatus(session, &is_done, &status) >= 0) {
  }
  check("playing the script");

  static int16_t samples[kOutputCapacity];
  static uint8_t markers[kOutputCapacity];
  uint64_t count = 0;
  SIM_CHECK(ktSim_ReadOutput(generator, kOutputCapacity, samples, markers, &count));
  int16_t peak = 0;
  for (uint64_t i = 0; i < count; ++i) {
    if (samples[i] > peak) peak = samples[i];
    if (markers[i] != 0) printf("markers %02x at sample %u\n", markers[i], (unsigned)i);
  }
  printf("played %u samples, the highest is %d\n", (unsigned)count, peak);

  ktORBA_CloseOrbaSession(session, &status);
  check("closing the session");
  SIM_CHECK(ktSim_DestroyFpga(fpga.fpgaSession));
  return EXIT_SUCCESS;
}
