#include <stdio.h>
#include <stdlib.h>

#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

static void require(int32_t code, const char* what) {
  if (code == 0) return;
  fprintf(stderr, "%s: %d (%s)\n", what, (int)code, ktSim_DescribeCode(code));
  exit(1);
}

int main(void) {
  /* The device: what a host would otherwise find in the machine. */
  ktSim_Fpga fpga;
  uint32_t generator;
  require(ktSim_CreateFpga(&fpga), "create");
  require(ktSim_AddGenerator(fpga.fpgaSession, NULL, &generator), "add generator");

  /* The host: nothing here knows that it runs on a simulated device. */
  uint32_t session;
  int16_t ramp[256];
  for (int i = 0; i < 256; ++i) ramp[i] = (int16_t)i;
  require(
      ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session, NULL),
      "open");
  require(ktORBA_WriteWaveformI16(session, "ramp", ramp, 256, 1000, NULL), "write waveform");
  require(ktORBA_WriteScript(session,
                             "script once\n"
                             "  wait until trigger1\n"
                             "  generate ramp marker0(100)\n"
                             "end script\n",
                             NULL),
          "write script");
  require(ktORBA_SelectActiveScript(session, "once", NULL), "select");
  require(ktORBA_StartGeneration(session, NULL), "start");

  /* Time passes: trigger1 of the language, hardware trigger 2, comes after 1000 samples. */
  static int16_t samples[4096];
  static uint8_t markers[4096];
  uint64_t played;
  require(ktSim_RaiseTriggerAt(generator, 2, 1000), "schedule");
  require(ktSim_AdvanceInto(generator, 4096, samples, markers, &played), "advance");

  uint8_t isDone;
  require(ktORBA_CheckGenerationStatus(session, &isDone, NULL), "check");
  for (uint64_t i = 0; i < played; ++i) {
    if (markers[i] != 0) printf("marker at sample %u, value %d\n", (unsigned)i, samples[i]);
  }
  printf("played %u samples, %s\n", (unsigned)played, isDone ? "done" : "not done");

  require(ktORBA_CloseOrbaSession(session, NULL), "close");
  require(ktSim_DestroyFpga(fpga.fpgaSession), "destroy");
  return 0;
}
