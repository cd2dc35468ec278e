// Host: loading a private copy of a plug-in, what it registered, host values
// for tests, and the per-call ledger. The platform layer loads a fresh copy
// of the plug-in file, so each Host gets the library's globals and service
// caches fresh.
#include <cstdlib>
#include <cstring>
#include <stdexcept>

#include "host/host_impl.h"
#include "host/platform.h"

namespace zul_host {

using detail::HostObject;
using detail::Kind;

namespace {

using PluginMain = void (*)(REALResolver);

}  // namespace

Host::Host(HostConfig config) : impl_(new Impl) {
  impl_->config = std::move(config);
  impl_->previous_live = detail::live_host();
  detail::set_live_host(impl_);
}

Host::~Host() {
  for (ModuleRecord* record : impl_->module_records) {
    std::free(record->name);
    std::free(record->methods);
    std::free(record);
  }
  if (impl_->library) platform::unload_library(impl_->library);
  if (detail::live_host() == impl_) detail::set_live_host(impl_->previous_live);
  delete impl_;
}

void Host::load(const std::string& plugin_path) {
  void* library = platform::load_library(plugin_path);
  auto entry = reinterpret_cast<PluginMain>(platform::find_symbol(library, "REALPluginMain"));
  if (!entry) {
    platform::unload_library(library);
    throw std::runtime_error(plugin_path + " has no REALPluginMain");
  }
  {
    std::lock_guard lock(impl_->mu);
    if (impl_->library) platform::unload_library(impl_->library);
    impl_->library = library;
  }
  entry(&detail::resolve_service);
}

const Registration& Host::registration() const { return impl_->registration; }

void Host::make_live() { detail::set_live_host(impl_); }

void* Host::library_symbol(const char* name) const {
  std::lock_guard lock(impl_->mu);
  return impl_->library ? platform::find_symbol(impl_->library, name) : nullptr;
}

void* Host::find(std::string_view declaration) const {
  std::lock_guard lock(impl_->mu);
  for (const RegisteredMethod& m : impl_->registration.methods) {
    if (m.declaration == declaration) return m.function;
  }
  return nullptr;
}

void* Host::checked_function(std::string_view declaration,
                             std::initializer_list<ValueType> arguments, ValueType result) const {
  // Entries of the cache are never erased, so the pointer stays valid.
  const std::pair<void*, Declaration>* entry = nullptr;
  {
    std::lock_guard lock(impl_->mu);
    if (auto it = impl_->checked.find(std::string(declaration)); it != impl_->checked.end())
      entry = &it->second;
  }
  if (!entry) {
    void* found = find(declaration);
    if (!found) throw std::invalid_argument("not registered: " + std::string(declaration));
    auto parsed = parse_declaration(declaration);
    if (!parsed) throw std::invalid_argument("cannot parse: " + std::string(declaration));
    std::lock_guard lock(impl_->mu);
    entry = &impl_->checked.try_emplace(std::string(declaration), found, std::move(*parsed))
                 .first->second;
  }
  void* function = entry->first;
  const Declaration* parsed = &entry->second;
  std::string why;
  if (parsed->params.size() != arguments.size()) {
    why = "takes " + std::to_string(parsed->params.size()) + " arguments, given " +
          std::to_string(arguments.size());
  } else {
    std::size_t i = 0;
    for (ValueType given : arguments) {
      const ValueType want = parsed->params[i].type;
      if (given != want) {
        why = "argument " + std::to_string(i + 1) + " is " + type_name(want) + ", given " +
              type_name(given);
        break;
      }
      ++i;
    }
  }
  if (why.empty() && parsed->result != result) {
    why = std::string("returns ") + type_name(parsed->result) + ", asked for " + type_name(result);
  }
  if (!why.empty()) throw std::invalid_argument(std::string(declaration) + ": " + why);
  return function;
}

const std::optional<RaisedException>& Host::last_exception() const {
  std::lock_guard lock(impl_->mu);
  return impl_->this_thread().last_exception;
}

const std::string& Host::last_ledger_report() const {
  std::lock_guard lock(impl_->mu);
  return impl_->this_thread().last_report;
}

REALstring Host::make_string(std::string_view bytes, std::uint32_t encoding) {
  std::lock_guard lock(impl_->mu);
  return reinterpret_cast<REALstring>(impl_->make_string(bytes, encoding, "Host::make_string"));
}

REALmemoryBlock Host::make_block(std::string_view bytes) {
  std::lock_guard lock(impl_->mu);
  HostObject* o = impl_->make(Kind::block, "Host::make_block");
  o->size = static_cast<std::int64_t>(bytes.size());
  o->data = std::make_unique<std::uint8_t[]>(bytes.size() + 1);
  std::memcpy(o->data.get(), bytes.data(), bytes.size());
  return reinterpret_cast<REALmemoryBlock>(o);
}

Str Host::read(REALstring s) const {
  if (!s) return null_string();
  std::lock_guard lock(impl_->mu);
  const HostObject* o = impl_->check(s, Kind::string, "Host::read");
  if (!o) return null_string();
  return {o->bytes, o->encoding, false};
}

Block Host::read(REALmemoryBlock m) const {
  if (!m) return {{}, true};
  std::lock_guard lock(impl_->mu);
  const HostObject* o = impl_->check(m, Kind::block, "Host::read");
  if (!o || !o->data) return {{}, true};
  return {
      std::string(reinterpret_cast<const char*>(o->data.get()), static_cast<std::size_t>(o->size)),
      false};
}

StrArray Host::read(REALarray a) const {
  StrArray out;
  if (!a) {
    out.null = true;
    return out;
  }
  std::lock_guard lock(impl_->mu);
  const HostObject* o = impl_->check(a, Kind::array, "Host::read");
  if (!o) {
    out.null = true;
    return out;
  }
  for (const HostObject* item : o->items) {
    out.items.push_back(item ? Str{item->bytes, item->encoding, false} : null_string());
  }
  return out;
}

std::optional<RaisedException> Host::read_exception(REALobject e) const {
  if (!e) return std::nullopt;
  std::lock_guard lock(impl_->mu);
  const HostObject* o = impl_->check(e, Kind::exception, "Host::read_exception");
  if (!o) return std::nullopt;
  return impl_->read_exception(o);
}

int Host::ref_count(const void* handle) const {
  std::lock_guard lock(impl_->mu);
  auto it = impl_->objects.find(handle);
  if (it == impl_->objects.end() || it->second->destroyed) return 0;
  return it->second->refs;
}

void Host::release(const void* handle) {
  std::lock_guard lock(impl_->mu);
  if (HostObject* o = impl_->check(handle, "Host::release")) impl_->drop_ref(o);
}

void Host::begin_ledger() {
  std::lock_guard lock(impl_->mu);
  impl_->mark_ledger();
}

std::string Host::ledger_report() const {
  std::lock_guard lock(impl_->mu);
  return impl_->report_ledger();
}

REALResolver Host::resolver() const { return &detail::resolve_service; }

int Host::lookups(std::string_view service) const {
  std::lock_guard lock(impl_->mu);
  auto it = impl_->lookup_counts.find(service);
  return it == impl_->lookup_counts.end() ? 0 : it->second;
}

int Host::service_calls(std::string_view service) const {
  std::lock_guard lock(impl_->mu);
  auto it = impl_->call_counts.find(service);
  return it == impl_->call_counts.end() ? 0 : it->second;
}

void Host::call_started() {
  std::lock_guard lock(impl_->mu);
  detail::ThreadState& t = impl_->this_thread();
  if (t.pending) {
    impl_->drop_ref(t.pending);
    t.pending = nullptr;
  }
  t.last_exception.reset();
  impl_->mark_ledger();
}

void Host::call_finished(std::span<const void* const> argument_handles) {
  std::lock_guard lock(impl_->mu);
  detail::ThreadState& t = impl_->this_thread();
  if (t.pending) {
    t.last_exception = impl_->read_exception(t.pending);
    impl_->drop_ref(t.pending);
    t.pending = nullptr;
  }
  std::size_t index = 0;
  for (const void* handle : argument_handles) {
    ++index;
    if (!handle) continue;
    auto it = impl_->objects.find(handle);
    if (it == impl_->objects.end()) continue;
    HostObject* o = it->second.get();
    const std::string which = "argument " + std::to_string(index) + ", " + impl_->describe(o);
    if (o->destroyed) {
      impl_->problem(which + ", was released once more than it was locked");
      continue;
    }
    if (o->refs != 1) {
      impl_->problem(which + ", has " + std::to_string(o->refs) + " references after the call (" +
                     (o->refs > 1 ? "a lock was not released)" : "count went wrong)"));
      o->refs = 1;
    }
    impl_->drop_ref(o);
  }
  t.last_report = impl_->report_ledger();
}

std::optional<RaisedException> Host::take_pending_exception() {
  std::lock_guard lock(impl_->mu);
  detail::ThreadState& t = impl_->this_thread();
  if (!t.pending) return std::nullopt;
  RaisedException e = impl_->read_exception(t.pending);
  impl_->drop_ref(t.pending);
  t.pending = nullptr;
  return e;
}

}  // namespace zul_host
