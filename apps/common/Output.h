#pragma once

#include <string>
#include <string_view>

namespace apps {

/// Results on their way to a descriptor, collected in blocks of 64 KiB. What was not flushed is lost.
///
/// A reader that has gone away ends the process silently, as it ends every filter. One thread at a time.
class Output {
public:
    explicit Output(int descriptor);
    /// Appends to `text` instead, which outlives this object.
    explicit Output(std::string& text);
    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;

    void write(std::string_view bytes)
    {
        _block.append(bytes);
        if (_block.size() >= blockSize)
            flush();
    }
    void flush();
    /// Writes `bytes` without collecting them first.
    void writeThrough(std::string_view bytes);

    /// Why bytes were lost, in lower case; empty while none were. Nothing is written after the first failure.
    const std::string& problem() const { return _problem; }

private:
    static constexpr std::size_t blockSize = 64 * 1024;

    void writeAll(std::string_view bytes);

    const int _descriptor;
    std::string* const _text = nullptr;
    std::string _block;
    std::string _problem;
};

} // namespace apps
