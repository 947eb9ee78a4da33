#pragma once

#include <new>

namespace platform {

/// A value with static storage that is never destroyed: threads that the end of the process does not join may still use
/// it.
template <class T> class Immortal {
public:
    Immortal() { new (_storage) T(); }
    Immortal(const Immortal&) = delete;
    Immortal& operator=(const Immortal&) = delete;

    T& operator*() { return *std::launder(reinterpret_cast<T*>(_storage)); }
    T* operator->() { return &**this; }

private:
    alignas(T) unsigned char _storage[sizeof(T)];
};

} // namespace platform
