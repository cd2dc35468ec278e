// Host services reached by name through the resolver, each behind a wrapper
// named after its role. A wrapper looks its service up on first use and keeps
// the answer in a HostEntryCache; a missing service never stops a caller: the
// wrapper then returns null, 0 or false without calling anything.
#pragma once

#include <atomic>
#include <cstdint>

#include "plugin/host_types.h"

// Globals set once by REALPluginMain, read without locks afterwards.
extern REALResolver gResolver;
extern double rbversion_rbversion;     // host version, 0.0 when unknown
extern int CurrentREALControlVersion;  // plug-in interface version, 9..13
extern const char* gpartname;          // "String"

// How a cache treats a failed look-up.
enum class CacheKind {
  once,   // ask once; a service missing at first use stays missing
  retry,  // ask again on every use while the answer is null
};

// One cached service pointer. Filled on first use from any thread: the
// fields are atomic, and a race at most asks the resolver twice for the same
// name, which the host answers alike.
template <CacheKind Kind>
class HostEntryCache {
 public:
  explicit constexpr HostEntryCache(const char* name) : name_(name) {}
  HostEntryCache(const HostEntryCache&) = delete;
  HostEntryCache& operator=(const HostEntryCache&) = delete;

  // The service pointer, or null when the host has none (now, for retry).
  void* get() {
    return get([](const char* name) { return gResolver ? gResolver(name) : nullptr; });
  }

  // The same for a pointer that is not a resolver service (a host-language
  // method): resolve(name) finds it when the cache has no answer yet.
  template <class Resolve>
  void* get(Resolve&& resolve) {
    if constexpr (Kind == CacheKind::once) {
      if (resolved_.load(std::memory_order_acquire)) return fn_.load(std::memory_order_relaxed);
      void* fn = resolve(name_);
      fn_.store(fn, std::memory_order_relaxed);
      resolved_.store(true, std::memory_order_release);
      return fn;
    } else {
      void* fn = fn_.load(std::memory_order_acquire);
      if (fn) return fn;
      fn = resolve(name_);
      if (fn) fn_.store(fn, std::memory_order_release);
      return fn;
    }
  }

  template <class Fn>
  Fn as() {
    return reinterpret_cast<Fn>(get());
  }

 private:
  const char* name_;
  std::atomic<void*> fn_{nullptr};
  std::atomic<bool> resolved_{false};
};

// Registration and start-up.
bool REALinRuntime();
// True when the host took the record (it owns it from then on).
bool REALRegisterModule(ModuleRecord* record);
void REALRegisterMethod(GlobalMethodEntry* row);

// Strings.
void REALLockString(REALstring s);
void REALUnlockString(REALstring s);
// Bytes ("StringGetCString") and byte length (LenB) of a non-null string.
// No pointer service: null and length 0. No LenB: length 0.
const std::uint8_t* REALGetStringContents(REALstring s, std::int64_t* length);
// A host-language global method by declaration ("REALLoadGlobalMethod").
void* REALLoadFrameworkMethod(const char* declaration);
REALstring originalREALBuildString(const void* data, std::int32_t length);
REALstring REALBuildStringWithEncoding(const void* data, std::int32_t length,
                                       std::uint32_t encoding);
void REALSetStringEncoding(REALstring s, std::uint32_t encoding);
REALstring REALConvertString(REALstring s, std::uint32_t encoding);
// The stored encoding of s. *available (when given) tells whether the host
// has the service; without it the answer is 0.
std::uint32_t REALGetStringEncoding(REALstring s, bool* available = nullptr);
bool REALGetStringData(REALstring s, std::uint32_t encoding, REALstringData* out);
void REALDisposeStringData(REALstringData* record);

// Objects and memory blocks.
void REALLockObject(REALobject o);
void REALUnlockObject(REALobject o);
bool REALGetPropValueInteger(REALobject o, const char* property, std::int64_t* value);
void REALSetPropValueString(REALobject o, const char* property, REALstring value);
void REALSetPropValueInteger(REALobject o, const char* property, std::int64_t value);
std::int64_t REALMemoryBlockGetSize(REALmemoryBlock m);
void* REALMemoryBlockGetPtr(REALmemoryBlock m);
REALmemoryBlock REALNewMemoryBlockOriginal(std::int32_t size);
void* REALLoadObjectMethod(REALobject o, const char* declaration);
REALobject REALnewInstance(const char* class_name);
// Runs fn(arg) under the host's exception handler and returns the exception
// object it raised (a reference the caller releases), or null. Without the
// service fn runs directly.
REALobject REALCallFunctionWithExceptionHandler(void (*fn)(void*), void* arg);
void REALRaiseException(REALobject exception);

// String arrays.
REALarray REALCreateArray(std::int32_t element_type, std::int64_t upper_bound);
std::int64_t REALGetArrayUBound(REALarray array);
void REALInsertArrayValueString(REALarray array, std::int64_t index, REALstring s);
