#include <zip.h>

#include "tools/sources/ByteStream.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

class ZippedStream : public ByteStream {
 public:
  ZippedStream(const std::string& source, zip_t* archive, std::size_t index)
      : source_(source), file_(zip_fopen_index(archive, index, 0), &zip_fclose) {
    if (!file_) throw Refusal(source + ": " + zip_strerror(archive));
    zip_stat_t stat;
    const bool isSizeKnown = zip_stat_index(archive, index, 0, &stat) == 0 && (stat.valid & ZIP_STAT_SIZE) != 0;
    if (!isSizeKnown) throw Refusal(source + ": is a zip archive that does not say how long its files are");
    size_ = stat.size;
  }

  std::size_t read(char* bytes, std::size_t count) override {
    std::size_t done = 0;
    while (done < count) {
      const zip_int64_t got = zip_fread(file_.get(), bytes + done, count - done);
      if (got < 0) throw Refusal(source_ + ": " + zip_file_strerror(file_.get()));
      if (got == 0) break;
      done += static_cast<std::size_t>(got);
    }
    return done;
  }

  std::uint64_t size() const override { return size_; }

 private:
  const std::string& source_;
  std::unique_ptr<zip_file_t, int (*)(zip_file_t*)> file_;
  std::uint64_t size_ = 0;
};

}  // namespace

Archive::Archive(const std::string& source, const std::string& path) : source_(source) {
  int code = 0;
  zip_.reset(zip_open(path.c_str(), ZIP_RDONLY, &code), [](zip_t* zip) {
    if (zip != nullptr) zip_discard(zip);
  });
  if (zip_) return;
  zip_error_t error;
  zip_error_init_with_code(&error, code);
  const std::string reason = zip_error_strerror(&error);
  zip_error_fini(&error);
  throw Refusal(source + ": " + reason);
}

std::vector<std::string> Archive::names() const {
  std::vector<std::string> names;
  const zip_int64_t count = zip_get_num_entries(zip_.get(), 0);
  for (zip_int64_t i = 0; i < count; ++i) {
    const char* name = zip_get_name(zip_.get(), static_cast<zip_uint64_t>(i), 0);
    names.emplace_back(name == nullptr ? "" : name);
  }
  return names;
}

std::unique_ptr<ByteStream> Archive::open(std::size_t index) const {
  return std::make_unique<ZippedStream>(source_, zip_.get(), index);
}

}  // namespace tools
