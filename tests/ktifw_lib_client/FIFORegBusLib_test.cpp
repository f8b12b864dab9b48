#include "ktifw_lib_client/FIFORegBusLib.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <new>

#include "testing/FrameworkDouble.h"
#include "testing/heap.h"

namespace {

using ktifw::ReadInstruction;
using ktifw::WriteInstruction;
using testing::ElementsAre;

class FIFORegBusLib : public testing::Test {
 protected:
  FIFORegBusLib() {
    framework = {};
    framework.isRecording = true;
  }

  void useAll() {
    constexpr ReadInstruction kReads[] = {{1, 10}, {2, 0x1'0000'0000}};
    constexpr WriteInstruction kWrites[11] = {{1, 10, 5}, {2, 20, 6}};
    bus.read({1, 10}, value, 1000, status);
    bus.readArray(kReads, 2, values, 1000, status);
    bus.write({1, 10, 99}, true, 1000, status);
    bus.writeArray(kWrites, framework.isRecording ? 2 : 11, false, 1000, status);
    bus.reset(status);
  }

  FrameworkDouble& framework = frameworkDouble();
  ktifw_lib_client::FIFORegBusLib bus{4};
  ktifw::Status status = kterr::makeLocatedStatus();
  std::uint64_t value = 0;
  std::uint64_t values[2] = {};
};

TEST_F(FIFORegBusLib, CarriesAccessesToItsTargetInOrder) {
  std::vector<std::int32_t> codes;
  framework.registers[10] = 7;
  framework.registers[0] = 9;
  framework.report = [&](tStatus& given) { codes.push_back(given.code); };
  status.code = 5;
  useAll();
  EXPECT_THAT(framework.take(),
              ElementsAre("Read 4 1 10 1000", "ReadArray 4 2 1000", "- 1 10", "- 2 4294967296",
                          "Write 4 1 10 99 1 1000", "WriteArray 4 2 0 1000", "- 1 10 5", "- 2 20 6", "Reset 4"));
  EXPECT_EQ(value, 7u);
  EXPECT_THAT(values, ElementsAre(7, 9));
  EXPECT_THAT(codes, testing::Each(0)) << "each call gets a fresh record";
  status.code = -7;
  useAll();
  EXPECT_THAT(framework.take(), ElementsAre());
}

TEST_F(FIFORegBusLib, TakesNoMemoryForListsOfSettings) {
  framework.isRecording = false;
  heap::isRefusing = true;
  useAll();
  EXPECT_EQ(status.code, 0);
  const WriteInstruction kMany[100] = {};
  bus.writeArray(kMany, 100, true, 1000, status);
  heap::isRefusing = false;
  EXPECT_EQ(status.code, -52000);
}

TEST_F(FIFORegBusLib, LeavesWhatThePlatformThrowsToTheCaller) {
  framework.report = [](tStatus&) { throw std::bad_alloc(); };
  EXPECT_THROW(bus.read({1, 10}, value, 1000, status), std::bad_alloc);
  EXPECT_EQ(status.code, 0);
}

TEST_F(FIFORegBusLib, ReadsNoElaborationBeyondItsBuffer) {
  framework.report = [](tStatus& given) {
    given.code = -9;
    kterr::setJson(given, R"({"component":"c","file":"f","line":3,")");
    std::memset(given.json + std::strlen(given.json), 'x', given.capacity - std::strlen(given.json));
  };
  bus.reset(status);
  EXPECT_EQ(status.code, -9);
  EXPECT_STREQ(status.file, "f");
}

TEST_F(FIFORegBusLib, TakesThePlaceOfAFailureFromItsElaboration) {
  const std::string longPath(1'000'000, 'p');
  const struct {
    std::string json, component, file;
    std::uint32_t line;
  } kCases[] = {
      {R"({"component":"framework_x","file":"a\\b\u00fc","line":221})", "amework_x", "a\\b\xC3\xBC", 221},
      {R"({"component":7,"file":["a"],"line":"12"})", "", "", 0},
      {"{\"component\":\"a\xFFz\",\"file\":\"\\uD800-\\uDC00-\xE2\x82\"}", "a\xEF\xBF\xBDz",
       "\xEF\xBF\xBD-\xEF\xBF\xBD-\xEF\xBF\xBD", 0},
      {R"({"file":"open)", "", "", 0},
      {R"({"line":1e3})", "", "", 0},
      {R"({"line":4294967296})", "", "", 0},
      {R"({"line":)", "", "", 0},
      {R"({"file":")" + longPath + R"(END","line":4294967295})", "", std::string(97, 'p') + "END", 4294967295},
      {R"({"file":"\u00fc)" + longPath.substr(0, 99) + R"("})", "", longPath.substr(0, 99), 0},
  };
  for (const auto& [json, component, file, line] : kCases) {
    SCOPED_TRACE(json.substr(0, 80));
    framework.report = [&json = json](tStatus& given) {
      kterr::setCode(given, -9), kterr::setJson(given, json.c_str());
    };
    status = kterr::makeLocatedStatus();
    bus.reset(status);
    EXPECT_EQ(status.code, -9);
    EXPECT_EQ(status.component, component);
    EXPECT_EQ(status.file, file);
    EXPECT_EQ(status.line, line);
  }
  framework.report = [](tStatus& given) { given.code = -9; };
  status = kterr::makeLocatedStatus();
  bus.reset(status);
  EXPECT_EQ(status.code, -9) << "without an elaboration";
}

}  // namespace
