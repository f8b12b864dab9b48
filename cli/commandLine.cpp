#include "cli/commandLine.h"

#include <CLI/CLI.hpp>
#include <algorithm>

#include "cli/commands/commands.h"
#include "cli/console.h"
#include "conventions/conventions.h"
#include "platform/system/interrupts.h"
#include "platform/system/programArguments.h"
#include "platform/system/terminal.h"
#include "tools/outputs/Output.h"
#include "tools/sources/Source.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools::cli {
namespace {

constexpr char kDescription[] =
    "Checks, explains and plays scripts for a waveform generator. Exit codes: 0, 1 for errors in what was given, 2 for "
    "a wrong command line.";

constexpr char kMainExamples[] = R"(Examples:
  ktorba check pulses.kts
  ktorba play pulses.kts --waveform pulse=gauss:length=500 --output pulses.svg
  ktorba help COMMAND        examples of each command
)";

constexpr char kPlayExamples[] = R"(
Outputs, by their ending: .wav .flac (sound), .csv, .npy, .vcd (for waveform viewers), .svg .png .pdf (a picture),
.html (a page to walk through).
- is the standard output, and as SCRIPT the standard input.

Examples:
  ktorba play pulses.kts --waveform pulse=gauss:length=500 --output pulses.svg
  ktorba play song.kts --waveforms sounds/ --sample-rate 44100 --output song.wav
  ktorba play radar.kts --waveform chirp=chirp:length=20us,to=5MHz --sample-rate 20MHz \
      --trigger trigger1@2ms --limit 3ms --output radar.vcd --output radar.png
  ktorba play pulses.kts --waveform pulse=gauss --output - --output-format csv | head
)";

constexpr char kPlotExamples[] = R"(
What plays is computed, so that no play is too long to be drawn. Without --length the whole play is shown; of one without
end, what comes before it repeats and three rounds of that.

Examples:
  ktorba plot pulses.kts --waveform pulse=gauss:length=500 --output pulses.svg
  ktorba plot radar.kts --waveforms sounds/ --trigger trigger1@2ms --from 1.9ms --length 300us --output radar.png
  ktorba plot tests.kts --waveforms sounds/ --script first --script second --lanes samples,markers --style dark \
      --width 800 --output tests.pdf
)";

constexpr char kCheckExamples[] = R"(
Examples:
  ktorba check pulses.kts radar.kts
  ktorba check --format json pulses.kts
)";

constexpr char kDisassembleExamples[] = R"(
Examples:
  ktorba disassemble pulses.kts --waveform pulse=gauss:length=500
  ktorba disassemble pulses.kts --waveform pulse=pulse.wav --as-script
)";

constexpr char kFitExamples[] = R"(
Examples:
  ktorba fit pulses.kts --waveform pulse=pulse.wav
  ktorba fit pulses.kts --waveforms sounds/ --memory 1MiB --sequence-memory 256
  ktorba fit radar.kts --waveforms sounds/ --trigger trigger1@2ms --map --output memory.svg
)";

constexpr char kDiffExamples[] = R"(
Exit codes: 0 where they play the same, 1 where they do not, 2 for trouble. How a script is written does not count, nor
which triggers come: samples, markers and the use of triggers do. Scripts are compared by name, and the only scripts of
two files whatever they are called.

Examples:
  ktorba diff pulses.kts pulses.new.kts --waveform pulse=gauss:length=500
  git show HEAD:pulses.kts | ktorba diff - pulses.kts --waveforms sounds/
)";

constexpr char kErrorsExamples[] = R"(
Examples:
  ktorba errors
  ktorba errors -1074101568
  ktorba errors 0xBFFA82C0
  ktorba errors kErrorKeywordExpectedInScript
  ktorba errors sample memory
)";

// Reads "20MHz", "44.1k" or "44100".
struct SampleRateReader {
  GeneratorOptions& options;
  void operator()(const std::string& text) const {
    auto rateHz = parseQuantity(text, "Hz");
    if (!rateHz) rateHz = parseQuantity(text, "S/s");
    if (!rateHz) throw CLI::ValidationError("--sample-rate", "\"" + text + "\" is not a rate such as 44100 or 20MHz");
    options.sampleRateHz = *rateHz;
  }
};

