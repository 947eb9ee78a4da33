#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>

namespace tests {

/// Draws that a seed decides: the same seed, the same draws, with every library. One thread at a time.
class Chance {
public:
    explicit Chance(std::uint64_t seed)
        : _state(seed)
    {
    }

    /// A number below `end`, which is not 0.
    std::size_t below(std::size_t end) { return static_cast<std::size_t>(next() % end); }
    bool oneIn(std::size_t count) { return below(count) == 0; }
    /// Up to `longest`; short times as often as long ones.
    std::chrono::nanoseconds time(std::chrono::nanoseconds longest)
    {
        const std::size_t scale = std::size_t { 1 } << below(12);
        const auto most = static_cast<std::size_t>(longest.count()) / scale;
        return std::chrono::nanoseconds(static_cast<std::int64_t>(below(most + 1)));
    }
    template <class List> auto& of(List& list) { return list[below(list.size())]; }

private:
    /// SplitMix64, by Sebastiano Vigna.
    std::uint64_t next()
    {
        _state += 0x9e3779b97f4a7c15U;
        std::uint64_t mixed = _state;
        mixed = (mixed ^ (mixed >> 30U)) * 0xbf58476d1ce4e5b9U;
        mixed = (mixed ^ (mixed >> 27U)) * 0x94d049bb133111ebU;
        return mixed ^ (mixed >> 31U);
    }

    std::uint64_t _state;
};

} // namespace tests
