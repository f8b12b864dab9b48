// Sessions of a folder, each told call by call.
#include "testing/TextSession.h"
#include "testing/golden.h"

namespace {

class Sessions : public testing::TestWithParam<std::filesystem::path> {};

TEST_P(Sessions, GoAsWritten) { expectSessions(GetParam()); }

INSTANTIATE_TEST_SUITE_P(All, Sessions, testing::ValuesIn(goldenFiles(KTORBA_GOLDEN_FOLDER)), goldenName);

}  // namespace