void addGeneratorOptions(CLI::App& command, GeneratorOptions& options) {
  const std::string group = "The generator";
  const auto add = [&](const std::string& name, auto& value, const char* unit, const std::string& help) {
    return command.add_option(name, value, help)->group(group)->capture_default_str()->type_name(unit);
  };
  add("--sample-width", options.sampleWidthBits, "BITS", "Bits per sample, 16 or 32");
  command.add_option_function<std::string>("--sample-rate", SampleRateReader{options}, "Samples per second")
      ->group(group)
      ->type_name("RATE")
      ->default_str("1MHz");
  const auto withPrefix = CLI::AsSizeValue(true).description("");
  add("--memory", options.memorySizeBytes, "BYTES", "Sample memory; k, M, G, or Ki, Mi, Gi may stand behind")
      ->transform(withPrefix);
  add("--memory-word", options.memoryWordBytes, "BYTES", "Size of a word of sample memory");
  add("--min-fetch", options.minFetchSamples, "SAMPLES", "Shortest waveform, subset and wait");
  add("--sequence-memory", options.sequenceWords, "COUNT", "Instructions that sequence memory holds, as --memory")
      ->transform(withPrefix);
  add("--max-priming", options.maxPrimingWords, "WORDS", "Largest priming depth, in memory words");
}

void addStrictOption(CLI::App& command, bool& isStrict) {
  command.add_flag("--strict", isStrict, "Take warnings for errors");
}

void addTriggerOption(CLI::App& command, std::vector<std::string>& triggers) {
  command.add_option("-t,--trigger", triggers, "Raise trigger1 to trigger7 at a sample or time after the start")
      ->type_name("TRIGGER@WHEN")
      ->allow_extra_args(false);
}

void addWaveformOptions(CLI::App& command, WaveformOptions& options) {
  command.add_option("-w,--waveform", options.given, "A waveform; see below")
      ->type_name("NAME=SOURCE")
      ->allow_extra_args(false);
  command.add_option("--waveforms", options.folders, "Every sound file of a folder, by its name")
      ->type_name("FOLDER")
      ->allow_extra_args(false);
}

void addWindowOptions(CLI::App& command, WindowOptions& options) {
  addTriggerOption(command, options.triggers);
  command.add_option("--from", options.from, "Begin there, at a sample or time after the start")
      ->type_name("SAMPLE|TIME");
  command.add_option("--length", options.length, "So many samples, or so much time, alone")->type_name("SAMPLES|TIME");
}

constexpr char kSourceHelp[] = R"(Sources, with parameters behind a colon:
  file.wav           a sound file, any but the endings below; its channel: file.wav:2 or channel=2
  file.csv           a table, also .tsv and .txt; its column, by name or number: file.csv:volts or column=volts. Where
                     it could be read in several ways: skip=ROWS, header=ROW or none, decimal=. or decimal=,
  file.npy           an array; a column of two dimensions: file.npy:2 or column=2
  file.npz           an archive of arrays: file.npz:NAME or member=NAME, and column=2
  file.raw, .bin     little-endian samples of the generator's width
All files take gain=2 and offset=0.1 (of full scale), normalise (the greatest magnitude becomes full scale),
full-scale=5V (the number that does), codes (numbers are samples as the generator holds them), rate=48kHz (at which they
were recorded) and resample (to the rate of the generator). A comma in a name: file.csv:column="level, V",gain=2.
)";

std::string sourceHelp() { return kSourceHelp + shapeHelp(); }

// The commands with the options that they are run with.
class CommandLine {
 public:
  CommandLine() : app_(kDescription, "ktorba") {
    app_.set_version_flag("--version", "ktorba " KTORBA_VERSION);
    app_.footer(kMainExamples);
    app_.require_subcommand(1);
    app_.allow_windows_style_options(false);  // what begins with a slash is a file, on every system
    addColor(app_);
    addPlay();
    addPlot();
    addCheck();
    addDisassemble();
    addFit();
    addDiff();
    addErrors();
    addHelp();
  }

  int run(int argc, const char* const* argv) {
    if (argc > 1 && !isCommand(argv[1]) && *argv[1] != '-') return refuseCommand(argv[1]);
    try {
      app_.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
      if (error.get_exit_code() == 0) return app_.exit(error);
      return refuseUsage(error);
    }
    return run_();
  }

