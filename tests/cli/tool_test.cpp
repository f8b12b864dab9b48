// The tool as its users meet it: run as a process, judged by exit code, output and files.
#include <gmock/gmock.h>

#include <cstdlib>
#include <nlohmann/json.hpp>

#include "cli/temporary.h"

namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

struct Result {
  std::string code;
  std::string out;
  std::string err;
};

class Tool : public testing::Test {
 protected:
  // Runs a shell command in the folder, with "ktorba" for the tool.
  Result run(const std::string& command) const {
    const std::string script = "ktorba() { \"" KTORBA_TOOL "\" \"$@\"; }\ncd '" + folder.path("") + "'\n(\n" + command +
                               "\n) >'" + files.path("out") + "' 2>'" + files.path("err") + "'\necho $? >'" +
                               files.path("code") + "'\n";
    [[maybe_unused]] const int ignored = std::system(("bash " + files.write("run.sh", script)).c_str());
    return {files.read("code"), files.read("out"), files.read("err")};
  }

  TemporaryFolder folder;
  TemporaryFolder files;
};

constexpr char kPulses[] =
    "script pulses\n"
    "  wait 100\n"
    "  repeat 3\n"
    "    generate pulse marker0(0)\n"
    "    wait until trigger2\n"
    "    clear trigger2\n"
    "    generate tail subset(64, 128)\n"
    "  end repeat\n"
    "end script\n";
constexpr char kWaveforms[] = " -w pulse=dc:length=200,amplitude=0.5 -w tail=ramp:length=192 ";

TEST_F(Tool, CheckReportsTheFirstErrorOfEachScriptAndGoesOn) {
  folder.write("bad.kts",
               "script a\n\tgenrate x\nend script // script\n"
               "script b\n  wait 4\n"  // its end is missing
               "script c generate w end script\n"
               "script d generate w marker1(0) wait until trigger9 end script\n");
  const Result result = run("ktorba check bad.kts");
  EXPECT_EQ(result.code, "1\n");
  EXPECT_EQ(result.out, "");
  EXPECT_THAT(result.err, HasSubstr("bad.kts:2:2: error: A keyword"));
  EXPECT_THAT(result.err, HasSubstr("    2 | \tgenrate x\n      | \t^~~~~~~\n      = Did you mean \"generate\"?"));
  EXPECT_THAT(result.err, HasSubstr("bad.kts:6:1: error: "));
  EXPECT_THAT(result.err, HasSubstr("bad.kts:7:43: error: "));
  EXPECT_THAT(result.err, Not(HasSubstr("bad.kts:6:17")));
  folder.write("names.kts", "script a junk generate script wait 64 \u017Fcript script wait 1 end script");
  EXPECT_THAT(run("ktorba check names.kts").err,
              AllOf(HasSubstr("names.kts:1:10: "), HasSubstr("names.kts:1:54: "), Not(HasSubstr("1:31: "))));
  folder.write("many.kts", "script a x" + std::string(3000, '\n') + std::string(6000, ' ') + "end script\n");
  EXPECT_THAT(run("for i in {1..200}; do cat many.kts; done >all.kts; ktorba check all.kts").err,
              AllOf(HasSubstr("all.kts:1:10: error"), HasSubstr("all.kts:297100:10: error"), Not(HasSubstr(":300101:")),
                    HasSubstr("ktorba: all.kts: there are more; mend these first\n")));
  const auto json = nlohmann::json::parse(run("ktorba check --format json bad.kts missing.kts").out);
  ASSERT_EQ(json.size(), 4u);
  EXPECT_EQ(json[2]["line"], 7);
  EXPECT_EQ(json[3]["file"], "missing.kts");
}

TEST_F(Tool, CheckWarnsOfWhatIsSurelyNotMeant) {
  folder.write("odd.kts",
               "script a\n  generate w marker0(0, 64, 64)\n  repeat forever generate w end repeat\n"
               "  wait 64\n  clear trigger1\nend script\nand more\n");
  folder.write("good.kts", "// no remark\nscript s generate w marker0(0) marker1(0) end script // end\n");
  const Result result = run("ktorba check odd.kts good.kts");
  EXPECT_EQ(result.code, "0\n");
  EXPECT_EQ(result.out, "odd.kts: 1 script, no errors\ngood.kts: 1 script, no errors\n");
  EXPECT_THAT(result.err, AllOf(HasSubstr("odd.kts:2:14: warning: A position of this marker"),
                                HasSubstr("odd.kts:4:3: warning: This instruction is never reached"),
                                HasSubstr("odd.kts:5:3: warning: This clear ends the script"),
                                HasSubstr("odd.kts:7:1: warning: The text from here on is never read")));
  EXPECT_THAT(result.err, Not(HasSubstr("good.kts")));
}

