#include "testing/golden.h"

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <regex>
#include <sstream>

#include "testing/files.h"

std::string describe(const std::string& elaboration) {
  static const std::pair<std::regex, const char*> kShorter[] = {
      {std::regex(R"re((\{"error_constant":.*|"ktisl[^"]*"),"line":\d+)re"), "$1"},
      {std::regex(R"re(,?"component":"ktorbau"|,?"translator":"mxlator_ktorba"|"is_debug":"0","version":1,)re"), ""},
      {std::regex(R"re(\{"type":"usage","usage":"(.*?)","value":(".*?"|.*?),"value_type":"(.*?)"\})re"), " $1 $2 $3"},
      {std::regex(R"re( kUsageTypeLineNumber (\d+) uint32_t, kUsageTypePositionInLine (\d+) uint32_t)re"), " at $1:$2"},
      {std::regex(R"re(,"translator_info":\{"ordered_data":\[(.*)\]\})re"), "$1"},
      {std::regex(R"re(\{"error_constant":"(.*?)","file":"(.*?)"(.*)\})re"), "$1 in $2$3"},
  };
  std::string text = elaboration;
  for (const auto& [pattern, shorter] : kShorter) text = std::regex_replace(text, pattern, shorter);
  return text;
}

void expectGolden(const std::filesystem::path& path, const std::string& actual) {
  if (std::getenv("KTORBA_UPDATE_GOLDEN") != nullptr) {
    std::ofstream file(path, std::ios::binary);
    file << actual;
    EXPECT_TRUE(file.flush()) << path;
  } else {
    EXPECT_EQ(readFile(path), actual) << path;
  }
}

GoldenFile::GoldenFile(const std::filesystem::path& path) : path_(path) {
  std::istringstream file(readFile(path));
  std::string outcome;
  std::string* section = &header_;
  for (std::string line; std::getline(file, line);) {
    if (line.starts_with("==== ")) {
      section = &cases_.emplace_back(Case{line, ""}).input;
    } else if (line == "----" && !cases_.empty()) {
      section = &outcome;
    } else {
      section->append(line).append("\n");
    }
  }
}

void GoldenFile::check(const std::function<std::string(const std::string& input)>& outcome) const {
  ASSERT_FALSE(cases_.empty()) << path_;
  std::string text = header_;
  for (const Case& each : cases_) {
    text += each.title + "\n" + each.input + "----\n" + outcome(each.input.substr(0, each.input.size() - 1));
  }
  expectGolden(path_, text);
}

std::vector<std::filesystem::path> goldenFiles(const std::filesystem::path& folder) {
  std::vector<std::filesystem::path> paths;
  for (const auto& entry : std::filesystem::directory_iterator(folder)) paths.push_back(entry.path());
  std::ranges::sort(paths);
  return paths;
}

std::string goldenName(const testing::TestParamInfo<std::filesystem::path>& file) {
  std::string name = file.param.stem().string();
  std::ranges::replace(name, '-', '_');
  return name;
}
