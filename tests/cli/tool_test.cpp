// The tool as its users meet it: run as a process, judged by exit code, output and files.
#include <gmock/gmock.h>

#include <cstdlib>
#include <fstream>
#include <sstream>

#include "testing/files.h"
#include "testing/golden.h"

namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

struct Result {
  std::string code;
  std::string out;
  std::string err;
};

class Tool : public testing::Test {
 protected:
  // Runs a shell command in the folder, with "ktorba" for the tool, $tool for its file and $documents for the folder of
  // its documents.
  Result run(const std::string& command) const {
    const std::string script = "tool='" KTORBA_TOOL "'\nktorba() { \"$tool\" \"$@\"; }\ndocuments='" KTORBA_DOCUMENTS
                               "'\ncd '" +
                               folder.path("") + "'\n(\n" + command + "\n) >'" + files.path("out") + "' 2>'" +
                               files.path("err") + "'\necho $? >'" + files.path("code") + "'\n";
    [[maybe_unused]] const int ignored = std::system(("bash " + files.write("run.sh", script)).c_str());
    return {files.read("code"), files.read("out"), files.read("err")};
  }

  TemporaryFolder folder;
  TemporaryFolder files;
};

// The golden files in sessions/: "$ " stands in front of each command, "> " in front of its further lines, "# " in
// front of remarks, and below is what the command writes to the standard output, then to the standard error, and how it
// ends, unless with 0.
class Recorded : public Tool {
 protected:
  std::string replay(const std::filesystem::path& path) {
    std::istringstream session(readFile(path));
    std::string replayed;
    std::string command;
    for (std::string line; std::getline(session, line);) {
      const bool continues = line.starts_with("> ");
      if (!continues) replayed += resultOf(std::exchange(command, ""));
      const bool isCommand = continues || line.starts_with("$ ");
      if (isCommand) command += line.substr(2) + "\n";
      const bool isComment = line.starts_with("# ");
      if (isComment && !replayed.empty()) replayed += "\n";  // a paragraph begins
      if (isCommand || isComment) replayed += line + "\n";
    }
    return replayed + resultOf(command);
  }

  static std::string withoutTimes(std::string text) {
    const std::size_t took = text.find("\ntook ") + 1;
    return took == 0 ? text : text.replace(took, text.find('\n', took) - took, "took its time");
  }

  std::string resultOf(const std::string& command) {
    if (command.empty()) return "";
    const Result result = run(command);
    return withoutTimes(result.out) + result.err + (result.code != "0\n" ? "exit " + result.code : "");
  }
};

class Session : public Recorded, public testing::WithParamInterface<std::filesystem::path> {};

// What the first line of a session says that the tool must have been built with, "# Needs sound pictures", and was not.
std::string missingParts(const std::filesystem::path& session) {
  std::istringstream line(readFile(session));
  std::string missing;
  std::string word;
  line >> word >> word;
  if (word != "Needs") return missing;
  while (line.get() != '\n' && line >> word) {
    if (std::string(KTORBA_PARTS).find(word) == std::string::npos) missing += word + " ";
  }
  return missing;
}

TEST_P(Session, GoesAsWritten) {
  const std::string missing = missingParts(GetParam());
  if (!missing.empty()) GTEST_SKIP() << "the tool was built without " << missing;
  expectGolden(GetParam(), replay(GetParam()));
}

INSTANTIATE_TEST_SUITE_P(All, Session, testing::ValuesIn(goldenFiles(KTORBA_GOLDEN_FOLDER)), goldenName);

// The sessions that a page shows: lines that stand in by four blanks, from a command on.
using Guide = Recorded;

TEST_F(Guide, GoesAsShown) {
  folder.write("typo.kts", "script s\n  genrate pulse\nend script\n");
  folder.write("pulses.kts", "script s generate pulse end script\n");
  folder.write("radar.kts",
               "script radar\n  repeat until trigger1\n    generate chirp\n    wait 700\n  end repeat\n"
               "  generate idle\nend script\n");
  folder.write("train.kts", "script train\n  repeat 3\n    generate pulse\n    wait 200\n  end repeat\nend script\n");
  folder.write("train.new.kts",
               "script train\n  generate pulse\n  wait 200\n  generate pulse\n  wait 250\nend script\n");
  std::string table = "Model,DSO1000\nRecord Length,1000\n\nTIME,CH1\ns,V\n";
  for (int i = 0; i < 1000; ++i) table += std::to_string(i) + (i == 0 ? ",-0.21\n" : i == 1 ? ",0.93\n" : ",0.5\n");
  folder.write("scope.csv", table);
  std::istringstream guide(readFile(KTORBA_GUIDE));
  std::size_t shown = 0;
  std::string session;
  for (std::string line; std::getline(guide, line);) {
    const bool isCommand = line.starts_with("    $ ");
    const bool isShown = line.starts_with("    ") && (isCommand || !session.empty());
    if (isShown) session += line.substr(4) + "\n";
    if (isShown || session.empty()) continue;
    const std::size_t command = session.find('\n') + 1;
    EXPECT_THAT(resultOf(session.substr(2, command - 2)), HasSubstr(session.substr(command)));
    session.clear();
    ++shown;
  }
  EXPECT_GE(shown, 2u);
}

// The commands that the comments of an example give: the lines that stand in by three blanks.
std::string commandOf(const std::string& example) {
  std::ifstream script(example);
  std::string command;
  for (std::string line; std::getline(script, line);) {
    if (line.starts_with("//   ")) command += line.substr(5) + "\n";
  }
  return command;
}

TEST_F(Tool, ExamplesPlayByTheirOwnCommands) {
  for (const auto& file : std::filesystem::directory_iterator(KTORBA_EXAMPLES)) {
    if (file.path().extension() != ".kts") continue;
    const std::string command = commandOf(file.path().string());
    const bool lacksParts =
        command.find(".png") != std::string::npos && std::string(KTORBA_PARTS).find("pictures") == std::string::npos;
    const bool lacksSound = command.find("/usr/share/sounds") != std::string::npos &&
                            !std::filesystem::exists("/usr/share/sounds/freedesktop");
    if (lacksSound || lacksParts) continue;
    const Result result = run("ln -sfn " KTORBA_EXAMPLES " examples\n" + command);
    EXPECT_EQ(result.code + result.err, "0\n") << file.path();
    EXPECT_THAT(result.out, AllOf(HasSubstr(", to the end\n"), Not(HasSubstr("none fired")), HasSubstr("wrote ")))
        << command;
  }
}

}  // namespace
