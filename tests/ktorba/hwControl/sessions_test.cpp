// The engine's rules and what its failures leave behind, told in sessions/ call by call. Where samples land and what
// plays is tested in tests/endToEnd, the platform calls of each operation in tests/source/ktorba_lib.
#include "testing/TextSession.h"
#include "testing/golden.h"

namespace {

class Sessions : public testing::TestWithParam<std::filesystem::path> {};

TEST_P(Sessions, GoAsWritten) { expectSessions(GetParam()); }

INSTANTIATE_TEST_SUITE_P(Engine, Sessions, testing::ValuesIn(goldenFiles(KTORBA_GOLDEN_FOLDER)), goldenName);

}  // namespace
