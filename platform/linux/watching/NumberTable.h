#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace platform {

/// A hash table of numbers that stand for records kept elsewhere: four bytes a place, of which at most seven in ten are
/// taken. 0 is no number. The caller knows each record's hash. One thread at a time.
class NumberTable {
public:
    std::size_t size() const noexcept { return _size; }

    /// The number whose record has `hash` and for which `isIt` answers true, or 0.
    template <class IsIt> std::uint32_t find(std::uint64_t hash, const IsIt& isIt) const
    {
        if (_places.empty())
            return 0;
        for (std::size_t place = hash & mask(); _places[place] != 0; place = (place + 1) & mask()) {
            if (isIt(_places[place]))
                return _places[place];
        }
        return 0;
    }

    template <class HashOf> void insert(std::uint32_t number, const HashOf& hashOf)
    {
        if ((_size + 1) * 10 > _places.size() * 7)
            grow(hashOf);
        put(number, hashOf(number));
        ++_size;
    }

    /// Takes `number`, which is in the table under the hash that it still has, out of it.
    template <class HashOf> void erase(std::uint32_t number, const HashOf& hashOf)
    {
        std::size_t hole = hashOf(number) & mask();
        while (_places[hole] != number)
            hole = (hole + 1) & mask();
        // What stands behind the hole moves up, unless it would come before the place where its search begins.
        for (std::size_t place = (hole + 1) & mask(); _places[place] != 0; place = (place + 1) & mask()) {
            const std::size_t home = hashOf(_places[place]) & mask();
            if (((place - home) & mask()) >= ((place - hole) & mask())) {
                _places[hole] = _places[place];
                hole = place;
            }
        }
        _places[hole] = 0;
        --_size;
    }

    /// Puts `after` where `before` stands; both have `hash`.
    void replace(std::uint64_t hash, std::uint32_t before, std::uint32_t after)
    {
        std::size_t place = hash & mask();
        while (_places[place] != before)
            place = (place + 1) & mask();
        _places[place] = after;
    }

private:
    std::size_t mask() const noexcept { return _places.size() - 1; }

    void put(std::uint32_t number, std::uint64_t hash)
    {
        std::size_t place = hash & mask();
        while (_places[place] != 0)
            place = (place + 1) & mask();
        _places[place] = number;
    }

    template <class HashOf> void grow(const HashOf& hashOf)
    {
        constexpr std::size_t fewest = 64;
        std::vector<std::uint32_t> before(_places.empty() ? fewest : _places.size() * 2);
        before.swap(_places);
        for (const std::uint32_t number : before) {
            if (number != 0)
                put(number, hashOf(number));
        }
    }

    std::vector<std::uint32_t> _places;
    std::size_t _size = 0;
};

} // namespace platform
