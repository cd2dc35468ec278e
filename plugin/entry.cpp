// REALPluginMain: the library's only exported symbol. The host calls it once,
// on its own thread, before anything else: it keeps the resolver, learns the
// host version, announces the interface version, seeds rand() in built
// applications, and registers the method table, as one module on hosts from
// 2013.0 up to (not including) 3000.0 and row by row on all others.
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>

#include "plugin/host_services.h"
#include "plugin/method_table.h"

// The one exported symbol: a DLL export on Windows, default visibility
// elsewhere (everything else is built hidden).
#if defined(_WIN32)
#define ZUL_EXPORT __declspec(dllexport)
#else
#define ZUL_EXPORT __attribute__((visibility("default")))
#endif

namespace {

constexpr char kModuleSuffix[] = "GlobalsZUL";
constexpr std::uint32_t kModuleFlag = 16;

int interface_version_for(double version) {
  if (version >= 2013.04) return 13;
  if (version >= 2013.03) return 12;
  if (version >= 2013.0) return 11;
  if (version >= 2012.0) return 10;
  return 9;
}

// Copies the table into one heap record. The record, its name and its rows
// belong to the host from then on and are never freed here. When any of the
// three cannot be allocated nothing is registered.
void register_module() {
  char name[100] = {};
  std::snprintf(name, sizeof name, "%s%s", gpartname, kModuleSuffix);
  auto* record = static_cast<ModuleRecord*>(std::calloc(1, sizeof(ModuleRecord)));
  if (!record) return;
  auto* rows =
      static_cast<GlobalMethodEntry*>(std::calloc(globalMethodCount, sizeof(GlobalMethodEntry)));
  if (!rows) {
    std::free(record);
    return;
  }
  record->name = strdup(name);
  if (!record->name) {
    std::free(rows);
    std::free(record);
    return;
  }
  for (std::size_t i = 0; i < globalMethodCount; ++i) {
    rows[i] = globalMethods[i];
    rows[i].flags |= kModuleFlag;
    rows[i].zero = 0;
  }
  record->methods = rows;
  record->method_count = globalMethodCount;
  record->interface_version = static_cast<std::uint32_t>(CurrentREALControlVersion);
  if (!REALRegisterModule(record)) {
    // No host took it: nothing was registered, and nothing is kept.
    std::free(record->name);
    std::free(rows);
    std::free(record);
  }
}

void register_each_method() {
  for (std::size_t i = 0; i < globalMethodCount; ++i) {
    // The host only reads the row; the table itself stays immutable.
    REALRegisterMethod(const_cast<GlobalMethodEntry*>(&globalMethods[i]));
  }
}

}  // namespace

extern "C" ZUL_EXPORT void REALPluginMain(REALResolver resolver) {
  gResolver = resolver;

  if (auto get_version = reinterpret_cast<host_sig::GetRBVersion>(resolver("REALGetRBVersion"))) {
    rbversion_rbversion = get_version();
  }
  CurrentREALControlVersion = interface_version_for(rbversion_rbversion);
  if (auto announce =
          reinterpret_cast<host_sig::RegisterPluginVersion>(resolver("RegisterPluginVersion"))) {
    announce(static_cast<std::int32_t>(CurrentREALControlVersion));
  }
  gpartname = "String";

  if (REALinRuntime()) std::srand(static_cast<unsigned>(std::time(nullptr)));

  const double v = rbversion_rbversion;
  if (v >= 2013.0 && v < 3000.0) {
    register_module();
  } else {
    register_each_method();
  }
}
