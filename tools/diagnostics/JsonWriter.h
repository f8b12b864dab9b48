// Writes one JSON object, member by member, so that a long listing need not be kept in memory. One thread at a time.
#pragma once

#include <concepts>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace tools {

class JsonWriter {
 public:
  using Write = std::function<void(std::string_view text)>;

  // Begins with the member "schema", the version of what the documents say of these objects.
  explicit JsonWriter(Write write);
  void finish();  // with a line feed

  // Inside an object, `key` is the name of the member; inside an array it is empty.
  void add(std::string_view key, std::string_view text);
  void add(std::string_view key, const char* text) { add(key, std::string_view(text)); }
  void add(std::string_view key, double number);  // finite
  void add(std::string_view key, bool value);
  template <std::integral Number>
  void add(std::string_view key, Number number) {
    addBare(key, std::to_string(number));
  }
  template <typename Value>
  void add(std::string_view key, const std::optional<Value>& value) {
    value ? add(key, *value) : addBare(key, "null");
  }

  // `text` is JSON already.
  void addBare(std::string_view key, const std::string& text);

  // An object with the members "used" and "available".
  void addUsage(std::string_view key, std::uint64_t used, std::uint64_t available);

  // What is tall has a line for every member or element.
  enum class Shape { kFlat, kTall };
  void openObject(std::string_view key = {}, Shape shape = Shape::kFlat) { open(key, '{', shape); }
  void openArray(std::string_view key, Shape shape = Shape::kTall) { open(key, '[', shape); }
  void close();

 private:
  struct Level {
    char end;
    bool isTall;
    bool isEmpty = true;
  };

  void open(std::string_view key, char begin, Shape shape);
  void separate(std::string_view key);

  Write write_;
  std::vector<Level> levels_;
};

}  // namespace tools
