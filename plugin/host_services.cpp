// Wrappers around the host services, each with its own cache. Once-only
// caches keep a failed first look-up for the life of the process; retry
// caches ask again while the answer is null (the host may register those
// services late). Every wrapper returns a neutral value when its service is
// missing.
#include "plugin/host_services.h"

REALResolver gResolver = nullptr;
double rbversion_rbversion = 0.0;
int CurrentREALControlVersion = 9;
const char* gpartname = nullptr;

namespace {

using Once = HostEntryCache<CacheKind::once>;
using Retry = HostEntryCache<CacheKind::retry>;

Once in_runtime_cache("REALinRuntime");
Once register_module_cache("PluginRegisterModule");
Once register_method_cache("PluginRegisterMethod");
Once lock_string_cache("REALLockString");
Once unlock_string_cache("REALUnlockString");
Once string_cstring_cache("StringGetCString");
Once load_global_method_cache("REALLoadGlobalMethod");
Once lock_object_cache("REALLockObject");
Once unlock_object_cache("REALUnlockObject");
Retry get_prop_integer_cache("REALGetPropValueInteger");
Once block_size_cache("memoryBlockGetSize");
Once block_ptr_cache("memoryBlockGetPtr");
Retry new_block_cache("newMemoryBlock");
Once load_object_method_cache("REALLoadObjectMethod");
Once new_instance_cache("PluginNewInstance");
Once call_with_handler_cache("PluginCallFunctionWithExceptionHandler");
Retry set_prop_string_cache("REALSetPropValueString");
Retry set_prop_integer_cache("REALSetPropValueInteger");
Once raise_cache("RuntimeRaiseException");
Once build_string_cache("REALBuildString");
Once build_string_encoding_cache("REALBuildStringWithEncoding");
Once set_encoding_cache("REALSetStringEncoding");
Once convert_string_cache("REALConvertString");
Once get_encoding_cache("REALGetStringEncoding");
Once get_string_data_cache("PluginGetStringData");
Once dispose_string_data_cache("PluginDisposeStringData");
Once create_array_cache("RuntimeArrayCreateSingleDimBoundedArray");
Once ubound_cache("RuntimeUBound");
Retry insert_proc_cache("PluginStringArrayInsertProc");

// LenB is a host-language method, found through "REALLoadGlobalMethod" once.
Once lenb_cache("LenB( s as string ) as integer");

host_sig::LenB lenb() {
  return reinterpret_cast<host_sig::LenB>(lenb_cache.get(REALLoadFrameworkMethod));
}

}  // namespace

bool REALinRuntime() {
  auto fn = in_runtime_cache.as<host_sig::InRuntime>();
  return fn ? fn() : false;
}

bool REALRegisterModule(ModuleRecord* record) {
  auto fn = register_module_cache.as<host_sig::RegisterModule>();
  if (!fn) return false;
  fn(record);
  return true;
}

void REALRegisterMethod(GlobalMethodEntry* row) {
  if (auto fn = register_method_cache.as<host_sig::RegisterMethod>()) fn(row);
}

void REALLockString(REALstring s) {
  if (auto fn = lock_string_cache.as<host_sig::LockString>()) fn(s);
}

void REALUnlockString(REALstring s) {
  if (auto fn = unlock_string_cache.as<host_sig::LockString>()) fn(s);
}

const std::uint8_t* REALGetStringContents(REALstring s, std::int64_t* length) {
  *length = 0;
  auto cstring = string_cstring_cache.as<host_sig::StringGetCString>();
  if (!cstring) return nullptr;
  const char* bytes = cstring(s);
  if (!bytes) return nullptr;
  if (auto len = lenb()) *length = len(s);
  if (*length < 0) *length = 0;
  return reinterpret_cast<const std::uint8_t*>(bytes);
}

void* REALLoadFrameworkMethod(const char* declaration) {
  auto fn = load_global_method_cache.as<host_sig::LoadGlobalMethod>();
  return fn ? fn(nullptr, declaration) : nullptr;
}

REALstring originalREALBuildString(const void* data, std::int32_t length) {
  auto fn = build_string_cache.as<host_sig::BuildString>();
  return fn ? fn(data, length) : nullptr;
}

