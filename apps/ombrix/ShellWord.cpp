#include "apps/ombrix/ShellWord.h"

#include "apps/common/HostileNames.h"

namespace ombrix {
namespace {

    bool isPlain(char letter)
    {
        const bool isWord = (letter >= 'a' && letter <= 'z') || (letter >= 'A' && letter <= 'Z')
            || (letter >= '0' && letter <= '9') || static_cast<unsigned char>(letter) >= 0x80;
        return isWord || std::string_view("/._-+,:@%").find(letter) != std::string_view::npos;
    }

    bool isPlainWord(std::string_view text)
    {
        for (const char letter : text) {
            if (!isPlain(letter))
                return false;
        }
        return !text.empty();
    }

    void appendByte(std::string& word, char letter)
    {
        constexpr std::string_view digits = "01234567";
        const auto byte = static_cast<unsigned char>(letter);
        word += { '\\', digits[byte >> 6], digits[byte >> 3 & 7], digits[byte & 7] };
    }

    /// $'…' of bash and zsh, which can name every byte.
    std::string withEscapes(std::string_view text)
    {
        std::string word = "$'";
        for (const char letter : text) {
            if (isPlain(letter) && static_cast<unsigned char>(letter) < 0x80)
                word += letter;
            else
                appendByte(word, letter);
        }
        return word + "'";
    }

} // namespace

std::string shellWord(std::string_view text)
{
    if (apps::escapedText(text) != text)
        return withEscapes(text);
    if (isPlainWord(text))
        return std::string(text);
    std::string word = "'";
    for (const char letter : text) {
        if (letter == '\'')
            word += "'\\''";
        else
            word += letter;
    }
    return word + "'";
}

} // namespace ombrix
