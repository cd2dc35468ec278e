// rbData: the stack holder through which a function reads the stored bytes
// of one host string or memory block. It locks its argument for its whole
// life and unlocks it in the destructor, so every exit path (exceptions
// included) releases the lock. It never converts text: the bytes are the
// stored bytes in whatever encoding the string has.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "plugin/host_types.h"

class rbData {
 public:
  // A null string gives an empty holder and calls no host service.
  explicit rbData(REALstring s);
  // A null block gives an empty holder. A block whose byte pointer cannot be
  // had stays locked but reads as empty; a negative size reads as 0.
  explicit rbData(REALmemoryBlock m);
  ~rbData();
  rbData(const rbData&) = delete;
  rbData& operator=(const rbData&) = delete;

  std::span<const std::uint8_t> bytes() const { return {data, static_cast<std::size_t>(length)}; }
  std::string_view view() const {
    return {reinterpret_cast<const char*>(data), static_cast<std::size_t>(length)};
  }
  bool empty() const { return length == 0; }

 private:
  REALstring string_ = nullptr;
  REALmemoryBlock object_ = nullptr;

 public:
  const std::uint8_t* data = nullptr;  // null when there are no bytes
  std::int64_t length = 0;             // 0 when data is null
};

// The byte pointer of a memory block, or null (null block: no host call).
// Finds "Operator_Convert() As Ptr" once and keeps it; falls back to the
// "memoryBlockGetPtr" service while that method cannot be found.
void* MyREALMemoryBlockGetPtr(REALmemoryBlock block);

// The size of a memory block: its "Size" property, else "memoryBlockGetSize".
std::int64_t memory_block_size(REALmemoryBlock block);
