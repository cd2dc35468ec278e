// The host's objects and its ledger. Objects are made with one reference and
// destroyed when the last one is released; destroyed objects stay in a
// bounded quarantine (poisoned) so a late use is reported by id, never
// dereferenced freely. The ledger is per thread: it counts objects and
// string-data records that a thread made since its mark, and the problems
// seen on that thread since then.
#include <algorithm>
#include <cstdio>
#include <cstring>

#include "host/host_impl.h"
#include "host/text_convert.h"

namespace zul_host::detail {
namespace {

constexpr std::size_t kPreviewChars = 40;
constexpr std::int64_t kPoisonLimit = 1 << 16;  // bigger dead blocks are freed at once

std::string preview(std::string_view bytes) {
  std::string out = "\"";
  for (std::size_t i = 0; i < bytes.size() && i < kPreviewChars; ++i) {
    const unsigned char c = static_cast<unsigned char>(bytes[i]);
    if (c == '"' || c == '\\') {
      out += '\\';
      out += static_cast<char>(c);
    } else if (c >= 0x20 && c < 0x7F) {
      out += static_cast<char>(c);
    } else {
      char hex[8];
      std::snprintf(hex, sizeof hex, "\\x%02X", c);
      out += hex;
    }
  }
  if (bytes.size() > kPreviewChars) out += "...";
  return out + "\"";
}

const char* kind_name(Kind kind) {
  switch (kind) {
    case Kind::string:
      return "string";
    case Kind::block:
      return "memory block";
    case Kind::array:
      return "string array";
    case Kind::exception:
      return "exception";
  }
  return "object";
}

}  // namespace

void HostState::count_call(std::string_view service) {
  auto it = call_counts.find(service);
  if (it == call_counts.end()) it = call_counts.emplace(std::string(service), 0).first;
  ++it->second;
}

HostObject* HostState::make(Kind kind, const char* made_by) {
  auto object = std::make_unique<HostObject>();
  HostObject* o = object.get();
  o->kind = kind;
  o->id = next_object_id++;
  o->thread = std::this_thread::get_id();
  o->made_by = made_by;
  objects.emplace(o, std::move(object));
  live.insert(o);
  return o;
}

HostObject* HostState::make_string(std::string_view bytes, std::uint32_t encoding,
                                   const char* made_by) {
  HostObject* o = make(Kind::string, made_by);
  o->bytes.assign(bytes);
  o->encoding = encoding;
  return o;
}

HostObject* HostState::check(const void* handle, const char* service) {
  if (!handle) {
    problem(std::string("null handle passed to ") + service);
    return nullptr;
  }
  auto it = objects.find(handle);
  if (it == objects.end()) {
    char text[160];
    std::snprintf(text, sizeof text, "unknown handle %p passed to %s", handle, service);
    problem(text);
    return nullptr;
  }
  HostObject* o = it->second.get();
  if (o->destroyed) {
    problem(describe(o) + " used after it was destroyed, by " + service);
    return nullptr;
  }
  return o;
}

HostObject* HostState::check(const void* handle, Kind kind, const char* service) {
  HostObject* o = check(handle, service);
  if (o && o->kind != kind) {
    problem(describe(o) + " passed to " + service + ", which wants a " + kind_name(kind));
    return nullptr;
  }
  return o;
}

void HostState::drop_ref(HostObject* o) {
  if (--o->refs == 0) destroy(o);
}

void HostState::destroy(HostObject* o) {
  o->destroyed = true;
  live.erase(o);
  if (config.bench) {
    // Freed at once, as a host frees it: no poisoning, no quarantine.
    std::vector<HostObject*> children;
    children.swap(o->items);
    if (o->message) children.push_back(o->message);
    objects.erase(o);
    for (HostObject* child : children) {
      if (child) drop_ref(child);
    }
    return;
  }
  std::memset(o->bytes.data(), 0xDD, o->bytes.size());
  if (o->size > kPoisonLimit) {
    o->data.reset();
  } else if (o->data) {
    std::memset(o->data.get(), 0xDD, static_cast<std::size_t>(o->size));
  }
  std::vector<HostObject*> children;
  children.swap(o->items);
  if (o->message) children.push_back(o->message);
  o->message = nullptr;
  for (HostObject* child : children) {
    if (child) drop_ref(child);
  }
  quarantine.push_back(o);
  while (quarantine.size() > kQuarantine) {
    objects.erase(quarantine.front());
    quarantine.pop_front();
  }
}

HostObject* HostState::make_exception(std::string_view class_name, std::string_view message) {
  HostObject* e = make(Kind::exception, "the host");
  e->class_name.assign(class_name);
  if (!message.empty()) e->message = make_string(message, text_encoding::kUTF8, "the host");
  return e;
}

void HostState::raise_pending(HostObject* exception) {
  ThreadState& t = this_thread();
  if (t.pending) drop_ref(t.pending);
  t.pending = exception;
}

std::string HostState::describe(const HostObject* o) const {
  std::string out = std::string(kind_name(o->kind)) + " #" + std::to_string(o->id);
  switch (o->kind) {
    case Kind::string:
      out += " " + preview(o->bytes) + " (" + encoding_label(o->encoding) + ")";
      break;
    case Kind::block:
      out += " (" + std::to_string(o->size) + " bytes)";
      break;
    case Kind::array:
      out += " (" + std::to_string(o->items.size()) + " items)";
      break;
    case Kind::exception:
      out += " " + o->class_name;
      break;
  }
  return out;
}

std::string HostState::read_utf8(const HostObject* s) const {
  if (!s) return {};
  if (auto text = convert_text(s->bytes, s->encoding, text_encoding::kUTF8)) return *text;
  return s->bytes;
}

RaisedException HostState::read_exception(const HostObject* o) const {
  return {o->class_name, read_utf8(o->message), o->error_number};
}

void HostState::mark_ledger() {
  ThreadState& t = this_thread();
  t.object_mark = next_object_id;
  t.record_mark = next_record_id;
  t.problems.clear();
}

std::string HostState::report_ledger() {
  ThreadState& t = this_thread();
  const auto self = std::this_thread::get_id();
  std::vector<std::string> lines = t.problems;
  std::vector<const HostObject*> alive;
  for (const HostObject* o : live) {
    if (o->thread == self && o->id >= t.object_mark) alive.push_back(o);
  }
  std::sort(alive.begin(), alive.end(), [](auto* a, auto* b) { return a->id < b->id; });
  for (const HostObject* o : alive) {
    lines.push_back(describe(o) + " still has " + std::to_string(o->refs) +
                    (o->refs == 1 ? " reference" : " references") + ", made by " + o->made_by +
                    (o == t.pending ? " (raised and still pending)" : ""));
  }
  for (std::uint64_t id : open_records) {
    const RecordInfo* r = &records.at(id);
    if (r->thread != self || id < t.record_mark) continue;
    lines.push_back("string-data record #" + std::to_string(id) + " (" +
                    encoding_label(r->encoding) + ", " + std::to_string(r->length) +
                    " bytes of string #" + std::to_string(r->string_id) + ") was never disposed");
  }
  std::string out;
  for (const std::string& line : lines) out += line + "\n";
  return out;
}

}  // namespace zul_host::detail
