// The loaded library's own words, for the moment at which its workers have nothing to do.
#pragma once

#include <dlfcn.h>
#include <pthread.h>

#include <stdexcept>
#include <string>

namespace torture {

class IdleWorkers {
public:
    /// Of a library that is loaded already. Throws std::runtime_error when it lacks the words.
    explicit IdleWorkers(const std::string& library)
        : handle_(dlopen(library.c_str(), RTLD_NOW | RTLD_NOLOAD)),
          mutex_(symbol<pthread_mutex_t>("PlexorThreadMutex")),
          active_(symbol<unsigned int>("ActiveThreads")),
          queue_(dlsym(handle_, "__FIFO")),
          isEmpty_(reinterpret_cast<int (*)(void*)>(dlsym(handle_, "IsFifoEmpty"))) {}
    ~IdleWorkers() { dlclose(handle_); }
    IdleWorkers(const IdleWorkers&) = delete;
    IdleWorkers& operator=(const IdleWorkers&) = delete;

    bool areIdle() const {
        pthread_mutex_lock(mutex_);
        const bool idle = isEmpty_(queue_) != 0 && *active_ == 0;
        pthread_mutex_unlock(mutex_);
        return idle;
    }

    /// An exported name of the library.
    template <typename Symbol>
    Symbol* symbol(const char* name) const {
        void* address = handle_ != nullptr ? dlsym(handle_, name) : nullptr;
        if (address == nullptr) throw std::runtime_error(std::string("the library has no ") + name);
        return reinterpret_cast<Symbol*>(address);
    }

private:
    void* handle_;
    pthread_mutex_t* mutex_;
    unsigned int* active_;
    void* queue_;
    int (*isEmpty_)(void*);
};

}  // namespace torture
