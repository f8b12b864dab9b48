// The header of an array file (.npy, versions 1 to 3): what its elements are, and how they lie.
#pragma once

#include <string>
#include <vector>

#include "tools/sources/ByteStream.h"

namespace tools {

struct NpyHeader {
  char kind = 'i';     // of an element: 'i', 'u' or 'f'
  unsigned bytes = 2;  // of an element
  bool isBigEndian = false;
  bool isFortranOrder = false;  // the first index runs fastest
  std::vector<std::uint64_t> shape;
  std::uint64_t headerBytes = 0;  // in front of the elements

  std::string typeName() const;   // "uint16"
  std::string shapeText() const;  // "3 x 1000"
};

// Reads it from the front of `stream`, which then stands at the first element. Throws Refusal for what is no such file,
// for elements that are no numbers of 16 to 64 bits that the tool takes, and where the file is not as long as it says.
NpyHeader readNpyHeader(const std::string& source, ByteStream& stream);

}  // namespace tools
