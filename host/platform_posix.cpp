// POSIX side of the platform layer: dlopen of a private temporary copy that
// is unlinked at once (the mapping keeps it alive), and iconv with
// descriptors cached per thread and per pair of encodings (a descriptor
// carries shift state, so it is never shared between threads).
#include <dlfcn.h>
#include <iconv.h>
#include <unistd.h>

#include <bit>
#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <map>
#include <stdexcept>
#include <utility>

#include "host/platform.h"
#include "plugin/host_types.h"

namespace zul_host::platform {
namespace {

using namespace text_encoding;

// Copies path to a new temporary file and returns the copy's name.
std::string private_copy(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  if (!in) throw std::runtime_error("cannot read plug-in " + path);
  const std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  const char* dir = std::getenv("TMPDIR");
  std::string name = std::string(dir && *dir ? dir : "/tmp") + "/zul_plugin_XXXXXX";
  const int fd = mkstemp(name.data());
  if (fd < 0) throw std::runtime_error("cannot make a temporary copy of " + path);
  const char* at = bytes.data();
  std::size_t left = bytes.size();
  while (left > 0) {
    const ssize_t n = write(fd, at, left);
    if (n <= 0) {
      close(fd);
      unlink(name.c_str());
      throw std::runtime_error("cannot write the temporary copy of " + path);
    }
    at += n;
    left -= static_cast<std::size_t>(n);
  }
  close(fd);
  return name;
}

constexpr bool kLittle = std::endian::native == std::endian::little;

const char* iconv_name(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
      return "MACINTOSH";
    case kUTF16:
      return kLittle ? "UTF-16LE" : "UTF-16BE";
    case kLatin1:
    case kUnknown:
      return "ISO-8859-1";
    case kWindowsLatin1:
      return "CP1252";
    case kASCII:
      return "ASCII";
    case kUTF8:
      return "UTF-8";
    case kUTF32:
      return kLittle ? "UTF-32LE" : "UTF-32BE";
    default:
      return nullptr;
  }
}

// Descriptors of this thread, closed when the thread ends.
class Descriptors {
 public:
  ~Descriptors() {
    for (auto& [key, cd] : open_) {
      if (cd != reinterpret_cast<iconv_t>(-1)) iconv_close(cd);
    }
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

void* load_library(const std::string& path) {
  const std::string copy = private_copy(path);
  void* library = dlopen(copy.c_str(), RTLD_NOW | RTLD_LOCAL);
  unlink(copy.c_str());
  if (!library) {
    const char* why = dlerror();
    throw std::runtime_error("cannot load " + path + ": " + (why ? why : "unknown error"));
  }
  return library;
}

void* find_symbol(void* library, const char* name) { return dlsym(library, name); }

void unload_library(void* library) { dlclose(library); }

std::optional<std::string> convert(std::string_view bytes, std::uint32_t from, std::uint32_t to) {
  thread_local Descriptors descriptors;
  iconv_t cd = descriptors.get(from, to);
  if (cd == reinterpret_cast<iconv_t>(-1)) return std::nullopt;
  iconv(cd, nullptr, nullptr, nullptr, nullptr);  // reset shift state

  // Room for the longest result the pair can give per input unit (a UTF-32
  // unit may need 4 bytes in any form, a UTF-16 unit 3 in UTF-8, a byte 3),
  // so that one call converts all. Sizing for UTF-32 in every case would
  // zero-fill four times the input for each UTF-8 result.
  const std::size_t unit_in = from == kUTF32 ? 4 : from == kUTF16 ? 2 : 1;
  const std::size_t most_out = to == kUTF32 || from == kUTF32 ? 4
                               : to == kUTF8                  ? 3
                               : to == kUTF16                 ? 2
                                                              : 1;
  std::string out(bytes.size() / unit_in * most_out + 16, '\0');
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

}  // namespace zul_host::platform
