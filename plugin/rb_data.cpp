// rbData and the memory-block pointer routine shared with the result
// builders. The holder locks in its constructor and unlocks in its
// destructor; it never owns the bytes.
#include "plugin/rb_data.h"

#include "plugin/host_services.h"

namespace {

// "Operator_Convert() As Ptr" of the host's MemoryBlock class, asked for
// until it is found, then kept.
HostEntryCache<CacheKind::retry> myMemoryBlockGetPtr("Operator_Convert() As Ptr");

void* call_get_ptr(void* method, REALmemoryBlock block) {
  return reinterpret_cast<host_sig::MemoryBlockToPtr>(method)(reinterpret_cast<REALobject>(block));
}

}  // namespace

rbData::rbData(REALstring s) {
  if (!s) return;
  REALLockString(s);
  string_ = s;
  std::int64_t n = 0;
  data = REALGetStringContents(s, &n);
  length = data ? n : 0;
}

rbData::rbData(REALmemoryBlock m) {
  if (!m) return;
  REALLockObject(reinterpret_cast<REALobject>(m));
  object_ = m;
  const std::int64_t size = memory_block_size(m);
  auto* p = static_cast<const std::uint8_t*>(MyREALMemoryBlockGetPtr(m));
  if (!p) return;
  data = p;
  length = size < 0 ? 0 : size;
}

rbData::~rbData() {
  if (string_) REALUnlockString(string_);
  if (object_) REALUnlockObject(reinterpret_cast<REALobject>(object_));
  string_ = nullptr;
  object_ = nullptr;
  data = nullptr;
  length = 0;
}

std::int64_t memory_block_size(REALmemoryBlock block) {
  std::int64_t size = 0;
  if (REALGetPropValueInteger(reinterpret_cast<REALobject>(block), "Size", &size)) return size;
  return REALMemoryBlockGetSize(block);
}

void* MyREALMemoryBlockGetPtr(REALmemoryBlock block) {
  if (!block) return nullptr;
  // The conversion method is found on a small probe block (or on the block
  // itself when no probe can be made).
  void* method = myMemoryBlockGetPtr.get([&](const char* declaration) {
    REALmemoryBlock probe = REALNewMemoryBlockOriginal(4);
    REALobject target = reinterpret_cast<REALobject>(probe ? probe : block);
    void* found = REALLoadObjectMethod(target, declaration);
    if (probe) REALUnlockObject(reinterpret_cast<REALobject>(probe));
    return found;
  });
  if (method) return call_get_ptr(method, block);
  return REALMemoryBlockGetPtr(block);
}
