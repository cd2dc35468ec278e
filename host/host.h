// The stand-in host: plays the plug-in host for tests, the zul tool and the
// benchmarks. It loads a plug-in file with dlopen, hands REALPluginMain a
// resolver over its own services, records what gets registered, and calls the
// registered functions through the registered pointers. It holds real host
// strings (bytes, encoding tag, reference count), memory blocks, string
// arrays and exception objects, and keeps a ledger of every reference and
// lock so a test can prove that a call leaked nothing and released nothing
// twice.
//
// One Host is live at a time in a process (the resolver has no context
// argument); each Host loads a private copy of the plug-in file, so every
// Host starts with fresh library globals and service caches.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <map>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "host/declaration.h"
#include "plugin/host_types.h"

namespace zul_host {

struct HostConfig {
  std::optional<double> version = 2019.0;              // nullopt: no "REALGetRBVersion"
  bool in_runtime = true;                              // answer of "REALinRuntime"
  std::set<std::string, std::less<>> missing;          // services the resolver never finds
  std::set<std::string, std::less<>> null_first;       // null on the first look-up, found later
  std::set<std::string, std::less<>> unknown_classes;  // "PluginNewInstance" answers null
  std::int64_t block_cap = std::int64_t{256} << 20;    // bigger memory blocks cannot be made
  // LenB answers the mapped length for a string whose bytes are exactly a
  // key: a string that claims gigabytes while holding a few bytes, for tests
  // of size limits that must refuse before reading (a read past the real
  // bytes is what the sanitizers then report).
  std::map<std::string, std::int64_t, std::less<>> claimed_lengths;
  // Bench mode: destroyed objects and disposed records are freed at once,
  // neither poisoned nor kept in quarantine, as a host does; counts stay.
  bool bench = false;
};

struct RegisteredMethod {
  std::string declaration;
  void* function = nullptr;
  void* setter = nullptr;
  std::uint32_t flags = 0;
  std::uint64_t attribute_count = 0;
  void* attributes = nullptr;
};

struct Registration {
  std::optional<std::int32_t> announced_version;        // "RegisterPluginVersion"
  int module_calls = 0;                                 // "PluginRegisterModule" calls
  int method_calls = 0;                                 // "PluginRegisterMethod" calls
  std::string module_name;                              // module path only
  std::uint32_t module_interface_version = 0;           // module path only
  std::uint64_t module_method_count = 0;                // module path only
  bool module_record_zero_elsewhere = false;            // all unset record bytes were zero
  std::vector<const GlobalMethodEntry*> row_addresses;  // per-method path: pointers passed
  std::vector<RegisteredMethod> methods;                // every row, in registration order
};

// A host string as tests see it (argument or result).
struct Str {
  std::string bytes;
  std::uint32_t encoding = text_encoding::kUTF8;
  bool null = false;  // the null string handle
  friend bool operator==(const Str&, const Str&) = default;
};
inline Str utf8(std::string_view text) { return {std::string(text), text_encoding::kUTF8, false}; }
inline Str tagged(std::string_view bytes, std::uint32_t encoding) {
  return {std::string(bytes), encoding, false};
}
inline Str null_string() { return {{}, text_encoding::kUTF8, true}; }

// A memory block as tests see it.
struct Block {
  std::string bytes;
  bool null = false;
  friend bool operator==(const Block&, const Block&) = default;
};

// A string array result.
struct StrArray {
  std::vector<Str> items;
  bool null = false;
};

struct RaisedException {
  std::string class_name;
  std::string message;  // "Message" as UTF-8
  std::int64_t error_number = 0;
  friend bool operator==(const RaisedException&, const RaisedException&) = default;
};

class Host {
 public:
  explicit Host(HostConfig config = {});
  ~Host();
  Host(const Host&) = delete;
  Host& operator=(const Host&) = delete;

  // Loads a private copy of the plug-in and calls REALPluginMain. Throws
  // std::runtime_error when the file cannot be loaded or has no entry.
  void load(const std::string& plugin_path);
  const Registration& registration() const;
  // Makes this Host the live one again (a new Host becomes live when it is
  // made): for callers that keep several Hosts, say one per host version,
  // and call each one's plug-in only while that Host is live.
  void make_live();
  // The native function registered under exactly this declaration, or null.
  void* find(std::string_view declaration) const;
  // A symbol the loaded plug-in exports (dlsym), or null: for test builds
  // of the plug-in that export controls besides REALPluginMain.
  void* library_symbol(const char* name) const;

  // Typed call through the registered pointer. A converts to the native
  // argument type (Str -> REALstring, Block -> REALmemoryBlock, integers ->
  // int64_t, double, bool -> signed char, pointers -> void*); R is one of
  // Str, Block, StrArray, std::int64_t, double, bool. Everything the call
  // makes is released afterwards and the ledger checked: see
  // last_ledger_report(). A raised exception is in last_exception().
  // Throws std::invalid_argument for a declaration that is not registered.
  template <class R, class... A>
  R call(std::string_view declaration, const A&... args);

  const std::optional<RaisedException>& last_exception() const;  // this thread's last call
  const std::string& last_ledger_report() const;                 // "" when balanced

  // Host values for frame tests. Handles made here carry one reference that
  // the caller gives back with release().
  REALstring make_string(std::string_view bytes, std::uint32_t encoding);
  REALmemoryBlock make_block(std::string_view bytes);
  Str read(REALstring s) const;
  Block read(REALmemoryBlock m) const;
  StrArray read(REALarray a) const;
  std::optional<RaisedException> read_exception(REALobject o) const;
  int ref_count(const void* handle) const;  // 0 once destroyed
  void release(const void* handle);         // any handle made by this host

  // The ledger. begin_ledger() marks a start; ledger_report() then lists what
  // is unbalanced since it ("" when nothing): live objects made since the
  // mark, reference counts that went below zero, string-data records not
  // disposed or disposed twice, and use of destroyed handles.
  void begin_ledger();
  std::string ledger_report() const;

  // The resolver this host hands to plug-ins (it serves the live Host). Tests
  // of the frame compiled into the test binary point their gResolver at it.
  REALResolver resolver() const;

  // What the plug-in asked for: resolver look-ups and service calls by name.
  int lookups(std::string_view service) const;
  int service_calls(std::string_view service) const;
  // Text conversions the host itself performed for the plug-in, by
  // "from to to" label ("UTF-16 to UTF-8"), with their counts.
  std::map<std::string, long> conversions() const;

  // For callers that call a registered function through a pointer of their
  // own (Host::call, the dynamic call of zul). call_started() marks this
  // thread's ledger and forgets its last exception. call_finished() takes an
  // exception raised on this thread into last_exception(), checks that each
  // argument handle (null ones skipped) is back to the single reference its
  // maker gave it, releases them, and stores the ledger report of the call.
  // The caller reads and releases the result before call_finished().
  void call_started();
  void call_finished(std::span<const void* const> argument_handles);

  // The exception raised on this thread and not yet taken (nullopt when
  // none), released here. For tests that call library code directly.
  std::optional<RaisedException> take_pending_exception();

  // The registered function behind declaration, after checking that the
  // argument and result types fit it. Throws std::invalid_argument naming
  // the mismatch, or when the declaration is not registered.
  void* checked_function(std::string_view declaration, std::initializer_list<ValueType> arguments,
                         ValueType result) const;

 private:
  struct Impl;
  Impl* impl_;
};

}  // namespace zul_host

#include "host/host_call.h"  // the template body of Host::call
