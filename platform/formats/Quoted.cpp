#include "platform/formats/Quoted.h"

#include "platform/formats/Unicode.h"

namespace platform {
namespace {

    bool isControl(char32_t codePoint)
    {
        return codePoint < 0x20 || (codePoint >= 0x7F && codePoint < 0xA0);
    }

    bool breaksLine(char32_t codePoint)
    {
        return codePoint == 0x2028 || codePoint == 0x2029;
    }

} // namespace

std::string quoted(std::string_view text)
{
    constexpr std::size_t longest = 80;
    std::string result = "\"";
    while (!text.empty()) {
        const DecodedCharacter character = decodeCharacter(text);
        if (result.size() + character.length > longest) {
            result += "…";
            break;
        }
        if (character.isValid && !isControl(character.codePoint) && !breaksLine(character.codePoint))
            result.append(text.substr(0, character.length));
        else
            result += replacementCharacter;
        text.remove_prefix(character.length);
    }
    return result + '"';
}

} // namespace platform
