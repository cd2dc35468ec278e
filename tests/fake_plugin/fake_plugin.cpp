// A tiny plug-in for the stand-in host's own tests. It registers a few
// functions, one of each argument and result type, and a few that misuse the
// host on purpose (a leak, a double release, an undisposed record) so the
// tests can prove that the host's ledger notices. It talks to the host only
// through the resolver, like any plug-in.
#include <cstdlib>
#include <cstring>
#include <initializer_list>

#include "plugin/host_types.h"

namespace {

REALResolver resolver = nullptr;

template <class Fn>
Fn service(const char* name) {
  return reinterpret_cast<Fn>(resolver(name));
}

REALstring echo(REALstring s) {
  if (s) service<host_sig::LockString>("REALLockString")(s);
  return s;
}

REALstring make(const char* text) {
  REALstring s = service<host_sig::BuildString>("REALBuildString")(
      text, static_cast<std::int32_t>(std::strlen(text)));
  service<host_sig::SetStringEncoding>("REALSetStringEncoding")(s, text_encoding::kUTF8);
  return s;
}

std::int64_t leak(REALstring) {
  make("leaked");
  return 1;
}

std::int64_t double_unlock(REALstring s) {
  service<host_sig::LockString>("REALUnlockString")(s);
  return 2;
}

std::int64_t keep_record(REALstring s) {
  REALstringData record;
  return service<host_sig::GetStringData>("PluginGetStringData")(s, text_encoding::kUTF8, &record)
             ? 3
             : 0;
}

bool raise(REALstring message) {
  REALobject e = service<host_sig::NewInstance>("PluginNewInstance")("RuntimeException");
  service<host_sig::SetPropValueString>("REALSetPropValueString")(e, "Message", message);
  service<host_sig::SetPropValueInteger>("REALSetPropValueInteger")(e, "ErrorNumber", 42);
  service<host_sig::RaiseException>("RuntimeRaiseException")(e);
  service<host_sig::LockObject>("REALUnlockObject")(e);
  return true;
}

// a + b (+1 when c) + the first byte at p + the size of m.
double sum(std::int64_t a, double b, signed char c, void* p, REALmemoryBlock m) {
  double total = static_cast<double>(a) + b + (c ? 1 : 0);
  if (p) total += *static_cast<unsigned char*>(p);
  if (m)
    total += static_cast<double>(service<host_sig::MemoryBlockGetSize>("memoryBlockGetSize")(m));
  return total;
}

REALarray split(REALstring s) {
  REALarray a = service<host_sig::CreateArray>("RuntimeArrayCreateSingleDimBoundedArray")(
      kStringArrayElementType, -1);
  auto insert = service<host_sig::StringArrayInsertProc>("PluginStringArrayInsertProc")(a);
  for (const char* part : {"one", "two"}) {
    REALstring item = make(part);
    insert(a, service<host_sig::ArrayUBound>("RuntimeUBound")(a) + 1, item);
    service<host_sig::LockString>("REALUnlockString")(item);
  }
  if (s) {
    service<host_sig::LockString>("REALLockString")(s);
    insert(a, 0, s);
    service<host_sig::LockString>("REALUnlockString")(s);
  }
  return a;
}

REALmemoryBlock block(std::int64_t size) {
  auto m = service<host_sig::NewMemoryBlock>("newMemoryBlock")(static_cast<std::int32_t>(size));
  if (m)
    std::memset(service<host_sig::MemoryBlockGetPtr>("memoryBlockGetPtr")(m), 'z',
                static_cast<std::size_t>(size));
  return m;
}

template <class Fn>
GlobalMethodEntry row(Fn* function, const char* declaration) {
  return {reinterpret_cast<void*>(function), nullptr, declaration, 4, 0, 0, nullptr};
}

GlobalMethodEntry rows[] = {
    row(&echo, "FakeEchoZUL(s as string) as string"),
    row(&leak, "FakeLeakZUL(s as string) as integer"),
    row(&double_unlock, "FakeDoubleUnlockZUL(s as string) as integer"),
    row(&keep_record, "FakeKeepRecordZUL(s as string) as integer"),
    row(&raise, "FakeRaiseZUL(message as string) as boolean"),
    row(&sum,
        "FakeSumZUL(a as integer, b as double, c as boolean, p as ptr, m as MemoryBlock) as "
        "double"),
    row(&split, "FakeSplitZUL(s as string) as string()"),
    row(&block, "FakeBlockZUL(size as integer) as memoryblock"),
};
constexpr std::size_t kRows = sizeof rows / sizeof rows[0];

}  // namespace

#if defined(_WIN32)
#define FAKE_EXPORT __declspec(dllexport)
#else
#define FAKE_EXPORT __attribute__((visibility("default")))
#endif

// Module path on hosts from 2013 on, row by row otherwise.
extern "C" FAKE_EXPORT void REALPluginMain(REALResolver r) {
  resolver = r;
  double version = 0;
  if (auto get = service<host_sig::GetRBVersion>("REALGetRBVersion")) version = get();
  if (auto announce = service<host_sig::RegisterPluginVersion>("RegisterPluginVersion"))
    announce(version >= 2013 ? 13 : 9);
  if (version >= 2013) {
    auto* record = static_cast<ModuleRecord*>(std::calloc(1, sizeof(ModuleRecord)));
    record->interface_version = 13;
    record->name = strdup("FakeModule");
    record->methods =
        static_cast<GlobalMethodEntry*>(std::calloc(kRows, sizeof(GlobalMethodEntry)));
    std::memcpy(record->methods, rows, sizeof rows);
    record->method_count = kRows;
    service<host_sig::RegisterModule>("PluginRegisterModule")(record);
  } else {
    for (GlobalMethodEntry& row : rows)
      service<host_sig::RegisterMethod>("PluginRegisterMethod")(&row);
  }
}
