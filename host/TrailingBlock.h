#pragma once

#include <cstddef>
#include <new>

/// Memory that follows an object in the block that was allocated for it.
struct TrailingBytes {
    std::size_t size = 0;
    std::byte* begin = nullptr; ///< known once the block has been allocated
};

/// For `std::allocate_shared`: one block for an object, the counts of its owners, and what is to follow it, instead of
/// a block each. The object's constructor is told where its trailing bytes begin; they go with the object.
template <class T> class TrailingAllocator {
public:
    using value_type = T;

    /// `trailing` is used until the object has been constructed.
    explicit TrailingAllocator(TrailingBytes& trailing)
        : _trailing(&trailing)
    {
    }
    template <class Other>
    TrailingAllocator(const TrailingAllocator<Other>& other)
        : _trailing(other._trailing)
    {
    }

    T* allocate(std::size_t count)
    {
        static_assert(alignof(T) >= alignof(void*) && alignof(T) <= __STDCPP_DEFAULT_NEW_ALIGNMENT__);
        auto* memory = static_cast<std::byte*>(::operator new(count * sizeof(T) + _trailing->size));
        _trailing->begin = memory + count * sizeof(T);
        return reinterpret_cast<T*>(memory);
    }
    void deallocate(T* memory, std::size_t) { ::operator delete(memory); }

    template <class Other> friend class TrailingAllocator;
    template <class Other> friend bool operator==(const TrailingAllocator&, const TrailingAllocator<Other>&)
    {
        return true;
    }

private:
    TrailingBytes* _trailing;
};
