// Byte classes over raw stored bytes (a multi-byte character counts as
// several bytes): 7-bit 00..7F, printable 7-bit 20..7F (7F included), and
// non-control 20..FF. Tests that every byte belongs to a class, and a filter
// that keeps printable 7-bit bytes and replaces every other byte.
#pragma once

#include <cstdint>
#include <optional>
#include <span>

#include "common/out_buffer.h"

namespace zul::text {

enum class byte_class { seven_bit, printable, non_control };

// The class a mode number selects: 0 seven_bit, 1 printable, 2 non_control;
// nothing for any other number.
std::optional<byte_class> byte_class_for_mode(std::int64_t mode) noexcept;

// True when bytes holds at least one byte and every byte is in the class;
// false for empty input. Checks eight bytes per step.
bool all_bytes_in(std::span<const std::uint8_t> bytes, byte_class cls) noexcept;

// A copy of bytes of the same length with every byte outside 20..7F
// replaced by replacement. Throws std::bad_alloc.
out_buffer replace_non_printable(std::span<const std::uint8_t> bytes, std::uint8_t replacement);

}  // namespace zul::text
