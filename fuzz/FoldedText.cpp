#include "platform/formats/FoldedText.h"

#include "fuzz/FuzzTarget.h"
#include "platform/formats/Unicode.h"

// Every way to fold a text gives the same, wherever it may be taken at all.
int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view text = fuzz::text(data, size);
    const std::string folded = platform::foldedText(text);
    if (platform::lengthOfValidPrefix(text) == text.size()) {
        fuzz::expect(platform::lengthOfValidPrefix(folded) == folded.size());
        fuzz::expect(platform::foldedText(folded) == folded);
    }

    const std::string_view before = "x ";
    std::string appended(before);
    platform::appendFolded(appended, text);
    fuzz::expect(appended == std::string(before) + folded);

    std::string ascii(before);
    fuzz::expect(platform::appendFoldedAscii(ascii, text) == (platform::lengthOfAsciiPrefix(text) == text.size()));
    fuzz::expect(ascii.size() == before.size() + text.size());

    std::string oneByOne(before);
    std::vector<platform::FoldedCharacter> others;
    const bool isSimple = platform::appendFoldedOneByOne(oneByOne, text, others);
    fuzz::expect(oneByOne == (isSimple ? appended : before));
    fuzz::expect(isSimple || others.empty());
    for (const platform::FoldedCharacter& other : others)
        fuzz::expect(other.end <= text.size() && other.foldedEnd <= oneByOne.size());

    for (std::size_t position = 0; position <= folded.size(); ++position)
        platform::wordMayBeginAt(folded, position);
    return 0;
}
