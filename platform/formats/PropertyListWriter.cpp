#include "platform/formats/PropertyList.h"

#include "platform/NumberText.h"
#include "platform/formats/Base64.h"
#include "platform/formats/Dates.h"
#include "platform/formats/Unicode.h"

#include <algorithm>

namespace platform {
namespace {

    bool isExcluded(char32_t codePoint)
    {
        const bool isControl = codePoint < 0x20 || (codePoint >= 0x7F && codePoint < 0xA0);
        return isControl || codePoint == 0xFFFE || codePoint == 0xFFFF;
    }

    void appendEscaped(std::string& xml, std::string_view text)
    {
        while (!text.empty()) {
            const DecodedCharacter character = decodeCharacter(text);
            const std::string_view bytes = text.substr(0, character.length);
            text.remove_prefix(character.length);
            switch (character.codePoint) {
            case '&':
                xml += "&amp;";
                break;
            case '<':
                xml += "&lt;";
                break;
            case '>':
                xml += "&gt;";
                break;
            case '\t':
                xml += "&#9;";
                break;
            case '\n':
                xml += "&#10;";
                break;
            case '\r':
                xml += "&#13;";
                break;
            default:
                xml += !character.isValid || isExcluded(character.codePoint) ? replacementCharacter : bytes;
            }
        }
    }

    /// Writes one value a call, and calls itself for what is inside; values are no deeper than what made them.
    class XmlWriter {
    public:
        std::string write(const Value& value)
        {
            _xml = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n";
            writeValue(value, 0);
            _xml += "</plist>\n";
            return std::move(_xml);
        }

    private:
        void writeValue(const Value& value, std::size_t level)
        {
            switch (value.kind()) {
            case Value::Kind::null:
                return;
            case Value::Kind::boolean:
                return writeLine(*value.boolean() ? "<true/>" : "<false/>", level);
            case Value::Kind::integer:
                return writeElement("integer", std::to_string(*value.integer()), level);
            case Value::Kind::real:
                return writeElement("real", numberText(*value.real()), level);
            case Value::Kind::text:
                return writeElement("string", value.text()->view(), level);
            case Value::Kind::date:
                return writeElement("date", DateText(*value.date(), DateText::Fraction::none).view(), level);
            case Value::Kind::size:
                return writeElement("string", sizeText(*value.size()), level);
            case Value::Kind::data:
                return writeElement("data", encodeBase64(value.data()->bytes), level);
            case Value::Kind::list:
                return writeList(*value.list(), level);
            case Value::Kind::dictionary:
                return writeDictionary(*value.dictionary(), level);
            }
        }

        void writeList(const Value::List& list, std::size_t level)
        {
            if (std::all_of(list.begin(), list.end(), [](const Value& item) { return item.isNull(); }))
                return writeLine("<array/>", level);
            writeLine("<array>", level);
            for (const Value& item : list)
                writeValue(item, level + 1);
            writeLine("</array>", level);
        }

        void writeDictionary(const Value::Dictionary& entries, std::size_t level)
        {
            if (std::all_of(entries.begin(), entries.end(), [](const auto& entry) { return entry.second.isNull(); }))
                return writeLine("<dict/>", level);
            writeLine("<dict>", level);
            for (const auto& [key, value] : entries) {
                if (value.isNull())
                    continue;
                writeElement("key", key, level + 1);
                writeValue(value, level + 1);
            }
            writeLine("</dict>", level);
        }

        void writeElement(std::string_view name, std::string_view content, std::size_t level)
        {
            _xml.append(level, '\t').append("<").append(name).append(">");
            appendEscaped(_xml, content);
            _xml.append("</").append(name).append(">\n");
        }

        void writeLine(std::string_view line, std::size_t level) { _xml.append(level, '\t').append(line).append("\n"); }

        static std::string sizeText(Size size)
        {
            return "{" + numberText(size.width) + ", " + numberText(size.height) + "}";
        }

        std::string _xml;
    };

} // namespace

std::string writeXmlPropertyList(const Value& value)
{
    return XmlWriter().write(value);
}

} // namespace platform
