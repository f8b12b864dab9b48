#include <stdio.h>
#include <stdlib.h>

#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

static char reason[4096];
static tStatus status = {0, sizeof reason, NULL, reason};

static void fail(const char* what, int code, const char* why) {
  fprintf(stderr, "%s: %d (%s)\n", what, code, why);
  exit(1);
}

static void require(int32_t code, const char* what) {
  if (code != 0) fail(what, (int)code, ktSim_DescribeCode(code));
}

int main(void) {
  /* The device: what a host would otherwise find in the machine. */
  ktSim_Fpga fpga;
  uint32_t generator;
  require(ktSim_CreateFpga(&fpga), "create");
  require(ktSim_AddGenerator(fpga.fpgaSession, NULL, &generator), "add generator");

  /* The host: nothing here knows that it runs on a simulated device. */
  uint32_t session = 0;
  int16_t ramp[256];
  for (int i = 0; i < 256; ++i) ramp[i] = (int16_t)i;
  ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session, &status);
  ktORBA_WriteWaveformI16(session, "ramp", ramp, 256, 1000, &status);
  ktORBA_WriteScript(session,
                     "script once\n"
                     "  wait until trigger1\n"
                     "  generate ramp marker0(100)\n"
                     "end script\n",
                     &status);
  ktORBA_SelectActiveScript(session, "once", &status);
  ktORBA_StartGeneration(session, &status);
  if (status.code < 0) fail("start", (int)status.code, status.json);

  /* Time passes: trigger1 of the language, hardware trigger 2, comes after 1000 samples. */
  static int16_t samples[4096];
  static uint8_t markers[4096];
  uint64_t played;
  require(ktSim_RaiseTriggerAt(generator, 2, 1000), "schedule");
  require(ktSim_AdvanceInto(generator, 4096, samples, markers, &played), "advance");

  uint8_t isDone;
  ktORBA_CheckGenerationStatus(session, &isDone, &status);
  if (status.code < 0) fail("check", (int)status.code, status.json);
  for (uint64_t i = 0; i < played; ++i) {
    if (markers[i] != 0) printf("marker at sample %u, value %d\n", (unsigned)i, samples[i]);
  }
  printf("played %u samples, %s\n", (unsigned)played, isDone ? "done" : "not done");

  ktORBA_CloseOrbaSession(session, &status);
  require(ktSim_DestroyFpga(fpga.fpgaSession), "destroy");
  return 0;
}
