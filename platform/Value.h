#pragma once

#include "platform/Text.h"

#include <compare>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

namespace platform {

/// A point in time: whole seconds since 1970-01-01T00:00:00Z, and the nanoseconds (0 to 999,999,999) after them.
struct Date {
    std::int64_t seconds = 0;
    std::uint32_t nanoseconds = 0;

    friend constexpr auto operator<=>(const Date&, const Date&) = default;
};

/// Width and height, in points or pixels as its owner says.
struct Size {
    double width = 0;
    double height = 0;

    friend constexpr bool operator==(const Size&, const Size&) = default;
};

/// One value of an attribute, a property list or a string table: 24 bytes, immutable, cheap to copy.
///
/// Lists, dictionaries and data are shared by all copies of a value. Any thread may read.
class Value {
public:
    using List = std::vector<Value>;
    using Entry = std::pair<Text, Value>;
    /// In the order in which the entries were made; keys occur once.
    using Dictionary = std::vector<Entry>;
    /// Bytes that are no text, as property lists hold them.
    struct Data {
        Text bytes;
        friend bool operator==(const Data&, const Data&) = default;
    };
    /// What a value can be; the enumerators stand in the order of the alternatives.
    enum class Kind : std::uint8_t { null, boolean, integer, real, text, date, size, data, list, dictionary };

    Value() noexcept = default;
    Value(bool boolean) noexcept
        : _content(boolean)
    {
    }
    Value(int integer) noexcept
        : _content(std::int64_t { integer })
    {
    }
    Value(std::int64_t integer) noexcept
        : _content(integer)
    {
    }
    Value(double real) noexcept
        : _content(real)
    {
    }
    Value(Text text) noexcept
        : _content(std::move(text))
    {
    }
    Value(std::string_view text)
        : _content(Text(text))
    {
    }
    Value(const char* text)
        : _content(Text(text))
    {
    }
    Value(Date date) noexcept
        : _content(date)
    {
    }
    Value(Size size) noexcept
        : _content(size)
    {
    }
    Value(Data data) noexcept
        : _content(std::move(data))
    {
    }
    Value(List list)
        : _content(std::make_shared<const List>(std::move(list)))
    {
    }
    Value(Dictionary dictionary)
        : _content(std::make_shared<const Dictionary>(std::move(dictionary)))
    {
    }

    Kind kind() const noexcept { return static_cast<Kind>(_content.index()); }
    bool isNull() const noexcept { return kind() == Kind::null; }

    /// The content where the value is of that kind, else null. Valid while the value lives unchanged.
    const bool* boolean() const noexcept { return std::get_if<bool>(&_content); }
    const std::int64_t* integer() const noexcept { return std::get_if<std::int64_t>(&_content); }
    const double* real() const noexcept { return std::get_if<double>(&_content); }
    const Text* text() const noexcept { return std::get_if<Text>(&_content); }
    const Date* date() const noexcept { return std::get_if<Date>(&_content); }
    const Size* size() const noexcept { return std::get_if<Size>(&_content); }
    const Data* data() const noexcept { return std::get_if<Data>(&_content); }
    const List* list() const noexcept
    {
        const auto* shared = std::get_if<std::shared_ptr<const List>>(&_content);
        return shared ? shared->get() : nullptr;
    }
    const Dictionary* dictionary() const noexcept
    {
        const auto* shared = std::get_if<std::shared_ptr<const Dictionary>>(&_content);
        return shared ? shared->get() : nullptr;
    }

    /// The value under `key` where this is a dictionary that has it, else a null value.
    Value valueForKey(std::string_view key) const;

    /// Equal kinds with equal content; an integer never equals a real.
    friend bool operator==(const Value& left, const Value& right);

private:
    std::variant<std::monostate, bool, std::int64_t, double, Text, Date, Size, Data, std::shared_ptr<const List>,
        std::shared_ptr<const Dictionary>>
        _content;
};

inline Value Value::valueForKey(std::string_view key) const
{
    if (const Dictionary* entries = dictionary()) {
        for (const Entry& entry : *entries) {
            if (entry.first == key)
                return entry.second;
        }
    }
    return {};
}

inline bool operator==(const Value& left, const Value& right)
{
    if (left.kind() != right.kind())
        return false;
    if (const Value::List* list = left.list())
        return *list == *right.list();
    if (const Value::Dictionary* entries = left.dictionary())
        return *entries == *right.dictionary();
    return left._content == right._content;
}

} // namespace platform
