// Results handed to the host: strings built from bytes in a given text
// encoding, string arrays and memory blocks. Every value returned here is a
// new reference owned by the caller; every intermediate is released here.
#pragma once

#include <cstdint>
#include <string_view>

#include "plugin/host_types.h"

// A new host string from length bytes tagged with encoding, or null (the
// host's empty string) for null data or a length outside 1..0x7FFFFFFF.
// Encodings 0, 0x0500 and 0xFFFF become ASCII when every byte is below 0x80;
// UTF-16 and UTF-32 input comes back as a UTF-8 string. Internal failures are
// raised as host exceptions and give null.
REALstring REALBuildUnicodeString(const void* data, std::int64_t length, std::uint32_t encoding);
REALstring REALBuildUnicodeStringUTF16(const void* data, std::int64_t byte_length);

inline REALstring build_string(std::string_view bytes, std::uint32_t encoding) {
  return REALBuildUnicodeString(bytes.data(), static_cast<std::int64_t>(bytes.size()), encoding);
}

// Collects strings into a new host string array (upper bound -1 at start).
// Without the array service, strings are still made and released, and the
// result is null.
class StringArrayBuilder {
 public:
  StringArrayBuilder();
  ~StringArrayBuilder();  // releases the array unless taken
  StringArrayBuilder(const StringArrayBuilder&) = delete;
  StringArrayBuilder& operator=(const StringArrayBuilder&) = delete;

  // Appends s (ignored when null) and releases the library's reference to it.
  void append(REALstring s);
  // Builds the string from bytes in encoding and appends it.
  void append(std::string_view bytes, std::uint32_t encoding) {
    append(build_string(bytes, encoding));
  }
  REALarray take();

 private:
  REALarray array_ = nullptr;
};

// The argument record of REALNewMemoryBlockWork.
struct NewMemoryBlockParams {
  std::int64_t size;
  REALmemoryBlock block;
};

// A new memory block holding a copy of size bytes, or null. A size below 1
// gives null silently; a block that cannot be made or reached raises
// "OutOfMemoryException" and gives null.
REALmemoryBlock REALNewMemoryBlock(std::int64_t size, const void* bytes);
// Makes a block through the host class "MemoryBlock" and its constructor;
// params points at a NewMemoryBlockParams. Runs under the host's handler.
void REALNewMemoryBlockWork(void* params);
