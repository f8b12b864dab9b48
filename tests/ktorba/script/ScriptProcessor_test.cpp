// What script processing makes of records; what it makes of texts is in golden/.
#include "ktorba/script/ScriptProcessor.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <optional>

#include "testing/ScriptScene.h"
#include "testing/caught.h"
#include "testing/golden.h"

namespace ktorba {
namespace {

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

// Code and elaboration as golden files have them, or nothing.
std::string failureOf(const CompiledScript& script, const SceneNumbers& numbers) {
  ScriptScene scene(numbers);
  scene.addWaveform("w", 1000);
  const std::string failure = ::failureOf([&] { scene.build(script); });
  const std::size_t brace = failure.find('{');
  return brace == std::string::npos ? failure : failure.substr(0, brace) + " " + describe(failure.substr(brace));
}

TEST(ScriptProcessor, RefusesRecordsThatNoTextGivesAndWhatAnInstructionHasNoRoomFor) {
  const Block unknownLoop{.loopKind = LoopKind{3}, .fetch = wait(64)};
  const Block unknownTrigger{.triggerNumber = 9, .fetch = wait(64)};
  FetchRecord triggered = wait(64);
  triggered.triggerNumber = 9;
  const char *const software = "-1074101592", *const source = R"(in ktorba\\script\\ScriptProcessor)";
  const SceneNumbers wide{16, 32, 32, 1};
  const struct {
    CompiledScript script;
    SceneNumbers numbers;
    const char *code, *part;
  } kCases[] = {
      {scriptOf({unknownLoop}), {}, software, source},
      {scriptOf({unknownTrigger}), {}, software, source},
      {scriptOf(triggered), {}, software, source},
      {scriptOf(wait(0x80000000)), {}, "-1074101619", "kUsageTypeWaveformLength -2147483648 int32_t"},
      {scriptOf(generate(0, 0xFFFFFFFE)), {}, "-1074101607", "kUsageTypeSubsetLength -2 int32_t"},
      {scriptOf(generate(1, kWholeWaveform)), {}, "-1074101606", "kUsageTypeSubsetLength 4294967295 uint32_t"},
      {scriptOf(generate(1001, kWholeWaveform)), {}, "-1074101605", "kUsageTypeStartOffset 1001 uint32_t"},
      {scriptOf(generate(17, 64)), wide, software, "headSkip 17 is above its limit 15"},
      {scriptOf(generate(0, 65)), wide, software, "tailSkip 31 is above its limit 15"},
      {scriptOf(generate(0, 1000), {256, 1}), {16, 8, 200, 1}, software, "markerOffset 256 is above its limit 255"},
      {scriptOf(wait(0)), {}, software, "wordCount 0 is below its limit 1"},
      {scriptOf(generate(16, 64)), {16, 16, 64, 1}, "", ""},
      {scriptOf(generate(0, 1000), {255, 1}), {16, 8, 200, 1}, "", ""},
  };
  for (const auto& [script, numbers, code, part] : kCases) {
    const std::string failure = failureOf(script, numbers);
    EXPECT_THAT(failure, AllOf(testing::StartsWith(code), testing::HasSubstr(part)));
    EXPECT_EQ(failure.empty(), *code == '\0') << failure;
  }
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
