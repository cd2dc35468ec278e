// The tables of the lookup-table method of UTF-8 validation, shared by the
// x86-64 (common/utf8_valid_x86.cpp) and arm64 (utf8_valid_neon.cpp)
// kernels. Each byte is judged with the byte before it through three
// 16-entry look-ups (high nibble of the previous byte, its low nibble, high
// nibble of this byte); each entry is a set of error classes, and a byte
// pair is faulty when some class is in all three. A separate test requires
// a continuation byte two bytes after a lead of E0..FF and three bytes after
// F0..FF; it is XORed with the "two continuations in a row" class so that
// exactly the expected continuations pass.
#pragma once

#include <cstdint>

namespace zul::simd::detail::utf8_classes {

// Error classes: the bits of the table entries.
inline constexpr std::uint8_t kTooShort = 1 << 0;      // lead, then no continuation
inline constexpr std::uint8_t kTooLong = 1 << 1;       // ASCII, then a continuation
inline constexpr std::uint8_t kOverlong3 = 1 << 2;     // E0 80..9F
inline constexpr std::uint8_t kTooLarge = 1 << 3;      // F4 90..BF, F5..FF 90..BF
inline constexpr std::uint8_t kSurrogate = 1 << 4;     // ED A0..BF
inline constexpr std::uint8_t kOverlong2 = 1 << 5;     // C0, C1
inline constexpr std::uint8_t kTooLarge1000 = 1 << 6;  // F5..FF 80..8F
inline constexpr std::uint8_t kOverlong4 = 1 << 6;     // F0 80..8F
inline constexpr std::uint8_t kTwoConts = 1 << 7;      // continuation, continuation
inline constexpr std::uint8_t kCarry = kTooShort | kTooLong | kTwoConts;

// Indexed by the high nibble of the previous byte.
inline constexpr std::uint8_t kByte1High[16] = {kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTooLong,
                                                kTwoConts,
                                                kTwoConts,
                                                kTwoConts,
                                                kTwoConts,
                                                kTooShort | kOverlong2,
                                                kTooShort,
                                                kTooShort | kOverlong3 | kSurrogate,
                                                kTooShort | kTooLarge | kTooLarge1000 | kOverlong4};
// Indexed by the low nibble of the previous byte.
inline constexpr std::uint8_t kByte1Low[16] = {kCarry | kOverlong3 | kOverlong2 | kOverlong4,
                                               kCarry | kOverlong2,
                                               kCarry,
                                               kCarry,
                                               kCarry | kTooLarge,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000 | kSurrogate,
                                               kCarry | kTooLarge | kTooLarge1000,
                                               kCarry | kTooLarge | kTooLarge1000};
// Indexed by the high nibble of this byte.
inline constexpr std::uint8_t kByte2High[16] = {
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooLong | kOverlong2 | kTwoConts | kOverlong3 | kTooLarge1000 | kOverlong4,
    kTooLong | kOverlong2 | kTwoConts | kOverlong3 | kTooLarge,
    kTooLong | kOverlong2 | kTwoConts | kSurrogate | kTooLarge,
    kTooLong | kOverlong2 | kTwoConts | kSurrogate | kTooLarge,
    kTooShort,
    kTooShort,
    kTooShort,
    kTooShort};

}  // namespace zul::simd::detail::utf8_classes
