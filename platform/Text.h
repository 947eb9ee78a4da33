#pragma once

#include <atomic>
#include <compare>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <new>
#include <string>
#include <string_view>
#include <utility>

namespace platform {

/// An immutable run of bytes that any number of records share; eight bytes where it is kept.
///
/// A large library repeats the same few folder paths in every record below them, so records hold this instead of
/// `std::string`. Names come from the disk: the bytes are usually, but need not be, UTF-8.
/// A default-constructed text is absent, which is not the same as empty. Any thread may copy and read.
class Text {
public:
    Text() noexcept = default;
    Text(std::string_view bytes);
    Text(const std::string& bytes)
        : Text(std::string_view(bytes))
    {
    }
    Text(const char* bytes)
        : Text(std::string_view(bytes))
    {
    }
    Text(const Text& other) noexcept
        : _block(other._block)
    {
        retain();
    }
    Text(Text&& other) noexcept
        : _block(std::exchange(other._block, nullptr))
    {
    }
    Text& operator=(const Text& other) noexcept
    {
        Text copy(other);
        std::swap(_block, copy._block);
        return *this;
    }
    Text& operator=(Text&& other) noexcept
    {
        std::swap(_block, other._block);
        return *this;
    }
    ~Text() { release(); }

    /// The parts one after the other, in one allocation.
    static Text joined(std::string_view first, std::string_view second, std::string_view third = {});

    bool isAbsent() const noexcept { return !_block; }
    explicit operator bool() const noexcept { return _block != nullptr; }

    /// The bytes; empty for an absent text. Valid while this text, or a copy of it, lives.
    std::string_view view() const noexcept
    {
        return _block ? std::string_view(_block->bytes(), _block->length) : std::string_view();
    }
    operator std::string_view() const noexcept { return view(); }
    std::string string() const { return std::string(view()); }
    std::size_t size() const noexcept { return _block ? _block->length : 0; }
    bool empty() const noexcept { return size() == 0; }

    /// Compares the bytes; an absent text equals only an absent one.
    friend bool operator==(const Text& left, const Text& right) noexcept
    {
        return left._block == right._block || (left._block && right._block && left.view() == right.view());
    }
    friend bool operator==(const Text& left, std::string_view right) noexcept
    {
        return left._block && left.view() == right;
    }
    friend bool operator==(const Text& left, const char* right) noexcept { return left == std::string_view(right); }

private:
    struct Block {
        std::atomic<std::uint32_t> owners;
        std::uint32_t length;
        char* bytes() noexcept { return reinterpret_cast<char*>(this + 1); }
        const char* bytes() const noexcept { return reinterpret_cast<const char*>(this + 1); }
    };

    static Block* allocate(std::size_t length)
    {
        void* memory = ::operator new(sizeof(Block) + length);
        return new (memory) Block { { 1 }, static_cast<std::uint32_t>(length) };
    }
    void retain() noexcept
    {
        if (_block)
            _block->owners.fetch_add(1, std::memory_order_relaxed);
    }
    void release() noexcept
    {
        if (_block && _block->owners.fetch_sub(1, std::memory_order_acq_rel) == 1)
            ::operator delete(_block);
    }

    Block* _block = nullptr;
};

inline Text::Text(std::string_view bytes)
    : _block(allocate(bytes.size()))
{
    if (!bytes.empty())
        std::memcpy(_block->bytes(), bytes.data(), bytes.size());
}

inline Text Text::joined(std::string_view first, std::string_view second, std::string_view third)
{
    Text result;
    result._block = allocate(first.size() + second.size() + third.size());
    char* end = result._block->bytes();
    for (std::string_view part : { first, second, third }) {
        if (!part.empty())
            std::memcpy(end, part.data(), part.size());
        end += part.size();
    }
    return result;
}

} // namespace platform
