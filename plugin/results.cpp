// Host strings from bytes in a text encoding, string arrays and memory
// blocks. UTF-16 and UTF-32 input become UTF-8 host strings: newer hosts
// convert themselves; older ones get UTF-16 that the library makes from
// UTF-32. Every intermediate host value is released exactly once here.
#include "plugin/results.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "common/bytes.h"
#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/rb_data.h"

namespace {

constexpr std::int64_t kMaxStringBytes = 0x7FFFFFFF;
constexpr std::int64_t kStackConversionBytes = 800;

REALstring build_plain(const void* data, std::int64_t length, std::uint32_t encoding) {
  REALstring s = originalREALBuildString(data, static_cast<std::int32_t>(length));
  if (!s) return nullptr;
  REALSetStringEncoding(s, encoding);
  return s;
}

// Builds an intermediate string in `encoding`, converts it to UTF-8 and
// releases the intermediate.
REALstring convert_to_utf8(const void* data, std::int64_t length, std::uint32_t encoding) {
  REALstring intermediate =
      REALBuildStringWithEncoding(data, static_cast<std::int32_t>(length), encoding);
  REALstring converted = REALConvertString(intermediate, text_encoding::kUTF8);
  if (intermediate) REALUnlockString(intermediate);
  return converted;
}

// UTF-32 to UTF-16 for hosts that cannot convert UTF-32: surrogate code
// points are dropped, values past U+10FFFF become U+FFFD. Returns units.
std::size_t utf32_to_utf16(const std::uint8_t* data, std::int64_t count, std::uint16_t* out) {
  std::size_t n = 0;
  for (std::int64_t i = 0; i < count; ++i) {
    std::uint32_t c;
    std::memcpy(&c, data + 4 * i, 4);
    if (c <= 0xFFFF) {
      if (c >= 0xD800 && c <= 0xDFFF) continue;
      out[n++] = static_cast<std::uint16_t>(c);
    } else if (c >= 0x110000) {
      out[n++] = 0xFFFD;
    } else {
      out[n++] = static_cast<std::uint16_t>(0xD800 + ((c - 0x10000) >> 10));
      out[n++] = static_cast<std::uint16_t>(0xDC00 + ((c - 0x10000) & 0x3FF));
    }
  }
  out[n] = 0;
  return n;
}

REALstring build_from_utf32(const std::uint8_t* data, std::int64_t length) {
  if (rbversion_rbversion >= 2013.0) return convert_to_utf8(data, length, text_encoding::kUTF32);
  const std::int64_t count = length / 4;
  std::uint16_t stack_buffer[kStackConversionBytes / 2] = {};
  std::uint16_t* buffer = stack_buffer;
  if (length >= kStackConversionBytes) {
    buffer = static_cast<std::uint16_t*>(std::calloc(static_cast<std::size_t>(2 * count + 1), 2));
    if (!buffer) return nullptr;
  }
  const std::size_t units = utf32_to_utf16(data, count, buffer);
  REALstring s = REALBuildUnicodeStringUTF16(buffer, static_cast<std::int64_t>(2 * units));
  if (buffer != stack_buffer) std::free(buffer);
  return s;
}

}  // namespace

REALstring REALBuildUnicodeString(const void* data, std::int64_t length, std::uint32_t encoding) {
  if (!data || length < 1 || length > kMaxStringBytes) return nullptr;
  return trapped<REALstring>(nullptr, [&]() -> REALstring {
    const auto* bytes = static_cast<const std::uint8_t*>(data);
    switch (encoding) {
      case text_encoding::kMacRoman:
      case text_encoding::kWindowsLatin1:
      case text_encoding::kUnknown:
        if (zul::all_ascii({bytes, static_cast<std::size_t>(length)}))
          encoding = text_encoding::kASCII;
        return build_plain(data, length, encoding);
      case text_encoding::kUTF16:
        return REALBuildUnicodeStringUTF16(data, length);
      case text_encoding::kUTF32:
        return build_from_utf32(bytes, length);
      default:
        return build_plain(data, length, encoding);
    }
  });
}

REALstring REALBuildUnicodeStringUTF16(const void* data, std::int64_t byte_length) {
  // An empty result is always the null string, whatever the path.
  if (!data || byte_length < 1 || byte_length > kMaxStringBytes) return nullptr;
  if (rbversion_rbversion >= 2012.0)
    return convert_to_utf8(data, byte_length, text_encoding::kUTF16);
  REALstring tagged = originalREALBuildString(data, static_cast<std::int32_t>(byte_length));
  if (!tagged) return nullptr;
  REALSetStringEncoding(tagged, text_encoding::kUTF16);
  REALstring converted = REALConvertString(tagged, text_encoding::kUTF8);
  REALUnlockString(tagged);
  return converted;
}

StringArrayBuilder::StringArrayBuilder() : array_(REALCreateArray(kStringArrayElementType, -1)) {}

StringArrayBuilder::~StringArrayBuilder() {
  if (array_) REALUnlockObject(array_);
}

void StringArrayBuilder::append(REALstring s) {
  if (!s) return;
  if (array_) REALInsertArrayValueString(array_, REALGetArrayUBound(array_) + 1, s);
  REALUnlockString(s);
}

REALarray StringArrayBuilder::take() {
  REALarray array = array_;
  array_ = nullptr;
  return array;
}

namespace {

// "Constructor(bytes as Integer)" of the host class "MemoryBlock", found
// from the first block made this way and kept for the process.
HostEntryCache<CacheKind::once> memory_block_constructor("Constructor(bytes as Integer)");

REALmemoryBlock make_block(std::int64_t size) {
  if (size < kMaxStringBytes) return REALNewMemoryBlockOriginal(static_cast<std::int32_t>(size));
  NewMemoryBlockParams params{size, nullptr};
  if (REALobject raised = REALCallFunctionWithExceptionHandler(REALNewMemoryBlockWork, &params)) {
    REALUnlockObject(raised);
  }
  return params.block;
}

}  // namespace

void REALNewMemoryBlockWork(void* arg) {
  auto* params = static_cast<NewMemoryBlockParams*>(arg);
  REALobject object = REALnewInstance("MemoryBlock");
  if (!object) return;
  auto constructor =
      reinterpret_cast<host_sig::MemoryBlockConstructor>(memory_block_constructor.get(
          [&](const char* declaration) { return REALLoadObjectMethod(object, declaration); }));
  if (!constructor) {
    REALUnlockObject(object);
    return;
  }
  constructor(object, params->size);
  auto* block = reinterpret_cast<REALmemoryBlock>(object);
  if (memory_block_size(block) >= params->size) {
    params->block = block;
  } else {
    REALUnlockObject(object);
  }
}

REALmemoryBlock REALNewMemoryBlock(std::int64_t size, const void* bytes) {
  if (size < 1) return nullptr;
  try {
    if (REALmemoryBlock block = make_block(size)) {
      if (void* p = MyREALMemoryBlockGetPtr(block)) {
        if (bytes) std::memcpy(p, bytes, static_cast<std::size_t>(size));
        return block;
      }
      REALUnlockObject(reinterpret_cast<REALobject>(block));
    }
  } catch (const std::bad_alloc&) {
    // Reported below like any block that could not be made.
  }
  char message[200];
  std::snprintf(message, sizeof message,
                "Failed to allocate a memoryblock with %lld bytes in size.",
                static_cast<long long>(size));
  RaiseException("OutOfMemoryException", message, 0);
  return nullptr;
}
