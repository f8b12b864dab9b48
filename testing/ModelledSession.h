// A session on a small simulated generator that is operated at random and compared with a plain model after every
// operation: which calls succeed, how much memory is free, which waveforms there are, and every byte of sample memory.
// What the soak does for hours and the fuzzer with inputs of its choice. One thread at a time.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>

namespace soak {

// Returns one of the numbers 0 to count - 1. Where the numbers come from is the user's to say.
using Choose = std::function<std::uint32_t(std::uint32_t count)>;

class ModelledSession {
 public:
  explicit ModelledSession(Choose choose);
  ~ModelledSession();
  ModelledSession(const ModelledSession&) = delete;
  ModelledSession& operator=(const ModelledSession&) = delete;

  // Makes one call with chosen arguments, good or bad. Throws std::logic_error where library and model differ.
  void operate();

 private:
  class Modelled;
  std::unique_ptr<Modelled> modelled_;
};

}  // namespace soak
