#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string_view>

/// What the fuzzer calls with each input it makes up; defined by each target. Answers 0.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace fuzz {

inline std::string_view text(const std::uint8_t* data, std::size_t size)
{
    return { reinterpret_cast<const char*>(data), size };
}

/// Ends the program, which the fuzzer reports as a finding, when a promise is broken.
inline void expect(bool isKept)
{
    if (!isKept)
        std::abort();
}

/// A reason is one line.
inline void expectOneLine(std::string_view problem)
{
    expect(problem.find('\n') == std::string_view::npos);
}

} // namespace fuzz