  std::vector<CommandHelp> describe() const {
    std::vector<CommandHelp> commands = {describeApp(app_, "")};
    for (const CLI::App* app : app_.get_subcommands(nullptr)) commands.push_back(describeApp(*app, app->get_name()));
    OptionHelp& helpOn = commands.back().options.back();  // of the command help, which stands last
    helpOn.value += ":{" + join(commandNames(), ",") + "}";
    return commands;
  }

 private:
  std::vector<std::string> commandNames() const {
    std::vector<std::string> names;
    for (const CLI::App* app : app_.get_subcommands(nullptr)) names.push_back(app->get_name());
    return names;
  }

  bool isCommand(const std::string& word) const {
    const auto names = commandNames();
    return std::find(names.begin(), names.end(), word) != names.end();
  }

  int refuseCommand(const std::string& word) const {
    const std::string similar = findNearMiss(word, commandNames());
    printFailure("\"" + word + "\" is not a command" + (similar.empty() ? "" : "; the most similar is: " + similar),
                 similar.empty() ? "Commands: " + join(commandNames()) + "." : "");
    return kUsageError;
  }

  // The command that was being read, or the tool itself.
  const CLI::App& currentApp() const {
    const auto commands = app_.get_subcommands();
    return commands.empty() ? app_ : *commands.front();
  }

  static std::string describeUnknownOption(const CLI::App& app, const std::string& option) {
    std::vector<std::string> names;
    for (const CLI::Option* known : app.get_options()) {
      for (const std::string& name : known->get_lnames()) names.push_back("--" + name);
    }
    const std::string similar = findNearMiss(option.substr(0, option.find('=')), names);
    return "there is no option " + option + (similar.empty() ? "" : "; the most similar is: " + similar);
  }

  // An unknown option goes before what else is wrong, since that may well come of it.
  int refuseUsage(const CLI::ParseError& error) const {
    const CLI::App& app = currentApp();
    std::string message = error.what();
    for (const std::string& extra : app_.remaining(true)) {
      if (!extra.starts_with('-')) continue;
      message = describeUnknownOption(app, extra);
      break;
    }
    const std::string command = &app == &app_ ? "" : " " + app.get_name();
    printFailure(message, "ktorba" + command + " --help tells what there is.");
    return kUsageError;
  }

  static CommandHelp describeApp(const CLI::App& app, const std::string& name) {
    CommandHelp command = {name, app.get_description(), {}, app.get_footer()};
    for (const CLI::Option* option : app.get_options()) command.options.push_back(describeOption(*option));
    return command;
  }

  static OptionHelp describeOption(const CLI::Option& option) {
    OptionHelp help;
    if (!option.get_snames().empty()) help.shortName = "-" + option.get_snames().front();
    if (!option.get_lnames().empty()) help.longName = "--" + option.get_lnames().front();
    if (option.get_items_expected_max() > 0) help.value = option.get_type_name();
    if (option.get_positional()) help.value = option.get_name();
    help.description = option.get_description();
    if (!option.get_default_str().empty()) help.description += " [" + option.get_default_str() + "]";
    return help;
  }

  template <typename Options>
  CLI::App& addCommand(const char* name, const char* description, const std::string& footer, const Options& options,
                       int (*command)(const Options&)) {
    CLI::App& app = *app_.add_subcommand(name, description);
    app.footer(footer);
    app.callback([this, &options, command] { run_ = [&options, command] { return command(options); }; });
    addColor(app);
    return app;
  }

  static void addColor(CLI::App& app) {
    const std::map<std::string, Color> colors = {
        {"auto", Color::kAuto}, {"always", Color::kAlways}, {"never", Color::kNever}};
    app.add_option_function<std::string>(
           "--color", [colors](const std::string& when) { setColor(colors.at(when)); }, "Whether messages are coloured")
        ->type_name("WHEN")
        ->check(CLI::IsMember({"auto", "always", "never"}))
        ->default_str("auto");
  }

  static void addFormat(CLI::App& app, bool& isJson) {
    app.add_option_function<std::string>(
           "--format", [&isJson](const std::string& format) { isJson = format == "json"; },
           "text for people or json for programs")
        ->type_name("FORMAT")
        ->check(CLI::IsMember({"text", "json"}))
        ->default_str("text");
  }

