#include "tests/plugin/support/RecordText.h"

#include "host/OBMediaObject.h"

#include <sstream>

namespace tests {

namespace {

    using platform::Text;
    using platform::Value;

    std::string textOr(const Text& text)
    {
        return text ? text.string() : "-";
    }

    std::string shortType(OBTypeIdentifierRef type)
    {
        if (!type)
            return "-";
        std::string_view name = type->text();
        constexpr std::string_view start = "OBMontaro";
        constexpr std::string_view end = "GroupTypeIdentifier";
        if (name.starts_with(start))
            name.remove_prefix(start.size());
        if (name.ends_with(end))
            name.remove_suffix(end.size());
        return std::string(name);
    }

    std::string textOfValue(const Value& value)
    {
        std::ostringstream out;
        if (const bool* boolean = value.boolean())
            out << (*boolean ? "true" : "false");
        else if (const std::int64_t* integer = value.integer())
            out << *integer;
        else if (const double* real = value.real())
            out << *real << "r";
        else if (const Text* text = value.text())
            out << text->view();
        else if (const platform::Size* size = value.size())
            out << size->width << "x" << size->height;
        else if (const platform::Date* date = value.date())
            out << "@" << date->seconds;
        else
            out << "?";
        return out.str();
    }

    std::string textOfAttributes(const Value::Dictionary& attributes)
    {
        std::string text;
        for (const auto& [key, value] : attributes)
            text += (text.empty() ? "" : ", ") + key.string() + "=" + textOfValue(value);
        return "{" + text + "}";
    }

    std::string textOfDate(const std::optional<platform::Date>& date)
    {
        if (!date)
            return "undated";
        return *date == dateOfEverything ? "dated" : "@" + std::to_string(date->seconds);
    }

    std::string textOfObject(const OBMediaObject& object)
    {
        std::string text = "* " + textOr(object.name()) + " " + std::to_string(object.mediaType()) + "/"
            + std::to_string(object.mediaSourceType()) + " " + textOr(object.sourcePluginIdentifier())
            + " path=" + textOr(object.path());
        if (object.aliasResolvedPath() != object.path())
            text += " real=" + textOr(object.aliasResolvedPath());
        const OBImageRef icon = object.icon();
        return text + " icon=" + (icon ? textOr(icon->name()) : "-") + " " + textOfAttributes(object.attributes());
    }

    std::string indentation(std::size_t depth)
    {
        return std::string(depth * 2, ' ');
    }

} // namespace

std::string textOfObjects(const OBMediaObjectList& objects, std::size_t depth)
{
    std::string text;
    objects.visit([&](const OBMediaObject& object) {
        text += indentation(depth) + textOfObject(object) + "\n";
        return true;
    });
    return text;
}

std::string textOfGroup(const OBMediaGroup& group, std::size_t depth)
{
    const OBImageRef icon = group.icon();
    std::string text = indentation(depth) + shortType(group.typeIdentifier()) + " " + textOr(group.name())
        + " ID=" + textOr(group.ID()) + " parent=" + textOr(group.parentID())
        + " icon=" + (icon ? textOr(icon->name()) : "-") + " path=" + textOr(group.path()) + " "
        + textOfDate(group.modificationDate()) + " " + textOfAttributes(group.attributes()) + "\n";
    text += textOfObjects(group.ownMediaObjects(), depth + 1);
    for (const OBMediaGroupRef& child : group.childGroups())
        text += textOfGroup(*child, depth + 1);
    return text;
}

std::string childNames(const OBMediaGroup& group)
{
    std::string names;
    for (const OBMediaGroupRef& child : group.childGroups())
        names += (names.empty() ? "" : " ") + textOr(child->name());
    return names;
}

std::string objectNames(const OBMediaObjectList& objects)
{
    std::string names;
    objects.visit([&](const OBMediaObject& object) {
        names += (names.empty() ? "" : " ") + textOr(object.name());
        return true;
    });
    return names;
}

} // namespace tests
