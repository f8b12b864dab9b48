// A file of cases, each an input beside what is expected to come of it:
//
//   what is in front of all cases
//   ==== name of a case
//   its input
//   ----
//   what comes of it
//
// With KTORBA_UPDATE_GOLDEN=1 in the environment the expectations are written anew: review the difference.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <vector>

class GoldenFile {
 public:
  explicit GoldenFile(const std::filesystem::path& path) : path_(path) {
    std::ifstream file(path_, std::ios::binary);
    std::string* section = &header_;
    for (std::string line; std::getline(file, line);) {
      if (line.starts_with("==== ")) {
        section = &cases_.emplace_back(Case{line.substr(5), "", ""}).input;
      } else if (line == "----") {
        section = &cases_.back().expected;
      } else {
        section->append(line).append("\n");
      }
    }
  }

  const std::string& header() const { return header_; }

  // Expects of each case what `outcome` makes of its input, without the line feed at the end.
  void check(const std::function<std::string(const std::string& input)>& outcome) {
    ASSERT_FALSE(cases_.empty()) << path_;
    const bool isUpdate = std::getenv("KTORBA_UPDATE_GOLDEN") != nullptr;
    for (Case& each : cases_) {
      const std::string actual = outcome(each.input.substr(0, each.input.size() - 1));
      if (!isUpdate) {
        EXPECT_EQ(actual, each.expected) << each.name;
      }
      each.expected = actual;
    }
    if (isUpdate) write();
  }

 private:
  struct Case {
    std::string name, input, expected;
  };

  void write() const {
    std::ofstream file(path_, std::ios::binary);
    file << header_;
    for (const Case& each : cases_) file << "==== " << each.name << '\n' << each.input << "----\n" << each.expected;
  }

  std::filesystem::path path_;
  std::string header_;
  std::vector<Case> cases_;
};