  static void addOutputFormat(CLI::App& app, OutputOptions& options, std::span<const std::string_view> formats) {
    app.add_option("--output-format", options.format, "Format of outputs whose ending names none, as - has none")
        ->type_name("FORMAT")
        ->check(CLI::IsMember(std::vector<std::string>(formats.begin(), formats.end())));
  }

  void addPlay() {
    CLI::App& app =
        addCommand("play", "Play a script on a simulated generator", sourceHelp() + kPlayExamples, play_, play);
    app.add_option("SCRIPT", play_.script, "File with the script")->required()->type_name("FILE");
    app.add_option("--script", play_.name, "Which script, where the file holds several")->type_name("NAME");
    addWaveformOptions(app, play_.waveforms);
    addWindowOptions(app, play_.window);
    app.add_option("--limit", play_.window.limit, "Stop after so many samples or so much time")
        ->type_name("SAMPLES|TIME")
        ->default_str("10M");
    app.add_flag("--computed", play_.isComputed, "Compute what plays instead of simulating it, as for every window");
    app.add_option("-o,--output", play_.outputs.paths, "Write what was played; repeatable")
        ->type_name("FILE")
        ->allow_extra_args(false);
    addOutputFormat(app, play_.outputs, outputFormats());
    addFormat(app, play_.isJson);
    app.add_option("--title", play_.title, "Title of pictures");
    addStrictOption(app, play_.isStrict);
    addGeneratorOptions(app, play_.generator);
  }

  void addPlot() {
    CLI::App& app = addCommand("plot", "Draw what scripts play", sourceHelp() + kPlotExamples, plot_, plot);
    app.add_option("SCRIPT", plot_.script, "File with the scripts")->required()->type_name("FILE");
    app.add_option("--script", plot_.names, "Draw only this one; repeatable")
        ->type_name("NAME")
        ->allow_extra_args(false);
    addWaveformOptions(app, plot_.waveforms);
    app.add_option("-o,--output", plot_.outputs.paths, "The picture: .svg, .png, .pdf, or a page: .html; repeatable")
        ->type_name("FILE")
        ->allow_extra_args(false)
        ->required();
    addOutputFormat(app, plot_.outputs, pictureFormats());
    addWindowOptions(app, plot_.window);
    app.add_option("--width", plot_.width, "Width in points; a .png has two pixels to each")
        ->type_name("POINTS")
        ->capture_default_str();
    app.add_option("--height", plot_.height, "Height in points")
        ->type_name("POINTS")
        ->default_str("what the lanes take");
    app.add_option("--lanes", plot_.lanes, "What to show of samples, playing, markers, triggers")
        ->type_name("LANE,...")
        ->delimiter(',')
        ->allow_extra_args(false)
        ->check(CLI::IsMember({"samples", "playing", "markers", "triggers"}).description(""))
        ->default_str("all");
    app.add_option_function<std::string>(
           "--style", [this](const std::string& style) { plot_.isDark = style == "dark"; },
           "Dark on light, or light on dark")
        ->type_name("STYLE")
        ->check(CLI::IsMember({"light", "dark"}))
        ->default_str("light");
    app.add_option("--title", plot_.title, "Title of the picture");
    addStrictOption(app, plot_.isStrict);
    addGeneratorOptions(app, plot_.generator);
  }

  void addCheck() {
    CLI::App& app = addCommand("check", "Check scripts without waveforms", kCheckExamples, check_, check);
    app.add_option("SCRIPT", check_.scripts, "Files with scripts")->required()->type_name("FILE");
    addFormat(app, check_.isJson);
    addStrictOption(app, check_.isStrict);
    app.add_flag("--fix", check_.isFixing, "Put what leaves no doubt into the files");
    addGeneratorOptions(app, check_.generator);
  }

  void addDisassemble() {
    CLI::App& app = addCommand("disassemble", "Show the instruction words of scripts",
                               sourceHelp() + kDisassembleExamples, disassemble_, disassemble);
    app.add_option("SCRIPT", disassemble_.script, "File with the scripts")->required()->type_name("FILE");
    app.add_option("--script", disassemble_.name, "Show only this one")->type_name("NAME");
    addFormat(app, disassemble_.isJson);
    app.add_flag("--as-script", disassemble_.asScript, "Print a script that compiles to the same words")
        ->excludes("--format");
    addWaveformOptions(app, disassemble_.waveforms);
    addGeneratorOptions(app, disassemble_.generator);
  }

