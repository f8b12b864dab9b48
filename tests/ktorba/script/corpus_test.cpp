// The fuzzer's corpus, without the fuzzer.
#include <gtest/gtest.h>

#include <filesystem>

#include "testing/ScriptInput.h"
#include "testing/files.h"

namespace {

TEST(ScriptCorpus, IsAcceptedWhereItsNameSaysSo) {
  for (const auto& entry : std::filesystem::directory_iterator(KTORBA_CORPUS_FOLDER)) {
    const std::int32_t code = runScriptInput(readFile(entry.path()));
    EXPECT_EQ(code == 0, entry.path().filename().string().starts_with("ok-")) << entry.path();
  }
}

}  // namespace