REALstring REALBuildStringWithEncoding(const void* data, std::int32_t length,
                                       std::uint32_t encoding) {
  auto fn = build_string_encoding_cache.as<host_sig::BuildStringWithEncoding>();
  return fn ? fn(data, length, encoding) : nullptr;
}

void REALSetStringEncoding(REALstring s, std::uint32_t encoding) {
  if (auto fn = set_encoding_cache.as<host_sig::SetStringEncoding>()) fn(s, encoding);
}

REALstring REALConvertString(REALstring s, std::uint32_t encoding) {
  auto fn = convert_string_cache.as<host_sig::ConvertString>();
  return fn ? fn(s, encoding) : nullptr;
}

std::uint32_t REALGetStringEncoding(REALstring s, bool* available) {
  auto fn = get_encoding_cache.as<host_sig::GetStringEncoding>();
  if (available) *available = fn != nullptr;
  return fn ? fn(s) : 0;
}

bool REALGetStringData(REALstring s, std::uint32_t encoding, REALstringData* out) {
  auto fn = get_string_data_cache.as<host_sig::GetStringData>();
  return fn ? fn(s, encoding, out) : false;
}

void REALDisposeStringData(REALstringData* record) {
  if (auto fn = dispose_string_data_cache.as<host_sig::DisposeStringData>()) fn(record);
}

void REALLockObject(REALobject o) {
  if (auto fn = lock_object_cache.as<host_sig::LockObject>()) fn(o);
}

void REALUnlockObject(REALobject o) {
  if (auto fn = unlock_object_cache.as<host_sig::LockObject>()) fn(o);
}

bool REALGetPropValueInteger(REALobject o, const char* property, std::int64_t* value) {
  auto fn = get_prop_integer_cache.as<host_sig::GetPropValueInteger>();
  return fn ? fn(o, property, value) : false;
}

void REALSetPropValueString(REALobject o, const char* property, REALstring value) {
  if (auto fn = set_prop_string_cache.as<host_sig::SetPropValueString>()) fn(o, property, value);
}

void REALSetPropValueInteger(REALobject o, const char* property, std::int64_t value) {
  if (auto fn = set_prop_integer_cache.as<host_sig::SetPropValueInteger>()) fn(o, property, value);
}

std::int64_t REALMemoryBlockGetSize(REALmemoryBlock m) {
  auto fn = block_size_cache.as<host_sig::MemoryBlockGetSize>();
  return fn ? fn(m) : 0;
}

void* REALMemoryBlockGetPtr(REALmemoryBlock m) {
  auto fn = block_ptr_cache.as<host_sig::MemoryBlockGetPtr>();
  return fn ? fn(m) : nullptr;
}

REALmemoryBlock REALNewMemoryBlockOriginal(std::int32_t size) {
  auto fn = new_block_cache.as<host_sig::NewMemoryBlock>();
  return fn ? fn(size) : nullptr;
}

void* REALLoadObjectMethod(REALobject o, const char* declaration) {
  auto fn = load_object_method_cache.as<host_sig::LoadObjectMethod>();
  return fn ? fn(o, declaration) : nullptr;
}

REALobject REALnewInstance(const char* class_name) {
  auto fn = new_instance_cache.as<host_sig::NewInstance>();
  return fn ? fn(class_name) : nullptr;
}

REALobject REALCallFunctionWithExceptionHandler(void (*function)(void*), void* arg) {
  if (auto fn = call_with_handler_cache.as<host_sig::CallWithExceptionHandler>()) {
    return fn(function, arg);
  }
  function(arg);
  return nullptr;
}

void REALRaiseException(REALobject exception) {
  if (auto fn = raise_cache.as<host_sig::RaiseException>()) fn(exception);
}

REALarray REALCreateArray(std::int32_t element_type, std::int64_t upper_bound) {
  auto fn = create_array_cache.as<host_sig::CreateArray>();
  return fn ? fn(element_type, upper_bound) : nullptr;
}

std::int64_t REALGetArrayUBound(REALarray array) {
  auto fn = ubound_cache.as<host_sig::ArrayUBound>();
  return fn ? fn(array) : 0;
}

void REALInsertArrayValueString(REALarray array, std::int64_t index, REALstring s) {
  auto proc = insert_proc_cache.as<host_sig::StringArrayInsertProc>();
  if (!proc) return;
  if (auto insert = proc(array)) insert(array, index, s);
}
