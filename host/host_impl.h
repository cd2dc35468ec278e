// Inside the stand-in host: the objects behind every handle it hands out,
// the per-thread ledger state, and the table of services the resolver
// serves. Every handle is the address of one HostObject; objects are never
// freed while a plug-in could still hold their address unnoticed: destroyed
// ones stay in a bounded quarantine, poisoned, so a later use is reported
// instead of crashing. All tables are guarded by Impl::mu.
#pragma once

#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <thread>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "host/host.h"

namespace zul_host::detail {

enum class Kind { string, block, array, exception };

// One host value. Only the fields of its kind are used.
struct HostObject {
  Kind kind = Kind::string;
  std::uint64_t id = 0;
  int refs = 1;
  bool destroyed = false;
  std::thread::id thread;    // the thread that made it (whose ledger owns it)
  const char* made_by = "";  // the service or API that made it
  // string
  std::string bytes;
  std::uint32_t encoding = text_encoding::kUnknown;
  // memory block
  std::unique_ptr<std::uint8_t[]> data;
  std::int64_t size = 0;
  // string array: each non-null item holds one reference
  std::vector<HostObject*> items;
  // exception
  std::string class_name;
  HostObject* message = nullptr;  // holds one reference
  std::int64_t error_number = 0;
};

// A string-data record filled by "PluginGetStringData".
struct RecordInfo {
  std::unique_ptr<std::uint8_t[]> buffer;
  std::thread::id thread;
  std::uint64_t string_id = 0;
  std::uint32_t encoding = 0;
  std::uint64_t length = 0;
  bool disposed = false;
};

struct ThreadState {
  std::uint64_t object_mark = ~std::uint64_t{0};  // ledger start: first object id counted
  std::uint64_t record_mark = ~std::uint64_t{0};
  std::vector<std::string> problems;  // since the mark
  HostObject* pending = nullptr;      // raised, not yet taken; holds one reference
  std::optional<RaisedException> last_exception;
  std::string last_report;
};

inline constexpr std::size_t kQuarantine = 8192;  // destroyed objects kept poisoned
inline constexpr std::uintptr_t kRecordMagic = 0x5A554C5245434F52;  // "ZULRECOR"

// Everything one Host holds.
struct HostState {
  HostConfig config;
  mutable std::mutex mu;
  HostState* previous_live = nullptr;  // the Host that was live before this one

  void* library = nullptr;
  Registration registration;
  std::vector<ModuleRecord*> module_records;  // owned; freed at destruction

  std::unordered_map<const void*, std::unique_ptr<HostObject>> objects;  // live + quarantined
  // The live ones alone, so the ledger check after each call costs what is
  // alive, not what the quarantine holds.
  std::unordered_set<const HostObject*> live;
  std::deque<HostObject*> quarantine;
  std::uint64_t next_object_id = 1;

  std::unordered_map<std::uint64_t, RecordInfo> records;
  std::deque<std::uint64_t> disposed_records;
  std::set<std::uint64_t> open_records;  // filled, not yet disposed
  std::uint64_t next_record_id = 1;

  std::map<std::thread::id, ThreadState> threads;
  std::map<std::string, int, std::less<>> lookup_counts;
  std::map<std::string, int, std::less<>> call_counts;
  std::map<std::pair<std::uint32_t, std::uint32_t>, long> conversions;  // (from, to) -> count
  // Declarations already checked by Host::call: function and parsed form.
  std::unordered_map<std::string, std::pair<void*, Declaration>> checked;

  // All of the following expect mu to be held.
  ThreadState& this_thread() { return threads[std::this_thread::get_id()]; }
  void problem(std::string text) { this_thread().problems.push_back(std::move(text)); }
  void count_call(std::string_view service);
  void count_conversion(std::uint32_t from, std::uint32_t to) {
    if (from != to) ++conversions[{from, to}];
  }
  HostObject* make(Kind kind, const char* made_by);
  HostObject* make_string(std::string_view bytes, std::uint32_t encoding, const char* made_by);
  // The live object behind handle, of the given kind, or null after
  // reporting why not (null, unknown, destroyed or of another kind).
  HostObject* check(const void* handle, const char* service);
  HostObject* check(const void* handle, Kind kind, const char* service);
  void add_ref(HostObject* o) { ++o->refs; }
  void drop_ref(HostObject* o);
  void destroy(HostObject* o);
  void raise_pending(HostObject* exception);
  HostObject* make_exception(std::string_view class_name, std::string_view message);
  std::string describe(const HostObject* o) const;
  std::string read_utf8(const HostObject* s) const;
  RaisedException read_exception(const HostObject* o) const;
  void mark_ledger();
  std::string report_ledger();
};

// The live Host (one at a time); the resolver and every service serve it.
HostState* live_host();
void set_live_host(HostState* state);

// The resolver handed to plug-ins; serves live_host().
void* resolve_service(const char* name);

// The text and array services by lookup name (text_services.cpp), or null.
void* text_service(std::string_view name);

// One row of a service table. Sig is the signature the plug-in casts the
// service to (plugin/host_types.h): a function whose signature drifts from
// it no longer converts, so the table fails to compile.
struct ServiceEntry {
  std::string_view name;
  void* fn;
};
template <class Sig>
ServiceEntry service(std::string_view name, Sig fn) {
  return {name, reinterpret_cast<void*>(fn)};
}
// The same for a pointer handed out by a look-up service.
template <class Sig>
void* service_pointer(Sig fn) {
  return reinterpret_cast<void*>(fn);
}

// Runs body with the live host locked and the service counted; returns
// fallback when no Host is live.
template <class T, class Body>
T serve(const char* service, T fallback, Body body) {
  HostState* h = live_host();
  if (!h) return fallback;
  std::lock_guard lock(h->mu);
  h->count_call(service);
  return body(*h);
}

template <class Body>
void serve_void(const char* service, Body body) {
  serve<int>(service, 0, [&](HostState& h) {
    body(h);
    return 0;
  });
}

}  // namespace zul_host::detail

namespace zul_host {
struct Host::Impl : detail::HostState {};
}  // namespace zul_host
