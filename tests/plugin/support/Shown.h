#pragma once

#include "platform/Text.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

// How a failed check shows what it compared.

namespace doctest {

template <> struct StringMaker<platform::Text> {
    static String convert(const platform::Text& text)
    {
        return text ? String(text.string().c_str()) : String("(absent)");
    }
};

template <> struct StringMaker<std::vector<std::string>> {
    static String convert(const std::vector<std::string>& lines)
    {
        std::string text = "[" + std::to_string(lines.size()) + "]";
        for (const std::string& line : lines)
            text += "\n  " + line;
        return String(text.c_str());
    }
};

} // namespace doctest
