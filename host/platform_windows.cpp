// Windows side of the platform layer: LoadLibraryW of a private copy in the
// temporary folder (a loaded DLL cannot be deleted, so the copy goes when
// the library is unloaded), and text conversion through UTF-16 with the
// Win32 code pages. UTF-16 is Windows' own form and UTF-32 has no code page
// MultiByteToWideChar takes, so both are converted by hand; ASCII and
// Windows-1252 get the strict checks iconv makes (no byte above 0x7F, none
// of the five bytes Windows-1252 leaves undefined), so every platform gives
// the same answers.
#include <windows.h>

#include <fstream>
#include <iterator>
#include <stdexcept>
#include <vector>

#include "host/platform.h"
#include "plugin/host_types.h"

namespace zul_host::platform {
namespace {

using namespace text_encoding;

struct Loaded {
  HMODULE module;
  std::wstring copy;
};

std::wstring widen(const std::string& utf8) {
  const int n =
      MultiByteToWideChar(CP_UTF8, 0, utf8.data(), static_cast<int>(utf8.size()), nullptr, 0);
  std::wstring wide(static_cast<std::size_t>(n), L'\0');
  MultiByteToWideChar(CP_UTF8, 0, utf8.data(), static_cast<int>(utf8.size()), wide.data(), n);
  return wide;
}

std::string system_message(DWORD code) {
  char text[512];
  const DWORD n = FormatMessageA(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS,
                                 nullptr, code, 0, text, sizeof text, nullptr);
  std::string why(text, n);
  while (!why.empty() && (why.back() == '\n' || why.back() == '\r')) why.pop_back();
  return why.empty() ? "error " + std::to_string(code) : why;
}

// Copies path to a new temporary file and returns the copy's name.
std::wstring private_copy(const std::string& path) {
  std::ifstream in(widen(path).c_str(), std::ios::binary);
  if (!in) throw std::runtime_error("cannot read plug-in " + path);
  const std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  wchar_t dir[MAX_PATH + 1];
  wchar_t name[MAX_PATH + 1];
  if (GetTempPathW(MAX_PATH + 1, dir) == 0 || GetTempFileNameW(dir, L"zul", 0, name) == 0)
    throw std::runtime_error("cannot make a temporary copy of " + path);
  std::ofstream out(name, std::ios::binary | std::ios::trunc);
  out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
  out.close();
  if (!out) {
    DeleteFileW(name);
    throw std::runtime_error("cannot write the temporary copy of " + path);
  }
  return name;
}

UINT code_page(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
      return 10000;
    case kWindowsLatin1:
      return 1252;
    case kASCII:
      return 20127;
    case kUTF8:
      return CP_UTF8;
    default:  // ISO Latin 1, and bytes without a declared encoding
      return 28591;
  }
}

bool is_surrogate(char32_t c) { return c >= 0xD800 && c <= 0xDFFF; }

// Bytes in `encoding` to UTF-16 code units; false when they do not convert.
bool to_utf16(std::string_view bytes, std::uint32_t encoding, std::wstring& out) {
  if (encoding == kUTF16) {
    if (bytes.size() % 2 != 0) return false;
    out.resize(bytes.size() / 2);
    for (std::size_t i = 0; i < out.size(); ++i) {
      out[i] = static_cast<wchar_t>(static_cast<unsigned char>(bytes[2 * i]) |
                                    static_cast<unsigned char>(bytes[2 * i + 1]) << 8);
    }
    return true;
  }
  if (encoding == kUTF32) {
    if (bytes.size() % 4 != 0) return false;
    out.clear();
    out.reserve(bytes.size() / 2);
    for (std::size_t i = 0; i < bytes.size(); i += 4) {
      char32_t c = 0;
      for (int k = 3; k >= 0; --k) c = c << 8 | static_cast<unsigned char>(bytes[i + k]);
      if (c > 0x10FFFF || is_surrogate(c)) return false;
      if (c >= 0x10000) {
        out += static_cast<wchar_t>(0xD800 + ((c - 0x10000) >> 10));
        out += static_cast<wchar_t>(0xDC00 + ((c - 0x10000) & 0x3FF));
      } else {
        out += static_cast<wchar_t>(c);
      }
    }
    return true;
  }
  for (unsigned char c : bytes) {
    if (encoding == kASCII && c >= 0x80) return false;
    if (encoding == kWindowsLatin1 &&
        (c == 0x81 || c == 0x8D || c == 0x8F || c == 0x90 || c == 0x9D))
      return false;
  }
  if (bytes.empty()) {
    out.clear();
    return true;
  }
  const UINT cp = code_page(encoding);
  const DWORD flags = MB_ERR_INVALID_CHARS;
  const int n =
      MultiByteToWideChar(cp, flags, bytes.data(), static_cast<int>(bytes.size()), nullptr, 0);
  if (n <= 0) return false;
  out.resize(static_cast<std::size_t>(n));
  return MultiByteToWideChar(cp, flags, bytes.data(), static_cast<int>(bytes.size()), out.data(),
                             n) == n;
}

// UTF-16 code units to bytes in `encoding`; false when a character has no
// form there (or a surrogate is unpaired).
bool from_utf16(const std::wstring& units, std::uint32_t encoding, std::string& out) {
  // Pairs of surrogates must be whole in every target encoding.
  for (std::size_t i = 0; i < units.size(); ++i) {
    const char32_t u = static_cast<char16_t>(units[i]);
    if (u >= 0xD800 && u <= 0xDBFF) {
      if (i + 1 == units.size()) return false;
      const char32_t v = static_cast<char16_t>(units[i + 1]);
      if (v < 0xDC00 || v > 0xDFFF) return false;
      ++i;
    } else if (u >= 0xDC00 && u <= 0xDFFF) {
      return false;
    }
  }
  out.clear();
  if (encoding == kUTF16) {
    out.reserve(units.size() * 2);
    for (wchar_t w : units) {
      out += static_cast<char>(w & 0xFF);
      out += static_cast<char>((w >> 8) & 0xFF);
    }
    return true;
  }
  if (encoding == kUTF32) {
    out.reserve(units.size() * 4);
    for (std::size_t i = 0; i < units.size(); ++i) {
      char32_t c = static_cast<char16_t>(units[i]);
      if (c >= 0xD800 && c <= 0xDBFF) {
        c = 0x10000 + ((c - 0xD800) << 10) + (static_cast<char16_t>(units[++i]) - 0xDC00);
      }
      for (int k = 0; k < 4; ++k) out += static_cast<char>((c >> (8 * k)) & 0xFF);
    }
    return true;
  }
  if (units.empty()) return true;
  if (encoding == kASCII) {  // code page 20127 would strip or substitute instead
    for (wchar_t w : units) {
      if (w >= 0x80) return false;
      out += static_cast<char>(w);
    }
    return true;
  }
  const UINT cp = code_page(encoding);
  const int length = static_cast<int>(units.size());
  // UTF-8 reports unconvertible text through WC_ERR_INVALID_CHARS; the other
  // code pages through the default-character flag, with best-fit mappings off.
  const DWORD flags = cp == CP_UTF8 ? WC_ERR_INVALID_CHARS : WC_NO_BEST_FIT_CHARS;
  BOOL defaulted = FALSE;
  BOOL* used_default = cp == CP_UTF8 ? nullptr : &defaulted;
  const int n =
      WideCharToMultiByte(cp, flags, units.data(), length, nullptr, 0, nullptr, used_default);
  if (n <= 0 || defaulted) return false;
  out.resize(static_cast<std::size_t>(n));
  if (WideCharToMultiByte(cp, flags, units.data(), length, out.data(), n, nullptr, used_default) !=
          n ||
      defaulted)
    return false;
  if (encoding == kWindowsLatin1) {  // the undefined bytes are not characters
    for (unsigned char c : out) {
      if (c == 0x81 || c == 0x8D || c == 0x8F || c == 0x90 || c == 0x9D) return false;
    }
  }
  return true;
}

}  // namespace

void* load_library(const std::string& path) {
  std::wstring copy = private_copy(path);
  const HMODULE module = LoadLibraryW(copy.c_str());
  if (!module) {
    const DWORD code = GetLastError();
    DeleteFileW(copy.c_str());
    throw std::runtime_error("cannot load " + path + ": " + system_message(code));
  }
  return new Loaded{module, std::move(copy)};
}

void* find_symbol(void* library, const char* name) {
  return reinterpret_cast<void*>(GetProcAddress(static_cast<Loaded*>(library)->module, name));
}

void unload_library(void* library) {
  auto* loaded = static_cast<Loaded*>(library);
  FreeLibrary(loaded->module);
  DeleteFileW(loaded->copy.c_str());
  delete loaded;
}

std::optional<std::string> convert(std::string_view bytes, std::uint32_t from, std::uint32_t to) {
  std::wstring units;
  std::string out;
  if (!to_utf16(bytes, from, units) || !from_utf16(units, to, out)) return std::nullopt;
  return out;
}

}  // namespace zul_host::platform
