// Samples of one width, kept as narrow as they are played: 16-bit signed, or 32-bit, which the library carries as
// unsigned words and this tool reads as the same bits in two's complement, so that 0 is level zero at either width.
// A value; one thread at a time.
#pragma once

#include <cstdint>
#include <span>
#include <variant>
#include <vector>

namespace tools {

// Samples that lie elsewhere, in their own width.
class SampleSpan {
 public:
  SampleSpan() = default;
  SampleSpan(std::span<const std::int16_t> samples) : samples_(samples) {}
  SampleSpan(std::span<const std::int32_t> samples) : samples_(samples) {}

  // Calls `use` with the span of this width; for loops that look the width up once.
  template <typename Use>
  decltype(auto) visit(Use&& use) const {
    return std::visit(use, samples_);
  }
  // The samples as that span, which must be of their width.
  template <typename Span>
  Span as() const {
    return std::get<Span>(samples_);
  }
  std::size_t size() const {
    return visit([](const auto& samples) { return samples.size(); });
  }
  std::int32_t operator[](std::size_t index) const {
    return visit([index](const auto& samples) { return std::int32_t{samples[index]}; });
  }

 private:
  std::variant<std::span<const std::int16_t>, std::span<const std::int32_t>> samples_;
};

class SampleBuffer {
 public:
  using Narrow = std::vector<std::int16_t>;
  using Wide = std::vector<std::int32_t>;

  explicit SampleBuffer(unsigned widthBits = 16) {  // 16 or 32
    if (widthBits == 32) samples_.emplace<Wide>();
  }

  // Calls `use` with the vector of this width; for loops that look the width up once.
  template <typename Use>
  decltype(auto) visit(Use&& use) const {
    return std::visit(use, samples_);
  }
  template <typename Use>
  decltype(auto) visit(Use&& use) {
    return std::visit(use, samples_);
  }

  unsigned widthBits() const { return std::holds_alternative<Wide>(samples_) ? 32 : 16; }
  std::int64_t maxValue() const { return (std::int64_t{1} << (widthBits() - 1)) - 1; }
  std::int64_t minValue() const { return -maxValue() - 1; }
  std::size_t size() const {
    return visit([](const auto& samples) { return samples.size(); });
  }
  bool empty() const { return size() == 0; }

  std::int32_t operator[](std::size_t index) const {
    return visit([index](const auto& samples) { return std::int32_t{samples[index]}; });
  }
  // `value` lies within the width.
  void push(std::int32_t value) {
    visit([value](auto& samples) {
      samples.push_back(static_cast<typename std::decay_t<decltype(samples)>::value_type>(value));
    });
  }
  void reserve(std::size_t count) {
    visit([count](auto& samples) { samples.reserve(count); });
  }

  void resize(std::size_t count) {
    visit([count](auto& samples) { samples.resize(count); });
  }
  // Where they lie, in this width.
  void* data() {
    return visit([](auto& samples) -> void* { return samples.data(); });
  }

  operator SampleSpan() const { return first(size()); }
  // The first `count` of them.
  SampleSpan first(std::size_t count) const {
    return visit([count](const auto& samples) { return SampleSpan(std::span(samples).first(count)); });
  }

  bool operator==(const SampleBuffer&) const = default;

 private:
  std::variant<Narrow, Wide> samples_;
};

}  // namespace tools
