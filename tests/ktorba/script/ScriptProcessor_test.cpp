// What script processing makes of records; what it makes of texts is in golden/.
#include "ktorba/script/ScriptProcessor.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <optional>

#include "testing/ScriptScene.h"
#include "testing/caught.h"

namespace ktorba {
namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;

FetchRecord generate(std::uint32_t startOffset, std::uint32_t sampleCount) {
  FetchRecord fetch;
  fetch.waveformName = "W";
  fetch.startOffset = startOffset;
  fetch.sampleCount = sampleCount;
  return fetch;
}

FetchRecord wait(std::uint32_t sampleCount) {
  FetchRecord fetch;
  fetch.isWait = true;
  fetch.sampleCount = sampleCount;
  return fetch;
}

// A block of one fetch, played `count` times over.
struct Block {
  LoopKind loopKind = LoopKind::kCounted;
  std::uint32_t iterationCount = 1;
  std::uint8_t triggerNumber = 0;
  FetchRecord fetch = {};
  std::size_t count = 1;
  std::optional<MarkerRecord> marker = {};
};

CompiledScript scriptOf(const std::vector<Block>& blocks) {
  CompiledScript script;
  script.arena = std::make_shared<ktwfmscriptcompiler::Arena>();
  for (const Block& block : blocks) {
    const std::span<FetchRecord> fetches = script.arena->create<FetchRecord>(block.count);
    std::ranges::fill(fetches, block.fetch);
    if (block.marker) {
      const std::span<MarkerRecord> markers = script.arena->create<MarkerRecord>(1);
      markers[0] = *block.marker;
      fetches[0].markers = markers;
    }
    script.blocks.push_back({block.loopKind, block.iterationCount, block.triggerNumber, 0, fetches});
  }
  return script;
}
CompiledScript scriptOf(const FetchRecord& fetch) { return scriptOf({Block{.fetch = fetch}}); }
CompiledScript scriptOf(const FetchRecord& fetch, MarkerRecord marker) {
  return scriptOf({Block{.fetch = fetch, .marker = marker}});
}

std::string failureOf(const CompiledScript& script, const SceneNumbers& numbers = {}) {
  ScriptScene scene(numbers);
  scene.addWaveform("w", 1000);
  return ::failureOf([&] { scene.build(script); });
}

std::string usage(const char* tag, const std::string& value, const char* type) {
  return std::string(R"({"type":"usage","usage":")") + tag + R"(","value":)" + value + R"(,"value_type":")" + type +
         "\"}";
}

TEST(ScriptProcessor, RefusesRecordsThatNoTextGives) {
  const Block unknownLoop{.loopKind = LoopKind{3}, .fetch = wait(64)},
      unknownTrigger{.triggerNumber = 9, .fetch = wait(64)};
  FetchRecord triggered = wait(64);
  triggered.triggerNumber = 9;
  for (const CompiledScript& script : {scriptOf({unknownLoop}), scriptOf({unknownTrigger}), scriptOf(triggered)}) {
    EXPECT_THAT(failureOf(script), AllOf(HasSubstr("-1074101592"), HasSubstr(R"(script\\ScriptProcessor")"),
                                         Not(HasSubstr("translator"))));
  }
  EXPECT_THAT(failureOf(scriptOf(wait(0x80000000))),
              AllOf(HasSubstr("-1074101619"), HasSubstr(usage("kUsageTypeWaveformLength", "-2147483648", "int32_t"))));
  EXPECT_THAT(failureOf(scriptOf(generate(0, 0xFFFFFFFE))),
              AllOf(HasSubstr("-1074101607"), HasSubstr(usage("kUsageTypeMinSubsetLength", "64", "uint32_t") + ',' +
                                                        usage("kUsageTypeSubsetLength", "-2", "int32_t"))));
  EXPECT_THAT(failureOf(scriptOf(generate(1, kWholeWaveform))),
              AllOf(HasSubstr("-1074101606"), HasSubstr(usage("kUsageTypeWaveformLength", "1000", "uint32_t") + ',' +
                                                        usage("kUsageTypeWaveformName", "\"w\"", "string") + ',' +
                                                        usage("kUsageTypeSubsetLength", "4294967295", "uint32_t") +
                                                        ',' + usage("kUsageTypeSubsetStartOffset", "1", "uint32_t"))));
  EXPECT_THAT(failureOf(scriptOf(generate(1001, kWholeWaveform))), HasSubstr("-1074101605"));
}

TEST(ScriptProcessor, RefusesWhatAnInstructionHasNoRoomFor) {
  struct Case {
    CompiledScript script;
    SceneNumbers numbers;
    const char* text;
  };
  for (const Case& c :
       {Case{scriptOf(generate(17, 64)), {16, 32, 32, 1}, "headSkip 17 is above its limit 15"},
        Case{scriptOf(generate(0, 65)), {16, 32, 32, 1}, "tailSkip 31 is above its limit 15"},
        Case{scriptOf(wait(64)), {16, 32, 65, 1}, "tailSkip 31 is above its limit 15"},
        Case{scriptOf(generate(0, 1000), {256, 1}), {16, 8, 200, 1}, "markerOffset 256 is above its limit 255"},
        Case{scriptOf(wait(0)), {}, "wordCount 0 is below its limit 1"},
        Case{scriptOf(wait(64)), {16, 8, 0, 1}, "wordCount 0 is below its limit 1"}}) {
    EXPECT_THAT(failureOf(c.script, c.numbers),
                AllOf(HasSubstr("-1074101592"), HasSubstr(c.text), Not(HasSubstr("translator"))));
  }
  EXPECT_EQ(failureOf(scriptOf(generate(16, 64)), {16, 16, 64, 1}), "");
  EXPECT_EQ(failureOf(scriptOf(generate(0, 1000), {255, 1}), {16, 8, 200, 1}), "");
}

TEST(ScriptProcessor, CountsMemoryWordsWithoutWrapping) {
  ScriptScene scene;
  scene.addWaveform("w", 128);
  const auto totals = [&](const std::vector<Block>& blocks) {
    const ScriptEntry entry = scene.build(scriptOf(blocks)).entry;
    return std::pair(entry.totalMemoryWords, entry.finiteMemoryWords);
  };
  const std::uint32_t unbounded = 0xFFFFFFFF;
  EXPECT_EQ(totals({{LoopKind::kCounted, 3, 0, generate(0, kWholeWaveform)}}),
            std::pair(std::uint64_t{8 + 48 + 8}, 64u));
  EXPECT_EQ(totals({{LoopKind::kUntilTrigger, 7, 4, generate(0, kWholeWaveform)}}),
            std::pair(std::uint64_t{8 + 16 + 8}, unbounded));
  EXPECT_EQ(totals({{LoopKind::kForever, 7, 0, generate(0, kWholeWaveform)}}),
            std::pair(std::uint64_t{8 + 16 + 8}, unbounded));
  EXPECT_EQ(totals({{LoopKind::kCounted, 0xFFFFFFFF, 0, wait(0x7FFFFFF8)}}),
            std::pair(std::uint64_t{0xFFFFFFF} * 0xFFFFFFFF + 16, unbounded));
  const Block huge{LoopKind::kCounted, 0xFFFFFFFF, 0, wait(0x7FFFFFF8), 32};
  EXPECT_EQ(totals({huge, huge, huge}), std::pair(~std::uint64_t{0}, unbounded));
}

TEST(ScriptProcessor, HoldsAMillionMarkersOnOneGenerate) {
  constexpr std::uint32_t kMarkers = 1'000'000;
  ScriptScene scene({16, 8, 8, 1});
  scene.addWaveform("w", 8 * kMarkers);
  std::string text = "script s generate w marker1(0";
  for (std::uint32_t i = 1; i < kMarkers; ++i) text += ',' + std::to_string(8 * i);
  const std::vector<BuiltScript> scripts = scene.build(text + ") end script");
  EXPECT_EQ(scripts[0].entry.instructionWords.size(), kMarkers + 4);
  EXPECT_EQ(findFault(scripts[0], scene), "");
}

TEST(ScriptProcessor, KeepsTheOutputOfAFailedCompilation) {
  ScriptScene scene;
  std::vector<CompiledScript> scripts;
  scene.processor.compileScripts("script one wait 64 end script script two wait 64 end script", scripts);
  EXPECT_THROW(scene.processor.compileScripts("script three wait 64 end script script four", scripts),
               kterr::Exception);
  ASSERT_EQ(scripts.size(), 2u);
  EXPECT_EQ(scripts[1].name, "two");
}

}  // namespace
}  // namespace ktorba
