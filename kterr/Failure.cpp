#include "kterr/Failure.h"

namespace kterr {

ElaborationWriter::ElaborationWriter(tStatus& status, const char* constantText) : cursor_(openElaboration(status)) {
  if (constantText != nullptr) cursor_ = put(cursor_, "error_constant", constantText);
}

void ElaborationWriter::place(const char* file, std::uint32_t line) {
  leaveTranslator();
  cursor_ = putPlace(cursor_, file, line);
}

void ElaborationWriter::message(const char* key, const char* text) {
  leaveTranslator();
  cursor_ = put(cursor_, key, text);
}

void ElaborationWriter::leaveTranslator() {
  if (!inTranslator_) return;
  inTranslator_ = false;
  if (cursor_.position != nullptr) cursor_ = openElaboration(*cursor_.status);
}

void ElaborationWriter::translator() {
  if (inTranslator_) return;
  inTranslator_ = true;
  if (cursor_.position == nullptr) return;
  cursor_ = hasBlock_ ? getOrderedData(*cursor_.status, kTranslator) : addOrderedData(cursor_, kTranslator);
  hasBlock_ = true;
}

void ElaborationWriter::comment(const char* text) {
  translator();
  cursor_ = addComment(cursor_, text);
}

namespace {

tStatus& withCode(tStatus& status, std::int32_t code) {
  setCode(status, code);
  return status;
}

}  // namespace

Failure::Failure(const ErrorConstant& constant)
    : writer_(withCode(exception_.status(), constant.code), constant.text) {}

Failure& Failure::at(const char* source, std::uint32_t line) {
  writer_.place(source, line);
  return *this;
}

Failure& Failure::message(const char* key, const char* text) {
  writer_.message(key, text);
  return *this;
}

Failure& Failure::usage(const char* tag, const std::string& value) { return usage(tag, value.c_str()); }

Failure& Failure::usage(const char* tag, const char* value) {
  writer_.usage(tag, value);
  return *this;
}

}  // namespace kterr
