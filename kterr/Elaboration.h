// The elaboration of an error: the JSON object in a tStatus that names the error constant, the source place, the
// component and, in the "translator" block, the typed values of the failing request ("usage" entries).
// Nothing here throws: where the buffer cannot grow, the text is cut short and stays well-formed.
#pragma once

#include <cstdint>
#include <string>

#include "kterr/ErrorConstant.h"
#include "kterr/JsonWriter.h"
#include "kterr/usageTags.h"

namespace kterr {

// The one translator that this library writes values for.
inline constexpr char kTranslator[] = "mxlator_ktorba";

// Makes sure of a buffer and returns the cursor on the closing brace of the record's top-level object; a cursor with
// a null position when there is no buffer to be had or the text does not parse.
JsonCursor openElaboration(tStatus& status);

// Appends "file", "line" and "component" at `cursor`.
JsonCursor putPlace(JsonCursor cursor, const char* file, std::uint32_t line);

// Returns the cursor on the closing bracket of the record's "ordered_data", creating the block where it is missing;
// a cursor with a null position when the text does not parse or belongs to another translator.
JsonCursor getOrderedData(tStatus& status, const char* translator);

// As getOrderedData where no block is there yet: `end` is the end of the top-level object. Reads no text.
JsonCursor addOrderedData(JsonCursor end, const char* translator);

// Each appends one entry to ordered_data and returns the cursor behind it, so that calls chain.
// 64-bit values are written as strings, floats as engineering text; "value_type" names the C type.
JsonCursor addUsage(JsonCursor cursor, const char* tag, std::int32_t value);
JsonCursor addUsage(JsonCursor cursor, const char* tag, std::uint32_t value);
JsonCursor addUsage(JsonCursor cursor, const char* tag, std::int64_t value);
JsonCursor addUsage(JsonCursor cursor, const char* tag, std::uint64_t value);
JsonCursor addUsage(JsonCursor cursor, const char* tag, float value);
JsonCursor addUsage(JsonCursor cursor, const char* tag, const char* value);
JsonCursor addComment(JsonCursor cursor, const char* text);

// A finite `x` with an exponent that is a multiple of three, independent of the locale: 0.5 is "500.0e-3".
// One decimal when the mantissa is whole, else six.
std::string formatEngineering(double x);

}  // namespace kterr
