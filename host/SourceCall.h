#pragma once

#include <exception>
#include <string>

/// Makes a call of a source's own code, and answers what that threw, as a text; empty when it returned. What a source
/// throws ends one call and not the application.
template <class Call> std::string errorThrownBy(const Call& call)
{
    try {
        call();
    } catch (const std::exception& error) {
        const std::string text = error.what();
        return text.empty() ? "an error without a text" : text;
    } catch (...) {
        return "an unknown error";
    }
    return {};
}