  void addFit() {
    CLI::App& app =
        addCommand("fit", "Does it fit the generator, and by how much?", sourceHelp() + kFitExamples, fit_, fit);
    app.add_option("SCRIPT", fit_.script, "File with the scripts")->required()->type_name("FILE");
    addTriggerOption(app, fit_.triggers);
    app.add_flag("--map", fit_.isMapped, "Show where each waveform lies in sample memory");
    app.add_option("-o,--output", fit_.output, "Draw the map of sample memory; an .svg file, or -")->type_name("FILE");
    app.add_option("--clear", fit_.cleared, "A waveform that the host clears after all are placed, for the map")
        ->type_name("NAME")
        ->allow_extra_args(false);
    app.add_option("--stream", fit_.streaming, "The streaming waveform: how long does its ring last?")
        ->type_name("NAME");
    addFormat(app, fit_.isJson);
    addStrictOption(app, fit_.isStrict);
    addWaveformOptions(app, fit_.waveforms);
    addGeneratorOptions(app, fit_.generator);
    app.add_option("--priming", fit_.generator.primingDepthSamples, "Priming depth asked for")
        ->type_name("SAMPLES")
        ->default_str(std::to_string(ktorba::kDefaultPrimingWords) + " memory words")
        ->group("The generator");
  }

  void addDiff() {
    CLI::App& app =
        addCommand("diff", "Do two scripts play the same, and where not?", sourceHelp() + kDiffExamples, diff_, diff);
    app.add_option("FIRST", diff_.first, "File with scripts")->required()->type_name("FILE");
    app.add_option("SECOND", diff_.second, "File with scripts")->required()->type_name("FILE");
    app.add_option("--script", diff_.name, "Compare only this one")->type_name("NAME");
    addFormat(app, diff_.isJson);
    addWaveformOptions(app, diff_.waveforms);
    addGeneratorOptions(app, diff_.generator);
  }

  void addErrors() {
    CLI::App& app = addCommand("errors", "What an error code means and what to do", kErrorsExamples, errors_, errors);
    app.add_option("CODE|NAME|WORD", errors_.wanted,
                   "Codes, decimal or hexadecimal, names, or words to search for; none for the list")
        ->type_name("");
  }

  // "ktorba help play" is "ktorba play --help".
  void addHelp() {
    CLI::App& app = *app_.add_subcommand("help", "How a command is used");
    app.add_option("COMMAND", helpOn_, "The command; none for the list")->type_name("");
    app.callback([this] {
      run_ = [this] {
        const std::string command = std::exchange(helpOn_, "");
        const char* const words[] = {"ktorba", "--help"};
        const char* const wordsOfCommand[] = {"ktorba", command.c_str(), "--help"};
        return command.empty() ? run(2, words) : run(3, wordsOfCommand);
      };
    });
  }

  CLI::App app_;
  std::function<int()> run_;
  PlayOptions play_;
  PlotOptions plot_;
  CheckOptions check_;
  DisassembleOptions disassemble_;
  FitOptions fit_;
  DiffOptions diff_;
  ErrorsOptions errors_;
  std::string helpOn_;
};

}  // namespace

std::vector<CommandHelp> describeCommands() { return CommandLine().describe(); }

int runTool(int argc, const char* const* argv) {
  platform::useUtf8Streams();
  platform::failOnWritesInVain();
  platform::endCleanlyOnInterrupts();
  try {
    const std::vector<std::string> arguments = platform::programArguments(argc, argv);
    std::vector<const char*> words;
    words.reserve(arguments.size());
    for (const std::string& argument : arguments) words.push_back(argument.c_str());
    const int code = CommandLine().run(static_cast<int>(words.size()), words.data());
    flushOutput();
    return code;
  } catch (const Refusal& error) {
    printFailure(error);
  } catch (const std::bad_alloc&) {
    printFailure("there is not enough memory", "Play less with --limit.");
  } catch (const std::exception& error) {
    printFailure(error.what(), "");
  }
  return kFailure;
}

}  // namespace tools::cli
