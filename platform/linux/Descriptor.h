#pragma once

#include <cerrno>
#include <utility>

#include <unistd.h>

namespace platform {

/// Owns a file descriptor and closes it when destroyed.
class Descriptor {
public:
    Descriptor() = default;
    explicit Descriptor(int number)
        : _number(number)
    {
    }
    Descriptor(Descriptor&& other) noexcept
        : _number(std::exchange(other._number, -1))
    {
    }
    Descriptor& operator=(Descriptor&& other) noexcept
    {
        std::swap(_number, other._number);
        return *this;
    }
    ~Descriptor()
    {
        if (_number >= 0)
            close(_number);
    }

    bool isOpen() const noexcept { return _number >= 0; }
    int number() const noexcept { return _number; }

private:
    int _number = -1;
};

/// The answer of a system call, made again for as long as signals interrupt it.
template <class Call> auto uninterrupted(const Call& call)
{
    for (;;) {
        const auto answer = call();
        if (answer != -1 || errno != EINTR)
            return answer;
    }
}

} // namespace platform
