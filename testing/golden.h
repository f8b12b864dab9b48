// Golden files: what came of something once and was found right, to be compared with ever after. With
// KTORBA_UPDATE_GOLDEN=1 in the environment they are written anew instead: review the difference.
#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

// What golden files have of an elaboration: not what is in every one, nor the line of a raise site, which changes with
// its source.
std::string describe(const std::string& elaboration);

// Expects the file to hold `actual`, whole.
void expectGolden(const std::filesystem::path& path, const std::string& actual);

// A golden file of cases, each an input beside what comes of it:
//
//   what is in front of all cases
//   ==== name of a case
//   its input
//   ----
//   what comes of it
class GoldenFile {
 public:
  explicit GoldenFile(const std::filesystem::path& path);

  // What is in front of all cases.
  const std::string& header() const { return header_; }

  // Expects of each case what `outcome` makes of its input, without the line feed at the end.
  void check(const std::function<std::string(const std::string& input)>& outcome) const;

 private:
  struct Case {
    std::string title, input;
  };

  std::filesystem::path path_;
  std::string header_;
  std::vector<Case> cases_;
};

// The golden files of a folder, by name, and what a test of one of them is called:
// INSTANTIATE_TEST_SUITE_P(All, Golden, testing::ValuesIn(goldenFiles(folder)), goldenName);
std::vector<std::filesystem::path> goldenFiles(const std::filesystem::path& folder);
std::string goldenName(const testing::TestParamInfo<std::filesystem::path>& file);
