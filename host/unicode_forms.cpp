#include "host/unicode_forms.h"

#include <cstring>

#include "plugin/host_types.h"

namespace zul_host {
namespace {

using namespace text_encoding;

template <class Unit>
Unit load(const unsigned char* p) {
  Unit u;
  std::memcpy(&u, p, sizeof u);
  return u;
}

template <class Unit>
char* store(char* o, Unit u) {
  std::memcpy(o, &u, sizeof u);
  return o + sizeof u;
}

// Calls emit(code point) for each character of bytes in `from`; false at
// the first ill-formed sequence.
template <class Emit>
bool decode(std::string_view bytes, std::uint32_t from, Emit emit) {
  const auto* p = reinterpret_cast<const unsigned char*>(bytes.data());
  const std::size_t n = bytes.size();
  if (from == kUTF8) {
    for (std::size_t i = 0; i < n;) {
      // Eight ASCII bytes at a time: the usual text.
      if (n - i >= 8 && (load<std::uint64_t>(p + i) & 0x8080808080808080ull) == 0) {
        for (std::size_t k = 0; k < 8; ++k) emit(p[i + k]);
        i += 8;
        continue;
      }
      const std::uint32_t c = p[i];
      if (c < 0x80) {
        emit(c);
        ++i;
        continue;
      }
      std::size_t length;
      std::uint32_t cp, least;
      if (c >= 0xC2 && c <= 0xDF) {
        length = 2, cp = c & 0x1F, least = 0x80;
      } else if (c >= 0xE0 && c <= 0xEF) {
        length = 3, cp = c & 0x0F, least = 0x800;
      } else if (c >= 0xF0 && c <= 0xF4) {
        length = 4, cp = c & 0x07, least = 0x10000;
      } else {
        return false;
      }
      if (n - i < length) return false;
      for (std::size_t k = 1; k < length; ++k) {
        if ((p[i + k] & 0xC0) != 0x80) return false;
        cp = cp << 6 | (p[i + k] & 0x3F);
      }
      if (cp < least || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return false;
      emit(cp);
      i += length;
    }
    return true;
  }
  if (from == kUTF16) {
    if (n % 2 != 0) return false;
    for (std::size_t i = 0; i < n; i += 2) {
      const std::uint32_t u = load<std::uint16_t>(p + i);
      if (u < 0xD800 || u > 0xDFFF) {
        emit(u);
        continue;
      }
      if (u > 0xDBFF || n - i < 4) return false;
      const std::uint32_t low = load<std::uint16_t>(p + i + 2);
      if (low < 0xDC00 || low > 0xDFFF) return false;
      emit(0x10000 + ((u - 0xD800) << 10) + (low - 0xDC00));
      i += 2;
    }
    return true;
  }
  if (n % 4 != 0) return false;
  for (std::size_t i = 0; i < n; i += 4) {
    // Four ASCII units at a time (none has a bit above the low seven).
    if (n - i >= 16 && ((load<std::uint64_t>(p + i) | load<std::uint64_t>(p + i + 8)) &
                        0xFFFFFF80FFFFFF80ull) == 0) {
      for (std::size_t k = 0; k < 16; k += 4) emit(p[i + k]);
      i += 12;
      continue;
    }
    const std::uint32_t cp = load<std::uint32_t>(p + i);
    if (cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return false;
    emit(cp);
  }
  return true;
}

}  // namespace

bool is_unicode_form(std::uint32_t encoding) {
  return encoding == kUTF8 || encoding == kUTF16 || encoding == kUTF32;
}

std::optional<std::string> convert_unicode(std::string_view bytes, std::uint32_t from,
                                           std::uint32_t to) {
  // The longest result: a UTF-32 unit may take 4 bytes in any form, a UTF-16
  // unit 3 in UTF-8 (a pair of them 4), a UTF-8 byte 4 in UTF-32 and 2 in
  // UTF-16.
  const std::size_t unit = from == kUTF32 ? 4 : from == kUTF16 ? 2 : 1;
  const std::size_t most = from == kUTF32 || to == kUTF32 ? 4 : to == kUTF8 ? 3 : 2;
  std::string out(bytes.size() / unit * most, '\0');
  char* o = out.data();
  bool ok;
  if (to == kUTF8) {
    ok = decode(bytes, from, [&](std::uint32_t cp) {
      if (cp < 0x80) {
        *o++ = static_cast<char>(cp);
      } else if (cp < 0x800) {
        *o++ = static_cast<char>(0xC0 | cp >> 6);
        *o++ = static_cast<char>(0x80 | (cp & 0x3F));
      } else if (cp < 0x10000) {
        *o++ = static_cast<char>(0xE0 | cp >> 12);
        *o++ = static_cast<char>(0x80 | (cp >> 6 & 0x3F));
        *o++ = static_cast<char>(0x80 | (cp & 0x3F));
      } else {
        *o++ = static_cast<char>(0xF0 | cp >> 18);
        *o++ = static_cast<char>(0x80 | (cp >> 12 & 0x3F));
        *o++ = static_cast<char>(0x80 | (cp >> 6 & 0x3F));
        *o++ = static_cast<char>(0x80 | (cp & 0x3F));
      }
    });
  } else if (to == kUTF16) {
    ok = decode(bytes, from, [&](std::uint32_t cp) {
      if (cp < 0x10000) {
        o = store(o, static_cast<std::uint16_t>(cp));
      } else {
        o = store(o, static_cast<std::uint16_t>(0xD800 + ((cp - 0x10000) >> 10)));
        o = store(o, static_cast<std::uint16_t>(0xDC00 + ((cp - 0x10000) & 0x3FF)));
      }
    });
  } else {
    ok = decode(bytes, from, [&](std::uint32_t cp) { o = store(o, cp); });
  }
  if (!ok) return std::nullopt;
  out.resize(static_cast<std::size_t>(o - out.data()));
  return out;
}

}  // namespace zul_host
