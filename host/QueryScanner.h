#pragma once

#include "host/TextPattern.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// What is wrong with a query, and where: how many bytes stand before.
struct QueryProblem {
    std::size_t offset = 0;
    std::string text;
};

/// Takes the words of a query's text one after the other. The first problem is kept, and nothing is taken after it.
class QueryScanner {
public:
    explicit QueryScanner(std::string_view text)
        : _text(text)
    {
    }

    const std::optional<QueryProblem>& problem() const { return _problem; }
    void fail(std::size_t offset, std::string text);

    /// Where the next word begins, white space skipped.
    std::size_t offset();
    bool isAtEnd();

    /// Takes `word` where it stands next.
    bool takes(std::string_view word);
    /// Takes letters, digits and low lines, of which there may be none.
    std::string_view takeName();
    /// Takes what may belong to a number: letters, digits, full stops and signs.
    std::string_view takeNumber();
    /// Takes everything up to `end`, which stays; absent where `end` does not come.
    std::optional<std::string_view> takeUpTo(char end);

    bool isAtQuote();
    /// Takes a text in quotes: characters, and wildcards unless a backslash stands before them. Absent, with a problem,
    /// where it does not end.
    std::optional<std::vector<char32_t>> takeQuoted();
    /// Takes the letters that follow a quoted text without a gap.
    std::optional<TextModifiers> takeModifiers();

private:
    const std::string_view _text;
    std::size_t _offset = 0;
    std::optional<QueryProblem> _problem {};
};
