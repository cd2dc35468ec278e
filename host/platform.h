// The stand-in host's platform layer: loading a plug-in library and
// converting text between two of the host's string encodings. The POSIX
// side (platform_posix.cpp) uses dlopen and iconv, the Windows side
// (platform_windows.cpp) LoadLibraryW and the Win32 code-page conversions;
// the rest of the host is the same source on every platform.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace zul_host::platform {

// Loads a private copy of the library file at `path`, so each load gets the
// library's globals fresh; the copy goes away by unload_library at the
// latest. Returns an opaque handle; throws std::runtime_error naming `path`
// and the system's reason when the file cannot be copied or loaded.
void* load_library(const std::string& path);

// The address of the exported function `name`, or null.
void* find_symbol(void* library, const char* name);

// Unloads a library of load_library and removes what is left of its copy.
void unload_library(void* library);

// Re-encodes `bytes` from one of the eight host encodings to another,
// through the system's converter; nullopt when a sequence does not convert.
// Both encodings are known and different (text_convert.cpp checks).
std::optional<std::string> convert(std::string_view bytes, std::uint32_t from, std::uint32_t to);

}  // namespace zul_host::platform
