// The test binaries cross-built for Linux target glibc 2.17, like the library
// they load. The C++ runtime they link registers thread_local destructors
// through __cxa_thread_atexit_impl, which glibc only has from 2.18 on, so
// the test binary brings its own: each thread keeps a list of destructors,
// run in reverse order of registration when the thread ends (a destructor
// that registers another one is run too: the key's destructor is called
// again while its value is set). The shipped library never needs this.
#include <pthread.h>

#include <cstdlib>

namespace {

struct registered {
  void (*destructor)(void*);
  void* object;
  registered* next;
};

pthread_key_t key;
pthread_once_t key_once = PTHREAD_ONCE_INIT;

void run_all(void* head) {
  for (auto* r = static_cast<registered*>(head); r != nullptr;) {
    registered* next = r->next;
    r->destructor(r->object);
    std::free(r);
    r = next;
  }
}

void make_key() { pthread_key_create(&key, run_all); }

}  // namespace

extern "C" int __cxa_thread_atexit_impl(void (*destructor)(void*), void* object, void*) {
  pthread_once(&key_once, make_key);
  auto* r = static_cast<registered*>(std::malloc(sizeof(registered)));
  if (r == nullptr) return -1;
  *r = {destructor, object, static_cast<registered*>(pthread_getspecific(key))};
  return pthread_setspecific(key, r);
}
