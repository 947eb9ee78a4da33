#include "platform/formats/JsonShape.h"

#include "platform/formats/Quoted.h"
#include "platform/formats/Suggestion.h"

#include <algorithm>

namespace platform {
namespace {

    JsonTypes typesOf(JsonNode::Kind kind)
    {
        switch (kind) {
        case JsonNode::Kind::null:
            return JsonTypes::null;
        case JsonNode::Kind::boolean:
            return JsonTypes::boolean;
        case JsonNode::Kind::integer:
            return JsonTypes::integer;
        case JsonNode::Kind::real:
            return static_cast<JsonTypes>(
                static_cast<unsigned>(JsonTypes::number) & ~static_cast<unsigned>(JsonTypes::integer));
        case JsonNode::Kind::text:
            return JsonTypes::text;
        case JsonNode::Kind::list:
            return JsonTypes::list;
        case JsonNode::Kind::object:
            return JsonTypes::object;
        }
        return JsonTypes::null;
    }

    bool hasAll(JsonTypes types, JsonTypes wanted)
    {
        return (static_cast<unsigned>(types) & static_cast<unsigned>(wanted)) == static_cast<unsigned>(wanted);
    }

    std::string_view kindName(JsonNode::Kind kind)
    {
        constexpr std::string_view names[]
            = { "null", "true or false", "a whole number", "a number", "a text", "a list", "an object" };
        return names[static_cast<std::size_t>(kind)];
    }

    std::string typeNames(JsonTypes types)
    {
        struct Named {
            JsonTypes type;
            JsonNode::Kind kind;
        };
        constexpr Named named[] = { { JsonTypes::text, JsonNode::Kind::text },
            { JsonTypes::list, JsonNode::Kind::list }, { JsonTypes::object, JsonNode::Kind::object },
            { JsonTypes::boolean, JsonNode::Kind::boolean }, { JsonTypes::number, JsonNode::Kind::real },
            { JsonTypes::integer, JsonNode::Kind::integer }, { JsonTypes::null, JsonNode::Kind::null } };
        std::string names;
        for (const Named& each : named) {
            const bool isPartOfNumber = each.type == JsonTypes::integer && hasAll(types, JsonTypes::number);
            if (!hasAll(types, each.type) || isPartOfNumber)
                continue;
            if (!names.empty())
                names += " or ";
            names += kindName(each.kind);
        }
        return names;
    }

    std::string problemOnLine(int line, std::string_view what)
    {
        return std::to_string(line) + ": " + std::string(what);
    }

    std::string unknownKeyProblem(const JsonMember& member, std::span<const JsonKey> keys)
    {
        std::vector<std::string_view> names;
        for (const JsonKey& key : keys)
            names.push_back(key.name);
        std::string problem = "unknown key " + quoted(member.key);
        if (const auto suggestion = suggestionFor(member.key, names))
            problem += " (did you mean " + quoted(*suggestion) + "?)";
        return problemOnLine(member.line, problem);
    }

} // namespace

bool isOfTypes(const JsonNode& node, JsonTypes types) noexcept
{
    return hasAll(types, typesOf(node.kind));
}

std::string typeProblem(const JsonNode& node, JsonTypes types, std::string_view name)
{
    if (isOfTypes(node, types))
        return {};
    std::string problem(name);
    problem.append(" must be ").append(typeNames(types)).append(", not ").append(kindName(node.kind));
    return problemOnLine(node.line, problem);
}

std::string shapeProblem(const JsonNode& object, std::span<const JsonKey> keys, std::string_view name)
{
    std::string problem = typeProblem(object, JsonTypes::object, name);
    if (!problem.empty())
        return problem;
    for (const JsonMember& member : object.members) {
        const auto isMeant = [&](const JsonKey& key) { return key.name == member.key; };
        const auto key = std::find_if(keys.begin(), keys.end(), isMeant);
        if (key == keys.end())
            return unknownKeyProblem(member, keys);
        problem = typeProblem(member.value, key->types, "key " + quoted(member.key));
        if (!problem.empty())
            return problem;
    }
    for (const JsonKey& key : keys) {
        if (key.presence == JsonPresence::required && !object.member(key.name))
            return problemOnLine(object.line, "key " + quoted(key.name) + " is missing");
    }
    return {};
}

} // namespace platform
