#include "host/QueryParser.h"

// Nesting is bounded, since both reading and answering go one call deeper a parenthesis. Only comparisons of like with
// like are taken, so that a slip of the pen is told and not answered with nothing.

#include "host/Characters.h"
#include "host/QueryDate.h"
#include "host/QueryScanner.h"

#include <charconv>
#include <utility>

namespace {

using Expression = std::optional<QueryExpression>;

constexpr int deepestNesting = 100;
constexpr std::string_view exampleOfDate = "$time.iso(\"2011-03-03T10:00:00Z\")";

struct SpelledOperator {
    std::string_view spelling;
    QueryOperator meaning;
};

/// Longer spellings stand before those that they begin with.
constexpr SpelledOperator spelledOperators[] {
    { "==", QueryOperator::equal },
    { "=", QueryOperator::equal },
    { "!=", QueryOperator::notEqual },
    { "<=", QueryOperator::lessOrEqual },
    { "<", QueryOperator::less },
    { ">=", QueryOperator::greaterOrEqual },
    { ">", QueryOperator::greater },
};

std::string textOf(std::string_view first, std::string_view second, std::string_view third = {})
{
    return std::string(first).append(second).append(third);
}

template <class Number> bool isWhole(std::string_view digits, Number& number, std::errc& error)
{
    const char* const end = digits.data() + digits.size();
    const std::from_chars_result result = std::from_chars(digits.data(), end, number);
    error = result.ec;
    return result.ptr == end;
}

class Parser {
public:
    explicit Parser(std::string_view text)
        : _words(text)
    {
    }

    Expression parse()
    {
        if (_words.isAtEnd()) {
            _words.fail(0, "the query is empty");
            return {};
        }
        Expression whole = alternatives(0);
        if (whole && !_words.isAtEnd())
            failBehind();
        return _words.problem() ? Expression() : std::move(whole);
    }

    const std::optional<QueryProblem>& problem() const { return _words.problem(); }

private:
    Expression alternatives(int depth) { return joined(QueryExpression::Kind::any, "||", depth); }

    /// Expressions with `word` between them; one alone stands for itself.
    Expression joined(QueryExpression::Kind kind, std::string_view word, int depth)
    {
        QueryExpression several { kind };
        do {
            Expression part
                = kind == QueryExpression::Kind::any ? joined(QueryExpression::Kind::all, "&&", depth) : term(depth);
            if (!part)
                return {};
            several.parts.push_back(*std::move(part));
        } while (_words.takes(word));
        if (several.parts.size() == 1)
            return std::move(several.parts.front());
        several.sortParts();
        return several;
    }

    Expression term(int depth)
    {
        bool isNegated = false;
        while (_words.takes("!"))
            isNegated = !isNegated;
        const std::size_t start = _words.offset();
        Expression inner = _words.takes("(") ? parenthesised(start, depth + 1) : comparison();
        if (inner)
            inner->isNegated = inner->isNegated != isNegated;
        return inner;
    }

    Expression parenthesised(std::size_t start, int depth)
    {
        if (depth > deepestNesting) {
            _words.fail(start, "more than " + std::to_string(deepestNesting) + " parentheses inside each other");
            return {};
        }
        Expression inner = alternatives(depth);
        if (!inner || _words.takes(")"))
            return inner;
        if (_words.isAtEnd())
            _words.fail(start, "this \"(\" is not closed");
        else
            failBehind();
        return {};
    }

    /// Says why a comparison cannot be followed by what stands next.
    void failBehind()
    {
        const std::size_t start = _words.offset();
        if (_words.takes(")"))
            _words.fail(start, "this \")\" closes nothing");
        else
            _words.fail(start, "&& or || is missing here");
    }

    Expression comparison()
    {
        const MetadataAttribute* attribute = takeAttribute();
        if (!attribute)
            return {};
        const std::size_t start = _words.offset();
        const std::optional<QueryOperator> relation = takeOperator();
        if (!relation) {
            _words.fail(start, textOf("=, ==, !=, <, >, <= or >= is missing after ", attribute->name));
            return {};
        }
        const bool isEquality = *relation == QueryOperator::equal || *relation == QueryOperator::notEqual;
        if (attribute->kind == MetadataKind::text && !isEquality) {
            _words.fail(start, textOf(attribute->name, " is a text: only =, == and != compare it"));
            return {};
        }
        return takeValue({ attribute, *relation, {} });
    }

    const MetadataAttribute* takeAttribute()
    {
        const std::size_t start = _words.offset();
        const std::string_view name = _words.takeName();
        const MetadataAttribute* attribute = metadataAttributeNamed(name);
        if (name.empty())
            _words.fail(start, "the name of an attribute is missing here");
        else if (!attribute)
            _words.fail(start, textOf("unknown attribute \"", name, "\""));
        return attribute;
    }

