// The binary interface shared with the host: opaque handles, the records the
// host reads (method rows, the module record, string-data records), the text
// encoding numbers, and the native signature of every host service the
// library resolves by name. The stand-in host in host/ implements exactly
// these signatures, so both sides compile against one definition.
#pragma once

#include <cstddef>
#include <cstdint>

// Host handles. Their layout is the host's; the library only passes them back.
struct REALstringStruct;
struct REALmemoryBlockStruct;
struct REALobjectStruct;

using REALstring = REALstringStruct*;
using REALmemoryBlock = REALmemoryBlockStruct*;
using REALobject = REALobjectStruct*;  // exceptions, arrays, class instances
using REALarray = REALobjectStruct*;

// Maps a service name to the service, or null when the host has none.
using REALResolver = void* (*)(const char* name);

// One row of the method table (48 bytes, handed to the host as is).
struct GlobalMethodEntry {
  void* function;           // the native function the host calls
  void* setter;             // unused: null in every row
  const char* declaration;  // host-language declaration, NUL-terminated
  std::uint32_t flags;
  std::uint32_t zero;
  std::uint64_t attribute_count;
  void* attributes;
};
static_assert(sizeof(GlobalMethodEntry) == 48);
static_assert(offsetof(GlobalMethodEntry, function) == 0);
static_assert(offsetof(GlobalMethodEntry, setter) == 8);
static_assert(offsetof(GlobalMethodEntry, declaration) == 16);
static_assert(offsetof(GlobalMethodEntry, flags) == 24);
static_assert(offsetof(GlobalMethodEntry, zero) == 28);
static_assert(offsetof(GlobalMethodEntry, attribute_count) == 32);
static_assert(offsetof(GlobalMethodEntry, attributes) == 40);

// The record handed to "PluginRegisterModule" (192 bytes, zero except these).
struct ModuleRecord {
  std::uint32_t interface_version;
  std::uint32_t zero;
  char* name;
  GlobalMethodEntry* methods;
  std::uint64_t method_count;
  std::uint8_t reserved[160];
};
static_assert(sizeof(ModuleRecord) == 192);
static_assert(offsetof(ModuleRecord, name) == 8);
static_assert(offsetof(ModuleRecord, methods) == 16);
static_assert(offsetof(ModuleRecord, method_count) == 24);

// Filled by "PluginGetStringData"; bytes stay valid until disposed.
struct REALstringData {
  const void* data;
  std::uint64_t length;  // in bytes
  void* host_data[3];    // the host's own bookkeeping
};
static_assert(sizeof(REALstringData) == 40);
static_assert(offsetof(REALstringData, length) == 8);

// Text-encoding numbers (Apple text-encoding values).
namespace text_encoding {
inline constexpr std::uint32_t kMacRoman = 0;
inline constexpr std::uint32_t kUTF16 = 0x0100;  // host byte order
inline constexpr std::uint32_t kLatin1 = 0x0201;
inline constexpr std::uint32_t kWindowsLatin1 = 0x0500;
inline constexpr std::uint32_t kASCII = 0x0600;
inline constexpr std::uint32_t kUTF8 = 0x08000100;
inline constexpr std::uint32_t kUTF32 = 0x0C000100;  // host byte order
inline constexpr std::uint32_t kUnknown = 0xFFFF;    // bytes, no declared text
}  // namespace text_encoding

// Element type that "RuntimeArrayCreateSingleDimBoundedArray" takes for strings.
inline constexpr std::int32_t kStringArrayElementType = 3;

// Native signatures of the host services, by lookup name.
namespace host_sig {
using GetRBVersion = double (*)();                     // "REALGetRBVersion"
using RegisterPluginVersion = void (*)(std::int32_t);  // "RegisterPluginVersion"
using InRuntime = bool (*)();                          // "REALinRuntime"
using RegisterModule = void (*)(ModuleRecord*);        // "PluginRegisterModule"
using RegisterMethod = void (*)(GlobalMethodEntry*);   // "PluginRegisterMethod"
using LockString = void (*)(REALstring);               // "REALLockString", "REALUnlockString"
using StringGetCString = const char* (*)(REALstring);  // "StringGetCString"
using LoadGlobalMethod = void* (*)(const char* module,
                                   const char* declaration);  // "REALLoadGlobalMethod"
using LenB = std::int64_t (*)(REALstring);                    // "LenB( s as string ) as integer"
using LockObject = void (*)(REALobject);  // "REALLockObject", "REALUnlockObject"
using GetPropValueInteger = bool (*)(REALobject, const char*,
                                     std::int64_t*);           // "REALGetPropValueInteger"
using MemoryBlockGetSize = std::int64_t (*)(REALmemoryBlock);  // "memoryBlockGetSize"
using MemoryBlockGetPtr = void* (*)(REALmemoryBlock);          // "memoryBlockGetPtr"
using NewMemoryBlock = REALmemoryBlock (*)(std::int32_t);      // "newMemoryBlock"
using LoadObjectMethod = void* (*)(REALobject, const char* declaration);  // "REALLoadObjectMethod"
using MemoryBlockConstructor = void (*)(REALobject,
                                        std::int64_t);       // "Constructor(bytes as Integer)"
using MemoryBlockToPtr = void* (*)(REALobject);              // "Operator_Convert() As Ptr"
using NewInstance = REALobject (*)(const char* class_name);  // "PluginNewInstance"
using CallWithExceptionHandler = REALobject (*)(void (*)(void*),
                                                void*);  // "PluginCallFunctionWithExceptionHandler"
using SetPropValueString = bool (*)(REALobject, const char*,
                                    REALstring);  // "REALSetPropValueString"
using SetPropValueInteger = bool (*)(REALobject, const char*,
                                     std::int64_t);             // "REALSetPropValueInteger"
using RaiseException = void (*)(REALobject);                    // "RuntimeRaiseException"
using BuildString = REALstring (*)(const void*, std::int32_t);  // "REALBuildString"
using BuildStringWithEncoding = REALstring (*)(const void*, std::int32_t,
                                               std::uint32_t);    // "REALBuildStringWithEncoding"
using SetStringEncoding = void (*)(REALstring, std::uint32_t);    // "REALSetStringEncoding"
using ConvertString = REALstring (*)(REALstring, std::uint32_t);  // "REALConvertString"
using GetStringEncoding = std::uint32_t (*)(REALstring);          // "REALGetStringEncoding"
using GetStringData = bool (*)(REALstring, std::uint32_t,
                               REALstringData*);      // "PluginGetStringData"
using DisposeStringData = void (*)(REALstringData*);  // "PluginDisposeStringData"
using CreateArray =
    REALarray (*)(std::int32_t element_type,
                  std::int64_t upper_bound);      // "RuntimeArrayCreateSingleDimBoundedArray"
using ArrayUBound = std::int64_t (*)(REALarray);  // "RuntimeUBound"
using StringArrayInsert = void (*)(REALarray, std::int64_t index, REALstring);
using StringArrayInsertProc = StringArrayInsert (*)(REALarray);  // "PluginStringArrayInsertProc"
}  // namespace host_sig
