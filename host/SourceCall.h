#pragma once

#include <algorithm>
#include <exception>
#include <string>

/// Makes a call of a source's own code, and answers what that threw, on one line; empty when it returned. What a source
/// throws ends one call and not the application.
template <class Call> std::string errorThrownBy(const Call& call)
{
    try {
        call();
    } catch (const std::exception& error) {
        std::string text = error.what();
        std::replace_if(
            text.begin(), text.end(), [](unsigned char letter) { return letter < ' '; }, ' ');
        return text.empty() ? "an error without a text" : text;
    } catch (...) {
        return "an unknown error";
    }
    return {};
}
