#include "benchmarks/programs.h"

namespace programs {
namespace {

std::string wave(int number) { return "wave" + std::to_string(number % kWaveforms); }

}  // namespace

std::string script(int instructions) {
  std::string text = "script benchmark\n";
  for (int i = 0; i < instructions / kInstructionsPerUnit; ++i) {
    text += "  generate " + wave(i) + " subset(512, 4096) marker0(0, 1024)\n";
    text += "  wait 128\n";
    text += "  generate " + wave(i + 1) + "\n";
    text += "  repeat 4\n    generate " + wave(i + 2) + " subset(0, 2048)\n    generate " + wave(i + 3) +
            " marker1(256)\n  end repeat\n";
    text += "  clear trigger1\n";
    text += "  wait until trigger1\n";
  }
  return text + "end script\n";
}

// In functions of a thousand units, since one function takes no more than 32767 loop variables.
std::string lua(int instructions) {
  std::string text = "function part0()\n";
  for (int i = 0; i < instructions / kInstructionsPerUnit; ++i) {
    if (i % 1000 == 999) text += "end\nfunction part" + std::to_string(i / 1000 + 1) + "()\n";
    text += "  generate(\"" + wave(i) + "\", {512, 4096}, {0, 1024})\n";
    text += "  wait(128)\n";
    text += "  generate(\"" + wave(i + 1) + "\")\n";
    text += "  for i = 1, 4 do\n    generate(\"" + wave(i + 2) + "\", {0, 2048})\n    generate(\"" + wave(i + 3) +
            "\", nil, {256})\n  end\n";
    text += "  clear(trigger1)\n";
    text += "  wait_until(trigger1)\n";
  }
  return text + "end\n";
}

std::string spirv(int instructions) {
  std::string text =
      "OpCapability Shader\nOpMemoryModel Logical GLSL450\nOpEntryPoint GLCompute %main \"main\"\n"
      "OpExecutionMode %main LocalSize 1 1 1\n%void = OpTypeVoid\n%int = OpTypeInt 32 0\n%c = OpConstant %int 7\n"
      "%type = OpTypeFunction %void\n%main = OpFunction %void None %type\n%label = OpLabel\n";
  for (int i = 0; i < instructions; ++i) text += "%v" + std::to_string(i) + " = OpIAdd %int %c %c\n";
  return text + "OpReturn\nOpFunctionEnd\n";
}

std::string webAssembly(int instructions) {
  std::string text = "(module (func (param $a i32) (result i32)\n  local.get $a\n";
  for (int i = 0; i < instructions / 2; ++i) text += "  i32.const " + std::to_string(i) + "\n  i32.add\n";
  return text + "))\n";
}

}  // namespace programs
