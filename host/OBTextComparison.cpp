#include "host/OBTextComparison.h"

#include "host/Characters.h"

namespace {

constexpr char32_t replacementCharacter = 0xFFFD;

char32_t takeComparedCharacter(std::string_view& text)
{
    const char32_t character = takeCharacter(text);
    return isForeignByte(character) ? replacementCharacter : withoutCase(character);
}

} // namespace

int OBCaseInsensitiveCompare(std::string_view left, std::string_view right)
{
    while (!left.empty() && !right.empty()) {
        const char32_t leftCharacter = takeComparedCharacter(left);
        const char32_t rightCharacter = takeComparedCharacter(right);
        if (leftCharacter != rightCharacter)
            return leftCharacter < rightCharacter ? -1 : 1;
    }
    return static_cast<int>(!left.empty()) - static_cast<int>(!right.empty());
}
