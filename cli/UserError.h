// What the tool itself refuses: a file, an argument, a sample. The library's own failures are kterr::Exception.
#pragma once

#include <stdexcept>
#include <string>

namespace cli {

// `what()` is a message for the user, naming the file or argument; `help` is one sentence on what to do, or empty.
class UserError : public std::runtime_error {
 public:
  explicit UserError(const std::string& message, std::string helpText = {})
      : std::runtime_error(message), help(std::move(helpText)) {}

  std::string help;
};

}  // namespace cli
