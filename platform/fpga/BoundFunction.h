// A function of a shared library, looked up by name when it is first called and for good: from then on a call costs
// one load more than a direct one. Any thread may make the first call, several at once included; they find the same
// address. The tables of the two platform libraries are built of these (KtFpgaLibrary.h, KtifwuLibrary.h).
#pragma once

#include <atomic>

namespace platform {

// The address of `function` in the library `libraryStem` (see DynamicLibrary.h). A library or function that is
// missing raises nKTAPALS100_tStatus_kSoftwareFault with the message pair function name: the loader's own words. For a
// library there is one more, the name of its file: where it was looked for.
void* bindFunction(const char* libraryStem, const char* function);

template <typename Signature>
class BoundFunction;

template <typename Result, typename... Parameters>
class BoundFunction<Result(Parameters...)> {
 public:
  constexpr BoundFunction(const char* libraryStem, const char* name) : libraryStem_(libraryStem), name_(name) {}

  // Calls the function. Raises as bindFunction does, at every call until the function can be found.
  Result operator()(Parameters... arguments) {
    Function* function = address_.load(std::memory_order_acquire);
    if (function == nullptr) function = bind();
    return function(arguments...);
  }

 private:
  using Function = Result(Parameters...);

  Function* bind() {
    auto* const function = reinterpret_cast<Function*>(bindFunction(libraryStem_, name_));
    address_.store(function, std::memory_order_release);
    return function;
  }

  std::atomic<Function*> address_{nullptr};
  const char* libraryStem_;
  const char* name_;
};

}  // namespace platform
