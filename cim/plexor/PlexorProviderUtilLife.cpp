// Which life of the provider a thread belongs to, and whether that life still stands.
#include "PlexorProviderUtilLife.h"

#include <dlfcn.h>
#include <pthread.h>

#include <atomic>

namespace {

pthread_mutex_t __LifeMutex = PTHREAD_MUTEX_INITIALIZER;
// Written under __LifeMutex, read without it.
std::atomic<unsigned int> __Life = 1;       // the present one
std::atomic<unsigned int> __EndedLife = 0;  // the latest that was asked to end

// The life that this thread belongs to; 0: whichever is present. Plain, so that nothing of it keeps
// the library mapped.
thread_local unsigned int __ThreadLife = 0;

}  // namespace

void BeginLife(void (*forget)()) {
    pthread_mutex_lock(&__LifeMutex);
    forget();
    ++__Life;
    pthread_mutex_unlock(&__LifeMutex);
}

unsigned int PresentLife() {
    return __Life;
}

LifeMember::LifeMember(When when) : before_(__ThreadLife) {
    const unsigned int present = __Life;
    if (when == When::kAlways || present > __EndedLife) __ThreadLife = present;
}

LifeMember::~LifeMember() {
    __ThreadLife = before_;
}

unsigned int OwnLife() {
    return __ThreadLife != 0 ? __ThreadLife : __Life.load();
}

void RequestStop() {
    pthread_mutex_lock(&__LifeMutex);
    __EndedLife = __Life.load();
    pthread_mutex_unlock(&__LifeMutex);
}

bool StopRequested() {
    return OwnLife() <= __EndedLife;
}

bool LifeIsOver() {
    return __ThreadLife != 0 && __ThreadLife != __Life;
}

LifeGuard::LifeGuard() {
    pthread_mutex_lock(&__LifeMutex);
    stands_ = !StopRequested();
    member_ = __ThreadLife != 0;
}

LifeGuard::~LifeGuard() {
    pthread_mutex_unlock(&__LifeMutex);
}

void KeepLibraryMapped() {
    Dl_info info;
    if (dladdr(reinterpret_cast<void*>(&KeepLibraryMapped), &info) == 0) return;
    dlopen(info.dli_fname, RTLD_NOW | RTLD_NOLOAD | RTLD_NODELETE);
}
