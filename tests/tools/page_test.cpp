// The page in a real browser: what its program computes against the timeline that it was written from, and what people
// do with it by keys, pointer and fragment.
#include "tools/page/Page.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <sstream>

#include "Browser.h"
#include "testing/TimelineScene.h"
#include "testing/golden.h"
#include "tools/timeline/LevelRanges.h"

namespace tools {
namespace {

using nlohmann::json;

PageContent contentOf(const Scene& scene) {
  return {.title = "a </title> <!-- & title",
          .script = scene.file.text(),
          .sampleRateHz = scene.generator.sampleRateHz,
          .sampleWidthBits = scene.generator.sampleWidthBits,
          .timeline = *scene.timeline,
          .waveforms = scene.sources,
          .raised = scene.raised,
          .places = scene.places};
}

std::string dataOf(const Scene& scene, std::uint64_t mostSampleBytes = PageContent::kMostSampleBytes) {
  PageContent content = contentOf(scene);
  content.mostSampleBytes = mostSampleBytes;
  std::string text;
  writePageData([&](std::string_view part) { text += part; }, content);
  return text;
}

// A page on disk, removed with the object.
class PageFile {
 public:
  explicit PageFile(const PageContent& content)
      : path_(std::filesystem::temp_directory_path() / ("page" + std::to_string(getpid()) + ".html")) {
    std::ofstream file(path_, std::ios::binary);
    writePage([&](std::string_view part) { file << part; }, content);
  }
  ~PageFile() { std::filesystem::remove(path_); }
  std::string url() const { return "file://" + path_.string(); }

