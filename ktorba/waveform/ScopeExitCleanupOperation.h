// Undoes a step when a later step of the same operation fails: runs a call at the end of its scope unless it was
// dismissed before. One thread at a time.
#pragma once

#include <exception>
#include <utility>

namespace ktorba {

class ScopeExitCleanupOperationInterface {
 public:
  virtual ~ScopeExitCleanupOperationInterface() = default;
  // The call will not run.
  virtual void dismiss() = 0;
};

template <typename Call>
class ScopeExitCleanupOperation : public ScopeExitCleanupOperationInterface {
 public:
  explicit ScopeExitCleanupOperation(Call call) : call_(std::move(call)) {}
  ScopeExitCleanupOperation(const ScopeExitCleanupOperation&) = delete;
  ScopeExitCleanupOperation& operator=(const ScopeExitCleanupOperation&) = delete;

  // Drops what the call throws: another failure is usually on its way to the caller.
  ~ScopeExitCleanupOperation() override {
    if (std::exchange(dismissed_, true)) return;
    try {
      call_();
    } catch (const std::exception&) {
    }
  }

  void dismiss() override { dismissed_ = true; }

 private:
  bool dismissed_ = false;
  Call call_;
};

}  // namespace ktorba
