#pragma once

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <memory>
#include <utility>
#include <vector>

/// An immutable list that is cheap to copy and cheap to extend: `appending` answers a longer list and leaves this one
/// as it is, sharing its storage where that has room, so that building a list of n elements takes time in proportion to
/// n.
///
/// A list may be read on any thread while another thread makes a longer one from it.
template <class T> class OBSnapshotList {
public:
    using const_iterator = const T*;

    OBSnapshotList() = default;
    explicit OBSnapshotList(std::vector<T> elements)
        : _count(elements.size())
    {
        if (_count != 0)
            _storage = std::make_shared<Storage>(std::move(elements));
    }

    std::size_t size() const noexcept { return _count; }
    bool empty() const noexcept { return _count == 0; }
    const T& operator[](std::size_t index) const { return _storage->elements.data()[index]; }
    const_iterator begin() const noexcept { return _storage ? _storage->elements.data() : nullptr; }
    const_iterator end() const noexcept { return begin() + _count; }

    OBSnapshotList appending(T element) const
    {
        if (_storage && _storage->claim(_count)) {
            _storage->elements.push_back(std::move(element));
            return OBSnapshotList(_storage, _count + 1);
        }
        std::vector<T> copy;
        copy.reserve(std::max<std::size_t>(2, _count * 2));
        copy.assign(begin(), end());
        copy.push_back(std::move(element));
        return OBSnapshotList(std::move(copy));
    }

    OBSnapshotList appending(const OBSnapshotList& others) const
    {
        if (empty())
            return others;
        OBSnapshotList result = *this;
        for (const T& element : others)
            result = result.appending(element);
        return result;
    }

    /// Whether `other` is this very list, or a copy of it; lists made apart are not, whatever they hold.
    bool isSameAs(const OBSnapshotList& other) const noexcept
    {
        return _count == other._count && (_count == 0 || _storage == other._storage);
    }

    /// Whether nobody else holds this list, or one that shares its storage.
    bool isSoleOwner() const noexcept { return _storage && _storage.use_count() == 1; }

    std::vector<T> elements() const { return std::vector<T>(begin(), end()); }

private:
    struct Storage {
        explicit Storage(std::vector<T> initial)
            : used(initial.size())
            , elements(std::move(initial))
        {
        }
        /// Whether the caller may write the element at `count`: only the longest list may, once, and only into room
        /// that is there, since readers of shorter lists hold on to the addresses.
        bool claim(std::size_t count)
        {
            return count < elements.capacity() && used.compare_exchange_strong(count, count + 1);
        }

        std::atomic<std::size_t> used;
        std::vector<T> elements;
    };

    OBSnapshotList(std::shared_ptr<Storage> storage, std::size_t count)
        : _storage(std::move(storage))
        , _count(count)
    {
    }

    std::shared_ptr<Storage> _storage;
    std::size_t _count = 0;
};