 private:
  std::filesystem::path path_;
};

class Page : public testing::Test {
 protected:
  void SetUp() override {
    if (!Browser::isInstalled()) GTEST_SKIP() << "needs " << Browser::kProgram << ", which is not installed";
    browser.emplace(1280, 800);
  }
  void TearDown() override {
    if (browser) {
      EXPECT_THAT(browser->problems(), testing::IsEmpty());
    }
  }
  std::optional<Browser> browser;
};

// ---- What is computed ----

std::string tell(std::uint64_t value) { return std::to_string(value) + ' '; }

// What plays at and behind a sample: runs, levels, the range of a window, and pulses of markers.
std::string answers(const Scene& scene, std::uint64_t begin, std::uint64_t end) {
  const Timeline& timeline = *scene.timeline;
  const Renderer renderer(timeline, scene.sources, scene.generator.sampleWidthBits);
  const LevelRange range = LevelRanges(timeline, scene.sources, scene.generator.sampleWidthBits).over(begin, end);
  std::string text = range.isEmpty() ? "none\n" : std::to_string(range.low) + ' ' + std::to_string(range.high) + '\n';
  RunCursor cursor(timeline, begin);
  for (int count = 0; count < 12 && !cursor.isAtEnd(); ++count, cursor.next()) {
    const Run& run = cursor.run();
    text += tell(run.firstSample) + tell(run.sampleCount) + tell(run.step) + tell(run.pass) + tell(run.round) + "\n";
  }
  SampleBuffer levels(scene.generator.sampleWidthBits);
  levels.resize(100);
  const std::uint64_t rendered = renderer.render(begin, 100, levels.data(), nullptr);
  for (std::size_t at = 0; at < rendered; at += 9) text += std::to_string(levels[at]) + ' ';
  for (std::uint32_t marker = 0; marker < 3; ++marker) {
    const std::uint64_t before = timeline.markerCount(marker, 0, begin);
    const auto pulse = before == kBeyond ? std::nullopt : timeline.markerPulse(marker, before);
    text += "\n" + tell(before) + tell(timeline.markerCount(marker, 0, end)) + (pulse ? tell(*pulse) : "none");
  }
  return text + "\n";
}

// The same by the page's program.
constexpr char kAnswers[] = R"(
  function answersOf(data, windows) {
    const timeline = new Timeline(data);
    const levels = new Levels(timeline, data);
    const answer = ([begin, end]) => {
      const range = levels.over(begin, end);
      let text = range.low > range.high ? 'none\n' : `${range.low} ${range.high}\n`;
      let run = timeline.runAt(begin);
      for (let count = 0; count < 12 && run; ++count, run = timeline.next(run)) {
        text += `${run.first} ${run.count} ${run.step} ${run.pass} ${run.round} \n`;
      }
      for (let at = begin; at < begin + 100n && at < timeline.sampleCount; at += 9n) text += `${levels.at(at).low} `;
      for (const marker of timeline.markers.slice(0, 3)) {
        const before = marker.countBefore(begin);
        const pulse = before === BEYOND ? null : marker.pulse(before);
        text += `\n${before} ${marker.countBefore(end)} ${pulse === null ? 'none' : `${pulse} `}`;
      }
      return text + '\n';
    };
    return windows.map((window) => answer(window.map(BigInt))).join('');
  })";

void expectEqualAnswers(Browser& browser, const Scene& scene, const std::vector<std::uint64_t>& begins,
                        Random& random) {
  std::string expected;
  json windows = json::array();
  for (const std::uint64_t begin : begins) {
    const std::uint64_t end = extentSum(begin, 1 + (random() >> pick(random, 1, 63)));
    expected += answers(scene, begin, end);
    windows.push_back({std::to_string(begin), std::to_string(end)});
  }
  const json given = browser.evaluate("answersOf(" + dataOf(scene) + ", " + windows.dump() + ")");
  EXPECT_EQ(given.get<std::string>(), expected) << scene.file.text();
}

TEST_F(Page, ComputesWhatTheTimelineDoes) {
  const Scene shell("script s generate a end script", {{"a", scripts::Samples(64)}}, {}, {});
  browser->open(PageFile(contentOf(shell)).url());
  browser->evaluate(kAnswers);
  forEachSeed(300, [&](Random& random) {
    const GeneratorOptions generator = randomGenerator(random);
    const scripts::Waveforms waveforms =
        scripts::randomWaveforms(random, generator.minFetchSamples, 1000, generator.sampleWidthBits);
    std::vector<RaisedTrigger> raised;
    for (std::uint32_t left = pick(random, 0, 8); left > 0; --left) {
      raised.push_back({pick(random, 0, 6'000), static_cast<std::uint8_t>(pick(random, 2, 8))});
    }
    const Scene scene(scripts::randomScript(random, waveforms, generator.minFetchSamples), waveforms, generator,
                      raised);
    const std::uint64_t last = std::min<std::uint64_t>(scene.timeline->sampleCount() - 1, kBeyond - 2000);
    expectEqualAnswers(*browser, scene,
                       {0, 1, pick(random, 0, 6'000), last, last / 2, last - std::min(last, random() % 5'000)}, random);
  });
}

// Beyond 2^53, where doubles are no more whole numbers.
constexpr char kFarScript[] = R"(script far
  repeat 2147483647
    generate million marker0(500)
    wait 101
  end repeat
  repeat 2147483647 // passes of many
    generate million subset(5, 999000) marker1(64, 6400)
    generate a
  end repeat
  repeat forever
    generate a
    generate million marker2(77777)
  end repeat
end script)";

Scene farScene(std::vector<RaisedTrigger> raised) {
  scripts::Waveforms waveforms{{"a", scripts::Samples(100, 7)}};
  for (std::uint32_t sample = 0; sample < 1'000'000; ++sample) waveforms["million"].push_back(sample * 40503u % 65521u);
  return {kFarScript, waveforms, {}, std::move(raised)};
}

TEST_F(Page, CountsBeyondDoubles) {
  const Scene scene = farScene({});
  const PageFile file(contentOf(scene));
  browser->open(file.url());
  browser->evaluate(kAnswers);
  std::vector<std::uint64_t> begins;
  for (const unsigned power : {31u, 32u, 50u, 53u, 54u, 62u, 63u}) {
    for (const std::uint64_t off : {-3, 0, 1, 500}) begins.push_back((std::uint64_t{1} << power) + off);
  }
  begins.push_back(kBeyond - 5000);
  Random random(firstSeed());
  expectEqualAnswers(*browser, scene, begins, random);
}

// Of waveforms that are too long the page knows no samples: what it says holds all that plays, waits are exact.
TEST_F(Page, EnvelopesHoldWhatPlays) {
  const Scene scene = farScene({});
  browser->open(PageFile(contentOf(scene)).url());
  EXPECT_LT(dataOf(scene, 10'000).size(), 20'000u);
  browser->evaluate("data = " + dataOf(scene, 10'000) +
                    "; timeline = new Timeline(data); levels = new Levels(timeline, data); 0");
  const LevelRanges ranges(*scene.timeline, scene.sources, 16);
  const std::uint64_t bucket = browser->evaluate("data.waveforms[0].bucket");
  for (const std::uint64_t begin : {64u, 5'000u, 999'900u, 1'000'100u, 123'456'789u}) {
    for (const std::uint64_t count : {1u, 1'000u, 700'000u}) {
      const json range =
          browser->evaluate("levels.over(" + std::to_string(begin) + "n, " + std::to_string(begin + count) + "n)");
      const LevelRange exact = ranges.over(begin, begin + count);
      const LevelRange around = ranges.over(begin - std::min(begin, bucket), begin + count + bucket);
      EXPECT_LE(range["low"], exact.low);
      EXPECT_GE(range["high"], exact.high);
      EXPECT_GE(range["low"], around.low);
      EXPECT_LE(range["high"], around.high);
    }
  }
  const std::int32_t held = scene.sources[0][999'999];
  EXPECT_EQ(browser->evaluate("levels.at(1000070n)"), (json{{"low", held}, {"high", held}}));
}

// ---- What people do ----

constexpr char kPulses[] = R"(// </script> <!-- <script>
script pulses
  wait 300
  repeat 10
    generate flash marker0(0)
    wait 400
  end repeat
  repeat until trigger1      // <b>&amp;
    generate ring
  end repeat
  repeat 2000000000
    clear trigger2
    generate flash
    wait until trigger2
  end repeat
end script)";

Scene pulses() {
  GeneratorOptions generator;
  generator.sampleRateHz = 2.5e6;
  scripts::Waveforms waveforms;
  for (std::uint32_t sample = 0; sample < 100; ++sample) waveforms["flash"].push_back(sample * 200);
  for (std::uint32_t sample = 0; sample < 80; ++sample) waveforms["ring"].push_back(0u - sample * 100);
  return {kPulses, waveforms, generator, {{2, 8}, {20'000, 2}, {30'000, 3}}};
}

struct Actions {
  Browser& browser;
  std::string url;

  void press(const std::string& key) {
    const bool isShifted = key.starts_with("Shift+");
    const std::string code = isShifted ? key.substr(6) : key;
    json event{{"type", "rawKeyDown"}, {"code", code}, {"modifiers", isShifted ? 8 : 0}};
    if (code == "Tab") event.update(json{{"windowsVirtualKeyCode", 9}, {"key", code}});
    if (code == "Enter")
      event.update(json{{"type", "keyDown"}, {"windowsVirtualKeyCode", 13}, {"key", code}, {"text", "\r"}});
    browser.call("Input.dispatchKeyEvent", event);
    event["type"] = "keyUp";
    browser.call("Input.dispatchKeyEvent", event);
  }
  // At a share of the plot, in the middle of the lane of names.
  void point(const std::string& type, double share, json more = json::object()) {
    const json at = browser.evaluate("({x: page.layout.left + page.layout.plotWidth * " + std::to_string(share) +
                                     ", y: byId('lane-names').getBoundingClientRect().y + 9})");
    more.update({{"type", type}, {"x", at["x"]}, {"y", at["y"]}});
    browser.call("Input.dispatchMouseEvent", more);
  }
  void drag(double from, double to) {
    const json button{{"button", "left"}, {"clickCount", 1}, {"buttons", 1}};
    point("mousePressed", from, button);
    if (from != to) point("mouseMoved", to, button);
    point("mouseReleased", to, button);
  }

  void perform(const std::string& line) {
    std::istringstream words(line);
    std::string verb, word;
    double first = 0, second = 0;
    words >> verb >> std::ws;
    if (verb == "open") {
      std::getline(words, word);
      browser.open("about:blank");
      browser.open(url + word);
    } else if (verb == "press") {
      while (words >> word) press(word);
    } else if (verb == "go") {
      std::getline(words, word);
      browser.evaluate("byId('place').focus(); byId('place').value = " + json(word).dump());
      press("Enter");
      browser.evaluate("document.activeElement.blur()");
    } else if (verb == "focus") {
      words >> word;
      browser.evaluate("byId(" + json(word).dump() + ").focus()");
    } else if (verb == "wheel") {
      words >> first >> second;
      point("mouseWheel", first, {{"deltaX", 0}, {"deltaY", second}});
    } else if (verb == "drag" || verb == "click") {
      words >> first;
      if (!(words >> second)) second = first;
      drag(first, second);
    } else if (verb == "hover") {
      words >> first;
      point("mouseMoved", first);
    } else {
      FAIL() << line;
    }
  }

  std::string state() {
    return browser.evaluate(R"(new Promise((done) => setTimeout(done, 450)).then(() => {
      const text = (selector) => document.querySelector(selector)?.textContent ?? '';
      const cells = (row) => [...row.cells].map((cell) => cell.textContent).join(' | ');
      const rows = [...document.querySelectorAll('#runs tbody tr')];
      const boxes = boxesOf(page.timeline, page.view, page.layout.plotWidth);
      const lines = [
        location.hash, `says: ${text('#live')}${text('#place-error')}`, `lit: ${text('.lit')}`,
        ...[...document.querySelectorAll('#readout tbody tr')].map(cells),
        `runs ${text('#runs-note')}`, ...rows.slice(0, 2).map(cells),
        'boxes', ...boxes.slice(0, 6).map((box) => `${box.first} to ${box.end}: ${textOf(box, page.timeline, page.drawing.shares)}`),
      ];
      return (lines.join('\n') + '\n').replace(/[ \t\u2009]+/g, ' ').replace(/ $/gm, '');
    }))");
  }
};

TEST_F(Page, DoesWhatKeysAndPointersAsk) {
  const Scene scene = pulses();
  const PageFile file(contentOf(scene));
  GoldenFile(KTORBA_PAGES).check([&](const std::string& input) {
    Actions actions{*browser, file.url()};
    std::istringstream lines(input);
    for (std::string line; std::getline(lines, line);) actions.perform(line);
    return actions.state();
  });
}

TEST_F(Page, IsOneFileAndNeedsNoMouse) {
  const Scene scene = pulses();
  const PageFile file(contentOf(scene));
  Actions actions{*browser, file.url()};
  browser->open(file.url());
  EXPECT_EQ(browser->evaluate("page.data.script"), kPulses);
  EXPECT_EQ(browser->evaluate("document.title"), contentOf(scene).title);
  std::set<std::string> reached;
  for (int tabs = 0; tabs < 40; ++tabs) {
    actions.press("Tab");
    reached.insert(
        browser->evaluate("{ const e = document.activeElement; e.dataset.action || e.id || (e.closest('[id]')?.id ?? "
                          "'') + ' ' + e.tagName }"));
  }
  EXPECT_THAT(reached, testing::IsSupersetOf({"place", "zoomIn", "zoomOut", "showWhole", "toggleScale", "saveSvg",
                                              "toggleTheme", "showKeys", "lane-samples", "lane-names", "lane-marker0",
                                              "lane-trigger1", "lane-trigger2", "lane-trigger7", "script",
                                              "lane-menu SUMMARY", "runs SUMMARY", "runs DIV", "readout BUTTON"}));
  for (const char* theme : {"light", "dark"}) {
    const std::string svg =
        browser->evaluate(std::string("page.setTheme('") + theme + "'); page.view.showSamples(0n, 1000n); page.svg()");
    EXPECT_EQ(browser->evaluate("new DOMParser().parseFromString(" + json(svg).dump() +
                                ", 'image/svg+xml').querySelectorAll('parsererror').length"),
              0);
    EXPECT_NE(svg.find(">flash<"), std::string::npos) << svg;
  }
  browser->call("Page.printToPDF", json::object());
  EXPECT_THAT(browser->requests(), testing::ElementsAre(file.url()));
}

}  // namespace
}  // namespace tools
