// The host's string and string-array services. Strings hold bytes and an
// encoding tag; conversions go through convert_text. String-data records get
// a buffer of their own whose bytes are followed by non-zero filler, so a
// reader that wants a terminator must copy: the record's host data holds the
// record id and a marker, and each record must be disposed exactly once.
#include <cstring>

#include "host/host_impl.h"
#include "host/text_convert.h"

namespace zul_host::detail {

using namespace text_encoding;

namespace {

constexpr std::uint8_t kFiller = 0xA5;
constexpr std::size_t kFillerBytes = 4;

REALstring build_string(const void* data, std::int32_t length) {
  return serve<REALstring>("REALBuildString", nullptr, [&](HostState& h) -> REALstring {
    if (length < 0 || (!data && length > 0)) return nullptr;
    const std::string_view bytes(static_cast<const char*>(data), static_cast<std::size_t>(length));
    return reinterpret_cast<REALstring>(h.make_string(bytes, kUnknown, "REALBuildString"));
  });
}

REALstring build_string_with_encoding(const void* data, std::int32_t length,
                                      std::uint32_t encoding) {
  return serve<REALstring>("REALBuildStringWithEncoding", nullptr, [&](HostState& h) -> REALstring {
    if (length < 0 || (!data && length > 0)) return nullptr;
    const std::string_view bytes(static_cast<const char*>(data), static_cast<std::size_t>(length));
    return reinterpret_cast<REALstring>(
        h.make_string(bytes, encoding, "REALBuildStringWithEncoding"));
  });
}

void set_string_encoding(REALstring s, std::uint32_t encoding) {
  serve_void("REALSetStringEncoding", [&](HostState& h) {
    if (HostObject* o = h.check(s, Kind::string, "REALSetStringEncoding")) o->encoding = encoding;
  });
}

std::uint32_t get_string_encoding(REALstring s) {
  return serve<std::uint32_t>("REALGetStringEncoding", kUnknown,
                              [&](HostState& h) -> std::uint32_t {
                                HostObject* o = h.check(s, Kind::string, "REALGetStringEncoding");
                                return o ? o->encoding : kUnknown;
                              });
}

REALstring convert_string(REALstring s, std::uint32_t encoding) {
  return serve<REALstring>("REALConvertString", nullptr, [&](HostState& h) -> REALstring {
    if (!s) return nullptr;
    HostObject* o = h.check(s, Kind::string, "REALConvertString");
    if (!o) return nullptr;
    auto text = convert_text(o->bytes, o->encoding, encoding);
    if (!text) return nullptr;
    h.count_conversion(o->encoding, encoding);
    return reinterpret_cast<REALstring>(h.make_string(*text, encoding, "REALConvertString"));
  });
}

bool get_string_data(REALstring s, std::uint32_t encoding, REALstringData* record) {
  return serve<bool>("PluginGetStringData", false, [&](HostState& h) {
    if (!record) {
      h.problem("PluginGetStringData called without a record");
      return false;
    }
    std::memset(record, 0, sizeof *record);
    std::optional<std::string> text = std::string();
    std::uint64_t string_id = 0;
    if (s) {
      HostObject* o = h.check(s, Kind::string, "PluginGetStringData");
      if (!o) return false;
      text = convert_text(o->bytes, o->encoding, encoding);
      if (text) h.count_conversion(o->encoding, encoding);
      string_id = o->id;
    }
    if (!text) return false;
    const std::uint64_t id = h.next_record_id++;
    RecordInfo& info = h.records[id];
    h.open_records.insert(id);
    info.buffer = std::make_unique<std::uint8_t[]>(text->size() + kFillerBytes);
    std::memcpy(info.buffer.get(), text->data(), text->size());
    if (!text->empty()) std::memset(info.buffer.get() + text->size(), kFiller, kFillerBytes);
    info.thread = std::this_thread::get_id();
    info.string_id = string_id;
    info.encoding = encoding;
    info.length = text->size();
    record->data = info.buffer.get();
    record->length = text->size();
    record->host_data[0] = reinterpret_cast<void*>(static_cast<std::uintptr_t>(id));
    record->host_data[1] = reinterpret_cast<void*>(kRecordMagic);
    return true;
  });
}

void dispose_string_data(REALstringData* record) {
  serve_void("PluginDisposeStringData", [&](HostState& h) {
    if (!record) return h.problem("PluginDisposeStringData called without a record");
    if (reinterpret_cast<std::uintptr_t>(record->host_data[1]) != kRecordMagic) {
      return h.problem("PluginDisposeStringData called with a record the host never filled");
    }
    const auto id =
        static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(record->host_data[0]));
    auto it = h.records.find(id);
    if (it == h.records.end()) {
      return h.problem("string-data record #" + std::to_string(id) +
                       " disposed long after it was disposed");
    }
    if (it->second.disposed) {
      return h.problem("string-data record #" + std::to_string(id) + " (" +
                       encoding_label(it->second.encoding) + ") disposed twice");
    }
    it->second.disposed = true;
    h.open_records.erase(id);
    it->second.buffer.reset();
    if (h.config.bench) {
      h.records.erase(id);
      return;
    }
    h.disposed_records.push_back(id);
    while (h.disposed_records.size() > kQuarantine) {
      h.records.erase(h.disposed_records.front());
      h.disposed_records.pop_front();
    }
  });
}

REALarray create_array(std::int32_t element_type, std::int64_t upper_bound) {
  return serve<REALarray>(
      "RuntimeArrayCreateSingleDimBoundedArray", nullptr, [&](HostState& h) -> REALarray {
        if (element_type != kStringArrayElementType) {
          h.problem("RuntimeArrayCreateSingleDimBoundedArray: element type " +
                    std::to_string(element_type) + " is not the string type " +
                    std::to_string(kStringArrayElementType));
          return nullptr;
        }
        if (upper_bound < -1) return nullptr;
        HostObject* a = h.make(Kind::array, "RuntimeArrayCreateSingleDimBoundedArray");
        a->items.assign(static_cast<std::size_t>(upper_bound + 1), nullptr);
        return reinterpret_cast<REALarray>(a);
      });
}

std::int64_t array_ubound(REALarray a) {
  return serve<std::int64_t>("RuntimeUBound", -1, [&](HostState& h) -> std::int64_t {
    HostObject* o = h.check(a, Kind::array, "RuntimeUBound");
    return o ? static_cast<std::int64_t>(o->items.size()) - 1 : -1;
  });
}

void array_insert(REALarray a, std::int64_t index, REALstring s) {
  serve_void("string array insert", [&](HostState& h) {
    HostObject* o = h.check(a, Kind::array, "the string array insert function");
    if (!o) return;
    if (index < 0 || index > static_cast<std::int64_t>(o->items.size())) {
      return h.problem("string array #" + std::to_string(o->id) + ": insert at " +
                       std::to_string(index) + " outside 0.." + std::to_string(o->items.size()));
    }
    HostObject* item = nullptr;
    if (s && !(item = h.check(s, Kind::string, "the string array insert function"))) return;
    if (item) h.add_ref(item);
    o->items.insert(o->items.begin() + index, item);
  });
}

host_sig::StringArrayInsert string_array_insert_proc(REALarray a) {
  return serve<host_sig::StringArrayInsert>(
      "PluginStringArrayInsertProc", nullptr, [&](HostState& h) -> host_sig::StringArrayInsert {
        return h.check(a, Kind::array, "PluginStringArrayInsertProc") ? &array_insert : nullptr;
      });
}

}  // namespace

