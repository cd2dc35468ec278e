// Conversions go through iconv descriptors cached per thread and per pair of
// encodings (a descriptor carries shift state, so it is never shared between
// threads). Text that is all ASCII between two ASCII-compatible encodings is
// copied without iconv: the common case in tests and benchmarks.
#include "host/text_convert.h"

#include <iconv.h>

#include <bit>
#include <cerrno>
#include <cstdio>
#include <map>
#include <utility>

#include "plugin/host_types.h"

namespace zul_host {
namespace {

using namespace text_encoding;

constexpr bool kLittle = std::endian::native == std::endian::little;

const char* iconv_name(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
      return "MACINTOSH";
    case kUTF16:
      return kLittle ? "UTF-16LE" : "UTF-16BE";
    case kLatin1:
      return "ISO-8859-1";
    case kWindowsLatin1:
      return "CP1252";
    case kASCII:
      return "ASCII";
    case kUTF8:
      return "UTF-8";
    case kUTF32:
      return kLittle ? "UTF-32LE" : "UTF-32BE";
    case kUnknown:
      return "ISO-8859-1";
    default:
      return nullptr;
  }
}

bool ascii_compatible(std::uint32_t encoding) { return encoding != kUTF16 && encoding != kUTF32; }

bool all_ascii(std::string_view bytes) {
  for (unsigned char c : bytes) {
    if (c >= 0x80) return false;
  }
  return true;
}

// Descriptors of this thread, closed when the thread ends.
class Descriptors {
 public:
  ~Descriptors() {
    for (auto& [key, cd] : open_) iconv_close(cd);
  }
  iconv_t get(std::uint32_t from, std::uint32_t to) {
    auto [it, fresh] = open_.try_emplace({from, to}, reinterpret_cast<iconv_t>(-1));
    if (fresh) it->second = iconv_open(iconv_name(to), iconv_name(from));
    return it->second;
  }

 private:
  std::map<std::pair<std::uint32_t, std::uint32_t>, iconv_t> open_;
};

}  // namespace

bool known_encoding(std::uint32_t encoding) { return iconv_name(encoding) != nullptr; }

std::optional<std::string> convert_text(std::string_view bytes, std::uint32_t from,
                                        std::uint32_t to) {
  if (!known_encoding(from) || !known_encoding(to)) return std::nullopt;
  if (from == to) return std::string(bytes);
  if (ascii_compatible(from) && ascii_compatible(to) && all_ascii(bytes)) return std::string(bytes);

  thread_local Descriptors descriptors;
  iconv_t cd = descriptors.get(from, to);
  if (cd == reinterpret_cast<iconv_t>(-1)) return std::nullopt;
  iconv(cd, nullptr, nullptr, nullptr, nullptr);  // reset shift state

  // UTF-32 output is at most 4 bytes per input byte; every other pair fits too.
  std::string out(bytes.size() * 4 + 16, '\0');
  char* in = const_cast<char*>(bytes.data());
  std::size_t in_left = bytes.size();
  char* at = out.data();
  std::size_t out_left = out.size();
  while (in_left > 0) {
    if (iconv(cd, &in, &in_left, &at, &out_left) == static_cast<std::size_t>(-1)) {
      if (errno != E2BIG) return std::nullopt;  // EILSEQ or EINVAL: not convertible
      const std::size_t used = out.size() - out_left;
      out.resize(out.size() * 2);
      at = out.data() + used;
      out_left = out.size() - used;
    }
  }
  if (iconv(cd, nullptr, nullptr, &at, &out_left) == static_cast<std::size_t>(-1))
    return std::nullopt;
  out.resize(out.size() - out_left);
  return out;
}

std::string encoding_label(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
      return "Mac OS Roman";
    case kUTF16:
      return "UTF-16";
    case kLatin1:
      return "ISO Latin 1";
    case kWindowsLatin1:
      return "Windows Latin 1";
    case kASCII:
      return "ASCII";
    case kUTF8:
      return "UTF-8";
    case kUTF32:
      return "UTF-32";
    case kUnknown:
      return "unknown (0xFFFF)";
    default: {
      char text[32];
      std::snprintf(text, sizeof text, "encoding 0x%X", static_cast<unsigned>(encoding));
      return text;
    }
  }
}

}  // namespace zul_host