TEST_F(Tool, PlayWritesWhatTheScriptSays) {
  folder.write("pulses.kts", kPulses);
  const Result result =
      run("ktorba play pulses.kts" + std::string(kWaveforms) +
          "-t trigger2@500 -t trigger2@1ms -t trigger2@1500 -o p.csv -o p.vcd -o p.svg -o p.npy -o p.wav");
  EXPECT_EQ(result.code, "0\n") << result.err;
  EXPECT_EQ(result.err, "");
  EXPECT_THAT(result.out, HasSubstr("script      pulses: 10 of 4\u2009096 instructions\n"));
  EXPECT_THAT(result.out,
              HasSubstr("markers     marker0 \u00d7 3\ntriggers    trigger2 at 500 \u00b5s, trigger2 at 1 ms, "
                        "trigger2 at 1.5 ms\nclipped     none\nwrote       p.csv\n"));
  EXPECT_THAT(folder.read("p.csv"), HasSubstr("\n164,0.000164,16384,1,0,"));  // behind the start's 64 and the wait
  EXPECT_THAT(folder.read("p.vcd"), HasSubstr("\n#164\nb100000000000000 !\n1A\n"));
  EXPECT_EQ(folder.list(), "p.csv p.npy p.svg p.vcd p.wav pulses.kts ");
}

TEST_F(Tool, AnUnmetWaitIsNamedAtTheLimit) {
  folder.write("pulses.kts", kPulses);
  const Result wait = run("ktorba play pulses.kts --limit 3000" + std::string(kWaveforms));
  EXPECT_EQ(wait.code, "0\n");
  EXPECT_THAT(wait.err,
              StartsWith("pulses.kts:5:5: warning: At the limit of 3\u2009000 samples, instruction 6 still waits "
                         "for trigger2\n    5 |     wait until trigger2\n"));
  EXPECT_THAT(wait.out, HasSubstr("played      3\u2009000 samples, 3 ms at 1 MS/s, stopped at the limit"));
  folder.write("loop.kts", "script s\n repeat until trigger4\n generate w\n end repeat\nend script");
  EXPECT_THAT(run("ktorba play loop.kts -w w=sine --limit 1ms").err,
              StartsWith("loop.kts:2:2: warning: At the limit of 1\u2009000 samples, instruction 1 still repeats until "
                         "trigger4"));
  folder.write("ever.kts", "script s repeat forever generate w end repeat end script");
  const Result ever = run("ktorba play ever.kts -w w=sine --limit 5000");
  EXPECT_EQ(ever.err, "");
  EXPECT_THAT(ever.out, HasSubstr("5\u2009000 samples, 5 ms at 1 MS/s, stopped at the limit"));
}

TEST_F(Tool, WideSamplesAndForeignTraitsPlayToo) {
  folder.write("w.kts", "script s generate w end script");
  const Result result =
      run("ktorba play w.kts -w w=dc:length=32,amplitude=-0.5 --sample-width 32 --memory-word 8 "
          "--min-fetch 16 --memory 1KiB --sequence-memory 8 --sample-rate 44.1kHz -o w.csv");
  EXPECT_EQ(result.code, "0\n") << result.err;
  EXPECT_THAT(folder.read("w.csv"), HasSubstr(",-1073741824,2,1\n"));
}

