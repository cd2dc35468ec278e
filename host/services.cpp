// Every service the stand-in host offers, with the native signature the
// plug-in expects (plugin/host_types.h, host_sig), and the resolver that
// hands them out by name. The resolver has no context argument, so services
// serve the one live Host. Each service takes the Host's mutex while it
// touches the tables and never calls back into the plug-in while holding it.
#include <atomic>
#include <cstring>
#include <utility>

#include "host/host_impl.h"
#include "host/text_convert.h"

namespace zul_host::detail {
namespace {

constexpr const char kLenB[] = "LenB( s as string ) as integer";
constexpr const char kConstructor[] = "Constructor(bytes as Integer)";
constexpr const char kToPtr[] = "Operator_Convert() As Ptr";

double get_rb_version() {
  return serve<double>("REALGetRBVersion", 0.0,
                       [](HostState& h) { return h.config.version.value_or(0.0); });
}

void register_plugin_version(std::int32_t version) {
  serve_void("RegisterPluginVersion",
             [&](HostState& h) { h.registration.announced_version = version; });
}

bool in_runtime() {
  return serve<bool>("REALinRuntime", false, [](HostState& h) { return h.config.in_runtime; });
}

RegisteredMethod copy_row(const GlobalMethodEntry& row) {
  return {row.declaration ? row.declaration : "",
          row.function,
          row.setter,
          row.flags,
          row.attribute_count,
          row.attributes};
}

void register_module(ModuleRecord* record) {
  serve_void("PluginRegisterModule", [&](HostState& h) {
    Registration& r = h.registration;
    ++r.module_calls;
    if (!record) return h.problem("PluginRegisterModule called with a null record");
    h.module_records.push_back(record);
    r.module_name = record->name ? record->name : "";
    r.module_interface_version = record->interface_version;
    r.module_method_count = record->method_count;
    bool zero = record->zero == 0;
    for (std::uint8_t b : record->reserved) zero = zero && b == 0;
    r.module_record_zero_elsewhere = zero;
    for (std::uint64_t i = 0; record->methods && i < record->method_count; ++i) {
      r.methods.push_back(copy_row(record->methods[i]));
    }
  });
}

void register_method(GlobalMethodEntry* row) {
  serve_void("PluginRegisterMethod", [&](HostState& h) {
    ++h.registration.method_calls;
    if (!row) return h.problem("PluginRegisterMethod called with a null row");
    h.registration.row_addresses.push_back(row);
    h.registration.methods.push_back(copy_row(*row));
  });
}

void lock_string(REALstring s) {
  serve_void("REALLockString", [&](HostState& h) {
    if (HostObject* o = h.check(s, Kind::string, "REALLockString")) h.add_ref(o);
  });
}

void unlock_string(REALstring s) {
  serve_void("REALUnlockString", [&](HostState& h) {
    if (HostObject* o = h.check(s, Kind::string, "REALUnlockString")) h.drop_ref(o);
  });
}

const char* string_get_cstring(REALstring s) {
  return serve<const char*>("StringGetCString", "", [&](HostState& h) -> const char* {
    if (!s) return "";
    HostObject* o = h.check(s, Kind::string, "StringGetCString");
    return o ? o->bytes.c_str() : "";
  });
}

std::int64_t len_b(REALstring s) {
  return serve<std::int64_t>(kLenB, 0, [&](HostState& h) -> std::int64_t {
    if (!s) return 0;
    HostObject* o = h.check(s, Kind::string, "LenB");
    if (!o) return 0;
    if (auto it = h.config.claimed_lengths.find(o->bytes); it != h.config.claimed_lengths.end())
      return it->second;
    return static_cast<std::int64_t>(o->bytes.size());
  });
}

void* load_global_method(const char* module, const char* declaration) {
  return serve<void*>("REALLoadGlobalMethod", nullptr, [&](HostState&) -> void* {
    if (module || !declaration || std::strcmp(declaration, kLenB) != 0) return nullptr;
    return service_pointer<host_sig::LenB>(&len_b);
  });
}

void lock_object(REALobject o) {
  serve_void("REALLockObject", [&](HostState& h) {
    if (HostObject* x = h.check(o, "REALLockObject")) h.add_ref(x);
  });
}

void unlock_object(REALobject o) {
  serve_void("REALUnlockObject", [&](HostState& h) {
    if (HostObject* x = h.check(o, "REALUnlockObject")) h.drop_ref(x);
  });
}

bool get_prop_integer(REALobject o, const char* name, std::int64_t* value) {
  return serve<bool>("REALGetPropValueInteger", false, [&](HostState& h) {
    HostObject* x = h.check(o, "REALGetPropValueInteger");
    if (!x || !name || !value) return false;
    if (x->kind == Kind::block && std::strcmp(name, "Size") == 0) {
      *value = x->size;
      return true;
    }
    if (x->kind == Kind::exception && std::strcmp(name, "ErrorNumber") == 0) {
      *value = x->error_number;
      return true;
    }
    return false;
  });
}

bool set_prop_integer(REALobject o, const char* name, std::int64_t value) {
  return serve<bool>("REALSetPropValueInteger", false, [&](HostState& h) {
    HostObject* x = h.check(o, "REALSetPropValueInteger");
    if (!x || !name || x->kind != Kind::exception || std::strcmp(name, "ErrorNumber") != 0)
      return false;
    x->error_number = value;
    return true;
  });
}

bool set_prop_string(REALobject o, const char* name, REALstring value) {
  return serve<bool>("REALSetPropValueString", false, [&](HostState& h) {
    HostObject* x = h.check(o, "REALSetPropValueString");
    if (!x || !name || x->kind != Kind::exception || std::strcmp(name, "Message") != 0)
      return false;
    HostObject* s = nullptr;
    if (value && !(s = h.check(value, Kind::string, "REALSetPropValueString"))) return false;
    if (s) h.add_ref(s);
    if (x->message) h.drop_ref(x->message);
    x->message = s;
    return true;
  });
}

std::int64_t block_get_size(REALmemoryBlock m) {
  return serve<std::int64_t>("memoryBlockGetSize", 0, [&](HostState& h) -> std::int64_t {
    HostObject* o = h.check(m, Kind::block, "memoryBlockGetSize");
    return o ? o->size : 0;
  });
}

void* block_get_ptr(REALmemoryBlock m) {
  return serve<void*>("memoryBlockGetPtr", nullptr, [&](HostState& h) -> void* {
    HostObject* o = h.check(m, Kind::block, "memoryBlockGetPtr");
    return o ? o->data.get() : nullptr;
  });
}

void size_block(HostObject* o, std::int64_t size) {
  o->size = size;
  o->data = std::make_unique<std::uint8_t[]>(static_cast<std::size_t>(size) + 1);  // zero-filled
}

REALmemoryBlock new_memory_block(std::int32_t size) {
  return serve<REALmemoryBlock>("newMemoryBlock", nullptr, [&](HostState& h) -> REALmemoryBlock {
    if (size < 0 || size > h.config.block_cap) return nullptr;
    HostObject* o = h.make(Kind::block, "newMemoryBlock");
    size_block(o, size);
    return reinterpret_cast<REALmemoryBlock>(o);
  });
}

void block_constructor(REALobject o, std::int64_t size) {
  serve_void(kConstructor, [&](HostState& h) {
    HostObject* x = h.check(o, Kind::block, kConstructor);
    if (!x) return;
    if (size < 0 || size > h.config.block_cap) {
      h.raise_pending(h.make_exception("OutOfMemoryException", "Not enough memory for the block."));
      return;
    }
    size_block(x, size);
  });
}

void* block_to_ptr(REALobject o) {
  return serve<void*>(kToPtr, nullptr, [&](HostState& h) -> void* {
    HostObject* x = h.check(o, Kind::block, kToPtr);
    return x ? x->data.get() : nullptr;
  });
}

void* load_object_method(REALobject o, const char* declaration) {
  return serve<void*>("REALLoadObjectMethod", nullptr, [&](HostState& h) -> void* {
    HostObject* x = h.check(o, "REALLoadObjectMethod");
    if (!x || x->kind != Kind::block || !declaration) return nullptr;
    if (std::strcmp(declaration, kConstructor) == 0)
      return service_pointer<host_sig::MemoryBlockConstructor>(&block_constructor);
    if (std::strcmp(declaration, kToPtr) == 0)
      return service_pointer<host_sig::MemoryBlockToPtr>(&block_to_ptr);
    return nullptr;
  });
}

bool ends_with(std::string_view s, std::string_view tail) {
  return s.size() >= tail.size() && s.substr(s.size() - tail.size()) == tail;
}

REALobject new_instance(const char* class_name) {
  return serve<REALobject>("PluginNewInstance", nullptr, [&](HostState& h) -> REALobject {
    if (!class_name || h.config.unknown_classes.count(class_name)) return nullptr;
    const std::string_view name(class_name);
    if (name == "MemoryBlock")
      return reinterpret_cast<REALobject>(h.make(Kind::block, "PluginNewInstance"));
    if (!ends_with(name, "Exception")) return nullptr;
    HostObject* e = h.make(Kind::exception, "PluginNewInstance");
    e->class_name.assign(name);
    return reinterpret_cast<REALobject>(e);
  });
}

void raise_exception(REALobject o) {
  serve_void("RuntimeRaiseException", [&](HostState& h) {
    HostObject* x = h.check(o, Kind::exception, "RuntimeRaiseException");
    if (!x) return;
    h.add_ref(x);
    h.raise_pending(x);
  });
}

REALobject call_with_exception_handler(void (*fn)(void*), void* arg) {
  HostState* h = live_host();
  HostObject* outer = nullptr;
  if (h) {
    std::lock_guard lock(h->mu);
    h->count_call("PluginCallFunctionWithExceptionHandler");
    outer = std::exchange(h->this_thread().pending, nullptr);
  }
  if (fn) fn(arg);
  if (!h) return nullptr;
  std::lock_guard lock(h->mu);
  // The caught exception goes to the caller with the reference pending held.
  HostObject* caught = std::exchange(h->this_thread().pending, outer);
  return reinterpret_cast<REALobject>(caught);
}

}  // namespace

namespace {
std::atomic<HostState*> g_live{nullptr};
}  // namespace

HostState* live_host() { return g_live.load(std::memory_order_acquire); }
void set_live_host(HostState* state) { g_live.store(state, std::memory_order_release); }

void* resolve_service(const char* name) {
  HostState* h = g_live.load(std::memory_order_acquire);
  if (!h || !name) return nullptr;
  const std::string_view n(name);
  {
    std::lock_guard lock(h->mu);
    auto it = h->lookup_counts.find(n);
    if (it == h->lookup_counts.end()) it = h->lookup_counts.emplace(std::string(n), 0).first;
    ++it->second;
    if (h->config.missing.count(n)) return nullptr;
    if (n == "REALGetRBVersion" && !h->config.version) return nullptr;
    if (h->config.null_first.count(n) && it->second == 1) return nullptr;
  }
  static const ServiceEntry kServices[] = {
      service<host_sig::GetRBVersion>("REALGetRBVersion", &get_rb_version),
      service<host_sig::RegisterPluginVersion>("RegisterPluginVersion", &register_plugin_version),
      service<host_sig::InRuntime>("REALinRuntime", &in_runtime),
      service<host_sig::RegisterModule>("PluginRegisterModule", &register_module),
      service<host_sig::RegisterMethod>("PluginRegisterMethod", &register_method),
      service<host_sig::LockString>("REALLockString", &lock_string),
      service<host_sig::LockString>("REALUnlockString", &unlock_string),
      service<host_sig::StringGetCString>("StringGetCString", &string_get_cstring),
      service<host_sig::LoadGlobalMethod>("REALLoadGlobalMethod", &load_global_method),
      service<host_sig::LockObject>("REALLockObject", &lock_object),
      service<host_sig::LockObject>("REALUnlockObject", &unlock_object),
      service<host_sig::GetPropValueInteger>("REALGetPropValueInteger", &get_prop_integer),
      service<host_sig::MemoryBlockGetSize>("memoryBlockGetSize", &block_get_size),
      service<host_sig::MemoryBlockGetPtr>("memoryBlockGetPtr", &block_get_ptr),
      service<host_sig::NewMemoryBlock>("newMemoryBlock", &new_memory_block),
      service<host_sig::LoadObjectMethod>("REALLoadObjectMethod", &load_object_method),
      service<host_sig::NewInstance>("PluginNewInstance", &new_instance),
      service<host_sig::CallWithExceptionHandler>("PluginCallFunctionWithExceptionHandler",
                                                  &call_with_exception_handler),
      service<host_sig::SetPropValueString>("REALSetPropValueString", &set_prop_string),
      service<host_sig::SetPropValueInteger>("REALSetPropValueInteger", &set_prop_integer),
      service<host_sig::RaiseException>("RuntimeRaiseException", &raise_exception),
  };
  for (const auto& [service, fn] : kServices) {
    if (service == n) return fn;
  }
  return text_service(n);
}

}  // namespace zul_host::detail