    std::optional<QueryOperator> takeOperator()
    {
        for (const SpelledOperator& candidate : spelledOperators) {
            if (_words.takes(candidate.spelling))
                return candidate.meaning;
        }
        return std::nullopt;
    }

    Expression takeValue(QueryComparison comparison)
    {
        const MetadataAttribute& attribute = *comparison.attribute;
        if (attribute.kind == MetadataKind::text)
            return takeText(std::move(comparison));
        const std::optional<platform::Value> value
            = attribute.kind == MetadataKind::number ? takeNumber(attribute) : takeDate(attribute);
        if (!value)
            return {};
        comparison.value = *value;
        return QueryExpression { QueryExpression::Kind::comparison, false, std::move(comparison) };
    }

    Expression takeText(QueryComparison comparison)
    {
        if (!_words.isAtQuote()) {
            _words.fail(
                _words.offset(), textOf(comparison.attribute->name, " is a text: compare it with a text in quotes"));
            return {};
        }
        const std::optional<std::vector<char32_t>> elements = _words.takeQuoted();
        const std::optional<TextModifiers> modifiers = elements ? _words.takeModifiers() : std::nullopt;
        if (!modifiers)
            return {};
        comparison.value = TextPattern(*elements, *modifiers);
        return QueryExpression { QueryExpression::Kind::comparison, false, std::move(comparison) };
    }

    std::optional<platform::Value> takeNumber(const MetadataAttribute& attribute)
    {
        const std::size_t start = _words.offset();
        std::string_view digits = _words.takeNumber();
        if (digits.substr(0, 1) == "+" && digits.substr(1, 1) != "-")
            digits.remove_prefix(1);
        std::errc error {};
        std::int64_t integer = 0;
        if (isWhole(digits, integer, error) && error == std::errc())
            return platform::Value(integer);
        double real = 0;
        const bool isNumber = isWhole(digits, real, error) && digits.find_first_of("iInN") == std::string_view::npos;
        if (isNumber && error == std::errc())
            return platform::Value(real);
        if (isNumber && error == std::errc::result_out_of_range)
            _words.fail(start, "this number is too large or too small");
        else
            _words.fail(start, textOf(attribute.name, " is a number: compare it with a number, such as 1024 or 1.5"));
        return std::nullopt;
    }

    std::optional<platform::Value> takeDate(const MetadataAttribute& attribute)
    {
        const std::size_t start = _words.offset();
        if (!_words.takes("$time.iso") || !_words.takes("(")) {
            _words.fail(start, textOf(attribute.name, " is a date: compare it with ", exampleOfDate));
            return std::nullopt;
        }
        const std::optional<std::string> text = takeTextOfDate(start);
        if (!text)
            return std::nullopt;
        const std::optional<platform::Date> date = queryDate(*text);
        if (!date) {
            _words.fail(start, textOf("no date: write it as in ", exampleOfDate));
            return std::nullopt;
        }
        return platform::Value(*date);
    }

    /// What stands between the parentheses, quoted or not.
    std::optional<std::string> takeTextOfDate(std::size_t start)
    {
        std::optional<std::string> text;
        if (_words.isAtQuote()) {
            if (const std::optional<std::vector<char32_t>> quoted = _words.takeQuoted())
                text = asciiOf(*quoted);
        } else if (const std::optional<std::string_view> bare = _words.takeUpTo(')')) {
            text = std::string(bare->substr(0, bare->find_last_not_of(' ') + 1));
        }
        if (!_words.takes(")")) {
            _words.fail(start, textOf("no date: write it as in ", exampleOfDate));
            return std::nullopt;
        }
        return text;
    }

    /// The characters of a date, "?" for any that no date holds.
    static std::string asciiOf(const std::vector<char32_t>& characters)
    {
        std::string text;
        for (const char32_t character : characters)
            text.push_back(character < 0x80 ? static_cast<char>(character) : '?');
        return text;
    }

    QueryScanner _words;
};

std::size_t columnAt(std::string_view text, std::size_t offset)
{
    std::string_view before = text.substr(0, offset);
    std::size_t column = 1;
    for (; !before.empty(); ++column)
        takeCharacter(before);
    return column;
}

} // namespace

ParsedQuery parseQuery(std::string_view text)
{
    Parser parser(text);
    Expression expression = parser.parse();
    if (expression)
        return { std::move(expression), {} };
    const QueryProblem& problem = *parser.problem();
    return { std::nullopt, "column " + std::to_string(columnAt(text, problem.offset)) + ": " + problem.text };
}
