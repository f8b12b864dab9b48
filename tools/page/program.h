// What is the same in every page: its frame, its style and its program, put into C++ by the build.
#pragma once

#include <string_view>

namespace tools {

extern const std::string_view kPageFrame;  // has @TITLE@, @STYLE@, @DATA@ and @PROGRAM@, each once and in this order
extern const std::string_view kPageStyle;
extern const std::string_view kPageProgram;

}  // namespace tools
