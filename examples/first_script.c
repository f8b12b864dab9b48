/* A first program: plays a script on a simulated generator, so it runs on any machine.
 *
 * The functions with the prefix ktORBA_ are the library. Those with the prefix ktSim_ stand for what a real setup has
 * instead: an FPGA that the host has opened, time that passes, and an output that someone looks at.
 *
 * It is built with the library, as first_script; against an installed library and simulator:
 *   cc first_script.c $(pkg-config --cflags --libs ktorba) -lktorba_simulator -lm
 */
#include <math.h>
#include <stdio.h>
#include <stdlib.h>

#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

enum { kBurstLength = 250, kOutputCapacity = 4096 };

/* Every function of both interfaces returns 0 or a negative code. docs/errors.md tells what the codes mean. */
static void check(int32_t code, const char* what) {
  if (code >= 0) return;
  fprintf(stderr, "%s failed with %d\n", what, (int)code);
  exit(EXIT_FAILURE);
}
#define CHECK(call) check(call, #call)

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
  /* On hardware, the host opens the FPGA with the FPGA's own library and gets these numbers from there. */
  ktSim_Fpga fpga;
  uint32_t generator = 0;
  CHECK(ktSim_CreateFpga(&fpga));
  CHECK(ktSim_AddGenerator(fpga.fpgaSession, NULL, &generator));
  CHECK(ktSim_RecordOutput(generator, kOutputCapacity));
  /* Simulated time stands still by itself: let 100 samples pass with every look at the generator. */
  CHECK(ktSim_SetAutoAdvance(generator, 100));

  /* One session drives one generator, here the first (0) below its parent in the FPGA's design. */
  uint32_t session = 0;
  CHECK(ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session,
                               NULL));

  /* Writing to a name that does not exist allocates the waveform; the write may take a second. */
  int16_t burst[kBurstLength];
  make_burst(burst);
  CHECK(ktORBA_WriteWaveformI16(session, "burst", burst, kBurstLength, 1000, NULL));

  /* Scripts are compiled when they are written, against the waveforms there are then, and sent when selected. */
  CHECK(ktORBA_WriteScript(session, kScript, NULL));
  CHECK(ktORBA_SelectActiveScript(session, "pulses", NULL));

  CHECK(ktORBA_StartGeneration(session, NULL));
  uint8_t is_done = 0;
  while (!is_done) CHECK(ktORBA_CheckGenerationStatus(session, &is_done, NULL));

  static int16_t samples[kOutputCapacity];
  static uint8_t markers[kOutputCapacity];
  uint64_t count = 0;
  CHECK(ktSim_ReadOutput(generator, kOutputCapacity, samples, markers, &count));
  int16_t peak = 0;
  for (uint64_t i = 0; i < count; ++i) {
    if (samples[i] > peak) peak = samples[i];
    if (markers[i] != 0) printf("markers %02x at sample %u\n", markers[i], (unsigned)i);
  }
  printf("played %u samples, the highest is %d\n", (unsigned)count, peak);

  CHECK(ktORBA_CloseOrbaSession(session, NULL));
  CHECK(ktSim_DestroyFpga(fpga.fpgaSession));
  return EXIT_SUCCESS;
}