TEST_F(Tool, FitTellsByHowMuch) {
  folder.write("pulses.kts", kPulses);
  const Result fits = run("ktorba fit pulses.kts" + std::string(kWaveforms));
  EXPECT_EQ(fits.code, "0\n");
  EXPECT_EQ(fits.out,
            "generator      16-bit samples at 1 MS/s, 67\u2009108\u2009864 bytes of memory in words of 16, 4\u2009096 "
            "instructions\n"
            "waveform       pulse: 200 samples, 200 \u00b5s\n"
            "waveform       tail: 192 samples, 192 \u00b5s\n"
            "sample memory  784 of 67\u2009108\u2009864 bytes (0.0 %), largest block left 67\u2009108\u2009080 bytes\n"
            "script         pulses: 10 of 4\u2009096 instructions, plays as long as it waits for trigger2\n"
            "priming        176 memory words, 1\u2009408 samples, of 1\u2009600 samples asked for\n");
  const Result small = run("ktorba fit pulses.kts --sequence-memory 6 --memory 1000" + std::string(kWaveforms));
  EXPECT_EQ(small.code, "1\n");
  EXPECT_THAT(small.out, HasSubstr("DOES NOT FIT   script pulses has 4 instructions too many\n"));
  EXPECT_THAT(run("ktorba fit pulses.kts --memory 512" + std::string(kWaveforms)).out,
              HasSubstr("DOES NOT FIT   waveform \"tail\" does not fit: it takes 384 bytes, and the largest block of "
                        "sample memory left has 112"));
  EXPECT_THAT(run("ktorba fit pulses.kts --memory 512" + std::string(kWaveforms)).out,
              AllOf(HasSubstr("\nscript         pulses: 10 of"), HasSubstr("\npriming        176 memory words")));
  EXPECT_THAT(run("ktorba fit pulses.kts --priming 5000" + std::string(kWaveforms)).out,
              HasSubstr("DOES NOT FIT   The priming depth is above the generator's limit"));
  folder.write("three.kts",
               "script a wait 64 end script\nscript b generate v subset(0, 64) end script\n"
               "script c wait 64 end script");
  const Result rest = run("ktorba fit three.kts -w v=sine:length=32");
  EXPECT_EQ(rest.code, "1\n");
  EXPECT_THAT(rest.err, AllOf(StartsWith("three.kts:2:10: error: "), Not(HasSubstr("three.kts:3:"))));
  EXPECT_THAT(rest.out, AllOf(HasSubstr("DOES NOT FIT   waveform \"v\": 32 samples are too few\n"),
                              HasSubstr("\nscript         a: "), Not(HasSubstr("\nscript         b: ")),
                              HasSubstr("\nscript         c: ")));
}

TEST_F(Tool, DisassemblyStandsBesideTheScript) {
  folder.write("pulses.kts", kPulses);
  const Result result = run("ktorba disassemble pulses.kts" + std::string(kWaveforms));
  EXPECT_EQ(result.code, "0\n");
  EXPECT_THAT(result.out, HasSubstr("      4 |     generate pulse marker0(0)\n"
                                    "    5  00000000 00000018 00000100 10000000  play pulse[0, 200), marker0 at 0"));
  EXPECT_THAT(result.out, HasSubstr("play tail[64, 192), clearing trigger2"));
  EXPECT_THAT(result.out,
              HasSubstr("      3 |   repeat 3\n    4  00000003 00000005 00000027 20000000  loop 3 times\n"));
  const std::string again = run("ktorba disassemble pulses.kts --as-script" + std::string(kWaveforms) +
                                ">again.kts && ktorba disassemble again.kts" + kWaveforms)
                                .out;
  const auto wordsOf = [](const std::string& listing) {
    std::string words;
    std::istringstream lines(listing);
    for (std::string line; std::getline(lines, line);) {
      if (line.find(" | ") == std::string::npos) words += line + "\n";
    }
    return words;
  };
  EXPECT_EQ(wordsOf(again), wordsOf(result.out));
}

TEST_F(Tool, ErrorsAreExplained) {
  EXPECT_THAT(run("ktorba errors").out, HasSubstr(" -1074101568  ktwfmscriptcompiler_errors_kErrorKeywordExpected"));
  const std::string expected = run("ktorba errors kErrorKeywordExpectedInScript").out;
  EXPECT_THAT(expected, HasSubstr("= -1074101568 (0xBFFA82C0)\n  A keyword"));
  for (const char* same :
       {"-1074101568", "0xbffa82c0", "3220865728", "ktwfmscriptcompiler_errors_kErrorKeywordExpectedInScript",
        "ktwfmscriptcompiler_errors::KERRORKEYWORDEXPECTEDINSCRIPT"}) {
    EXPECT_EQ(run(std::string("ktorba errors ") + same).out, expected) << same;
  }
  const Result unknown = run("ktorba errors kErrorKeywordExpectdInScript");
  EXPECT_EQ(unknown.code, "1\n");
  EXPECT_THAT(unknown.err, HasSubstr("Did you mean kErrorKeywordExpectedInScript?"));
}