void* text_service(std::string_view name) {
  static const ServiceEntry kServices[] = {
      service<host_sig::BuildString>("REALBuildString", &build_string),
      service<host_sig::BuildStringWithEncoding>("REALBuildStringWithEncoding",
                                                 &build_string_with_encoding),
      service<host_sig::SetStringEncoding>("REALSetStringEncoding", &set_string_encoding),
      service<host_sig::ConvertString>("REALConvertString", &convert_string),
      service<host_sig::GetStringEncoding>("REALGetStringEncoding", &get_string_encoding),
      service<host_sig::GetStringData>("PluginGetStringData", &get_string_data),
      service<host_sig::DisposeStringData>("PluginDisposeStringData", &dispose_string_data),
      service<host_sig::CreateArray>("RuntimeArrayCreateSingleDimBoundedArray", &create_array),
      service<host_sig::ArrayUBound>("RuntimeUBound", &array_ubound),
      service<host_sig::StringArrayInsertProc>("PluginStringArrayInsertProc",
                                               &string_array_insert_proc),
  };
  for (const auto& [service, fn] : kServices) {
    if (service == name) return fn;
  }
  return nullptr;
}

}  // namespace zul_host::detail

namespace zul_host {

std::map<std::string, long> Host::conversions() const {
  std::lock_guard lock(impl_->mu);
  std::map<std::string, long> out;
  for (const auto& [from_to, count] : impl_->conversions) {
    out[encoding_label(from_to.first) + " to " + encoding_label(from_to.second)] += count;
  }
  return out;
}

}  // namespace zul_host
