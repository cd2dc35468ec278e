// SQL helpers: one pass each, output reserved once from the input length
// (neither output is ever longer). The boolean rewriter jumps from one
// candidate byte to the next (a quote, or a "t" or "f" that starts a word:
// encodings/sql_kernels.h) and, inside quotes, to the closing quote; the
// bytes in between are copied whole. A word byte is anything but a
// separator, quotes included. Unescaping runs the level's block kernel
// (encodings/sql_unescape_vbmi2.cpp) where there is one; memchr finds the
// next backslash for the rest.
#include "encodings/sql.h"

#include <array>
#include <atomic>
#include <cstdint>
#include <cstring>

namespace zul::encodings {
namespace {

// Bytes checked one by one before a vector search starts.
constexpr std::size_t kProbe = 16;

bool is_separator(char c) { return detail::is_sql_separator(static_cast<std::uint8_t>(c)); }

// True when the bytes at p spell word (lower case) in any mixture of case.
bool spells(const char* p, std::string_view word) {
  for (std::size_t k = 0; k < word.size(); ++k) {
    if ((p[k] | 0x20) != word[k]) return false;
  }
  return true;
}

}  // namespace

out_buffer decode_mysql(std::string_view in, simd::isa level) {
  const std::size_t n = in.size();
  out_buffer out(n, n);  // never longer than the input, whatever its size
  const char* p = in.data();
  std::size_t i = 0;
  if (const auto unescape = simd::kernels_for(detail::mysql_tables(), level).unescape) {
    std::size_t written = 0;
    i = unescape(reinterpret_cast<const std::uint8_t*>(p), n, out.tail(), &written);
    out.commit(written);
  }
  while (i < n) {
    if (p[i] != '\\') {  // escapes in a row skip the search
      const void* slash = std::memchr(p + i, '\\', n - i);
      const std::size_t at =
          slash ? static_cast<std::size_t>(static_cast<const char*>(slash) - p) : n;
      out.put(p + i, at - i);
      i = at;
    }
    if (i + 1 >= n) {  // no backslash, or a final one: kept as it is
      out.put(p + i, n - i);
      break;
    }
    const std::uint16_t decoded = detail::kMySQLEscapes[static_cast<std::uint8_t>(p[i + 1])];
    if (decoded == 0xFFFF) {
      out.put(p + i, 2);
    } else {
      out.put_byte(static_cast<std::uint8_t>(decoded));
    }
    i += 2;
  }
  return out;
}

std::string replace_sql_booleans(std::string_view utf8, const detail::sql_kernels& kernels) {
  const char* p = utf8.data();
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(p);
  const std::size_t n = utf8.size();
  // The result ends before the first zero byte, and only input zeros write
  // one; the "five bytes follow" rule still counts the whole input.
  const void* zero = n == 0 ? nullptr : std::memchr(p, 0, n);
  const std::size_t end = zero ? static_cast<std::size_t>(static_cast<const char*>(zero) - p) : n;
  std::string out;
  out.reserve(end);
  std::size_t copied = 0;  // bytes before this are in out
  std::size_t i = 0;
  char quote = 0;  // the open quote, if any
  while (i < end) {
    if (quote != 0) {
      const void* close = std::memchr(p + i, quote, end - i);
      if (close == nullptr) break;
      i = static_cast<std::size_t>(static_cast<const char*>(close) - p) + 1;
      quote = 0;
      continue;
    }
    // The first byte starts a word; later ones come from the search, which
    // reads the byte before.
    std::size_t at = i;
    if (i != 0 || !(detail::is_sql_quote(bytes[0]) || detail::is_boolean_initial(bytes[0]))) {
      if (i == 0) i = 1;
      // A few bytes one by one first: in text dense with quotes and words a
      // vector search would start up for every candidate.
      const std::size_t probe = end - i < kProbe ? end - i : kProbe;
      at = i + detail::find_boolean_candidate_scalar(bytes + i, probe);
      if (at == i + probe) at += kernels.find_boolean_candidate(bytes + at, end - at);
      if (at >= end) break;
    }
    if (detail::is_sql_quote(bytes[at])) {
      quote = p[at];
      i = at + 1;
      continue;
    }
    std::size_t length = 0;
    char digit = 0;
    if (at + 5 < n) {
      if (spells(p + at, "false") && is_separator(p[at + 5])) {
        length = 5;
        digit = '0';
      } else if (spells(p + at, "true") && is_separator(p[at + 4])) {
        length = 4;
        digit = '1';
      }
    }
    if (length == 0) {
      i = at + 1;
      continue;
    }
    out.append(p + copied, at - copied);
    out += digit;
    i = copied = at + length;
  }
  out.append(p + copied, end - copied);
  return out;
}

namespace detail {

std::size_t find_boolean_candidate_scalar(const std::uint8_t* p, std::size_t n) noexcept {
  const std::uint8_t* before = p - 1;  // the byte before p is readable (see the header)
  for (std::size_t i = 0; i < n; ++i) {
    if (is_sql_quote(p[i]) || (is_boolean_initial(p[i]) && is_sql_separator(before[i]))) return i;
  }
  return n;
}

namespace {
constexpr sql_kernels kScalar{find_boolean_candidate_scalar};
#if defined(__x86_64__) || defined(_M_X64)
constexpr sql_kernels kAvx2{find_boolean_candidate_avx2};
constexpr sql_kernels kAvx512{find_boolean_candidate_avx512};
constexpr simd::family_tables<sql_kernels> kTables{&kScalar, nullptr, &kAvx2, &kAvx512, nullptr};
#elif defined(__aarch64__)
constexpr sql_kernels kNeon{find_boolean_candidate_neon};
constexpr simd::family_tables<sql_kernels> kTables{&kScalar, nullptr, nullptr, nullptr, &kNeon};
#else
constexpr simd::family_tables<sql_kernels> kTables{&kScalar};
#endif
std::atomic<const sql_kernels*> active_kernels{nullptr};
constexpr mysql_kernels kNoUnescape{nullptr};
}  // namespace

const simd::family_tables<mysql_kernels>& mysql_tables() noexcept {
#if defined(__x86_64__) || defined(_M_X64)
  static constexpr mysql_kernels kVbmi2{unescape_mysql_avx512_vbmi2};
#endif
  // Built once: whether the AVX-512 level has a kernel depends on VBMI2.
  static const simd::family_tables<mysql_kernels> tables = [] {
    simd::family_tables<mysql_kernels> t{&kNoUnescape};
#if defined(__x86_64__) || defined(_M_X64)
    if (simd::has_avx512_vbmi2()) t.avx512 = &kVbmi2;
#endif
    return t;
  }();
  return tables;
}

const simd::family_tables<sql_kernels>& sql_tables() noexcept { return kTables; }
const sql_kernels& machine_sql_kernels() noexcept { return simd::active(kTables, active_kernels); }

}  // namespace detail
}  // namespace zul::encodings