TEST_F(Tool, BadInputIsNamed) {
  folder.write("pulses.kts", kPulses);
  folder.write("two.kts", "script a generate w end script\nscript b generate w end script");
  folder.write("latin.kts", "script a\n generate t\xE4st end script");
  folder.write("empty.wav", "");
  folder.write("short.kts", "script s generate w subset(0, 4) end script");
  const std::string all = kWaveforms;
  const std::tuple<std::string, const char*, const char*> cases[] = {
      {"play", "2", "SCRIPT is required"},
      {"plya pulses.kts", "2", ""},
      {"play pulses.kts --sample-width 12" + all, "1", "--sample-width: must be 16 or 32"},
      {"play pulses.kts --sample-rate fast" + all, "2", "is not a rate"},
      {"play missing.kts", "1", "missing.kts: no such file"},
      {"check .", "1", ".: is a directory"},
      {"play latin.kts", "1", "latin.kts:2:12: error: The text is not valid UTF-8"},
      {"play pulses.kts -w pulze=sine -w tail=sine", "1",
       "pulses.kts:4:14: error: Nobody gave the waveform \"pulse\"\n    4 |     generate pulse marker0(0)\n      |     "
       "    "
       "     ^~~~~\n      = Did you mean \"pulze\"?"},
      {"play pulses.kts -w pulse=empty.wav -w tail=sine", "1", "empty.wav: "},
      {"play pulses.kts --memory 1000 -w pulse=sine -w tail=sine", "1", "longer than the generator's memory"},
      {"play pulses.kts --memory 2000 -w pulse=sine -w tail=sine", "1", "waveform \"tail\" does not fit"},
      {"play pulses.kts -w pulse=dc:length=63 -w tail=sine", "1", "63 samples are too few"},
      {"play pulses.kts -t trigger8@1" + all, "1", "\"trigger8@1\" is not of the form TRIGGER@WHEN"},
      {"play pulses.kts -t trigger1" + all, "1", "is not of the form TRIGGER@WHEN"},
      {"play pulses.kts --limit never" + all, "1", "--limit: \"never\""},
      {"play pulses.kts -o x.mp7" + all, "1", "Known endings: .wav .flac .csv .npy .vcd .svg .png .pdf."},
      {"play pulses.kts -o missing/x.csv" + all, "1", "there is no folder missing"},
      {"play two.kts -w w=sine", "1", "Choose one with --script: a, b"},
      {"play two.kts --script c -w w=sine", "1", "It holds a, b."},
      {"play short.kts -w w=sine", "1", "short.kts:1:10: error: A waveform or a subset is shorter"},
      {"play pulses.kts --sequence-memory 5" + all, "1", "kErrorSequenceSizeTooLarge"},
  };
  for (const auto& [arguments, code, message] : cases) {
    const Result result = run("ktorba " + arguments);
    EXPECT_EQ(result.code, code + std::string("\n")) << arguments << result.err;
    EXPECT_THAT(result.err + result.out, HasSubstr(message)) << arguments;
  }
}

TEST_F(Tool, WarnsAboutClippingUnusedWaveformsAndRates) {
  folder.write("w.kts", "script s generate w end script");
  const Result result = run("ktorba play w.kts -w w=sine:amplitude=2 -w spare=sine -o w.wav");
  EXPECT_EQ(result.code, "0\n");
  EXPECT_THAT(result.err,
              HasSubstr("waveform \"w\": 666 of 1\u2009000 samples were beyond full scale and are clipped\n"));
  EXPECT_THAT(result.err, HasSubstr("waveform \"spare\" is given, and no script plays it\n"));
  EXPECT_THAT(result.out, HasSubstr("clipped     666 samples of the waveforms\n"));
  EXPECT_THAT(run("ktorba play w.kts --waveforms . --sample-rate 8k").err,
              HasSubstr("was recorded at 1 MS/s and plays at 8"));
  EXPECT_THAT(run("ktorba play w.kts -w w=dc:length=63,amplitude=2").err, HasSubstr("beyond full scale"));
  EXPECT_THAT(run("ktorba fit w.kts -w w=sine -w $'\\e'=sine").err,
              AllOf(HasSubstr("waveform \""), Not(HasSubstr("\x1b"))));
}

TEST_F(Tool, FullDisksAndClosedPipesLeaveNoHalfFile) {
  folder.write("w.kts", "script s repeat 20 generate w end repeat end script");
  const Result full = run("trap '' XFSZ; ulimit -f 8; ktorba play w.kts -w w=noise -o w.csv");
  EXPECT_EQ(full.code, "1\n");
  EXPECT_THAT(full.err, HasSubstr("w.csv: cannot be written"));
  EXPECT_EQ(folder.list(), "w.kts ");
  EXPECT_EQ(run("ktorba errors | head -1 >/dev/null; echo ${PIPESTATUS[0]}").out, "0\n");
  EXPECT_EQ(run("ktorba errors >/dev/full").code, "1\n");
  folder.write("bad.kts", "script");
  for (const char* command : {"check w.kts bad.kts", "fit w.kts -w w=sine --sequence-memory 2"}) {
    const Result closed = run("{ sleep 0.1; ktorba " + std::string(command) + "; } | true; echo ${PIPESTATUS[0]}");
    EXPECT_EQ(closed.out, "1\n") << command << closed.err;
  }
}

TEST_F(Tool, AnInterruptedPlayIsWhole) {
  folder.write("w.kts", "script s repeat forever generate w end repeat end script");
  const Result result = run("(exec \"" KTORBA_TOOL
                            "\" play w.kts -w w=noise --limit 200M -o w.wav) & "
                            "sleep 0.2; kill -INT $!; wait $!");
  EXPECT_EQ(result.code, "1\n") << result.err;
  EXPECT_THAT(result.out, HasSubstr(", interrupted\n"));
  std::uint32_t riffBytes = 0;  // of all that follows this number, so that the header matches the file
  std::ifstream wav(folder.path("w.wav"), std::ios::binary);
  wav.seekg(4).read(reinterpret_cast<char*>(&riffBytes), 4);
  EXPECT_EQ(riffBytes + std::uintmax_t{8}, std::filesystem::file_size(folder.path("w.wav")));
  EXPECT_EQ(folder.list(), "w.kts w.wav ");
}

TEST_F(Tool, HelpShowsExamplesOfEveryCommand) {
  EXPECT_THAT(run("ktorba --version").out, StartsWith("ktorba 0."));
  for (const char* command : {"", "play", "check", "disassemble", "fit", "errors"}) {
    const Result help = run(std::string("ktorba ") + command + " --help");
    EXPECT_EQ(help.code, "0\n");
    EXPECT_THAT(help.out, HasSubstr(std::string("Examples:\n  ktorba "))) << command;
  }
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
    const bool lacksSound = command.find("/usr/share/sounds") != std::string::npos &&
                            !std::filesystem::exists("/usr/share/sounds/freedesktop");
    if (lacksSound) continue;
    const Result result = run("ln -sfn " KTORBA_EXAMPLES " examples\n" + command);
    EXPECT_EQ(result.code + result.err, "0\n") << file.path();
    EXPECT_THAT(result.out, AllOf(HasSubstr(", to the end\n"), Not(HasSubstr("none fired")), HasSubstr("wrote ")))
        << command;
  }
}

TEST_F(Tool, CompletionsAndManPageKnowTheCommandLine) {
  const auto complete = [this](const std::string& words) {
    return run("source " KTORBA_DOCUMENTS "/ktorba.bash; COMP_WORDS=(" + words +
               "); COMP_CWORD=$((${#COMP_WORDS[@]} - 1)); _ktorba; echo ${COMPREPLY[@]}")
        .out;
  };
  EXPECT_EQ(complete("ktorba d"), "disassemble\n");
  EXPECT_EQ(complete("ktorba play --wa"), "--waveform --waveforms\n");
  EXPECT_EQ(complete("ktorba check --format j"), "json\n");
  EXPECT_EQ(complete("ktorba fit --as"), "\n");
  const std::string page = run("cat " KTORBA_DOCUMENTS "/ktorba.1").out;
  EXPECT_THAT(page, HasSubstr("\\fB\\-\\-waveforms\\fR \\fIFOLDER\\fR\n"));
  EXPECT_THAT(page, HasSubstr(".SS ktorba errors\n"));
}

}  // namespace
