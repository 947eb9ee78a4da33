#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// A movie as the program prints it.
struct PrintedMovie {
    std::string path;
    std::string attributes = "{}";

    std::string json() const
    {
        return R"({"mediaType":3,"name":"m","mediaSourceType":4,"sourcePluginIdentifier":"x","path":")" + path
            + R"(","aliasResolvedPath":")" + path + R"(","icon":null,"attributes":)" + attributes + "}";
    }
};

/// A group as the program prints it, with all that is in it.
struct PrintedGroup {
    std::string type;
    std::string name;
    std::string identifier;
    std::string path {}; ///< empty for none
    std::string attributes = "{}";
    std::vector<PrintedMovie> movies {};
    std::vector<PrintedGroup> children {};

    std::string json() const
    {
        std::string text = R"({"typeIdentifier":")" + type + R"(","name":")" + name + R"(","ID":")" + identifier
            + R"(","parentID":null,"icon":null,"path":)" + (path.empty() ? "null" : "\"" + path + "\"")
            + R"(,"modificationDate":null,"attributes":)" + attributes + R"(,"mediaObjects":[)";
        for (const PrintedMovie& movie : movies)
            text += (text.back() == '[' ? "" : ",") + movie.json();
        text += R"(],"childGroups":[)";
        for (const PrintedGroup& child : children)
            text += (text.back() == '[' ? "" : ",") + child.json();
        return text + "]}";
    }
};

inline PrintedGroup printedProject(const std::string& path, std::vector<PrintedMovie> movies = {})
{
    const std::string name = path.substr(path.rfind('/') + 1);
    return { "OBMontaroProjectGroupTypeIdentifier", name, path, path, "{}", std::move(movies), {} };
}

inline PrintedGroup printedEvent(const std::string& path, std::vector<PrintedMovie> movies = {})
{
    const std::string name = path.substr(path.rfind('/') + 1);
    return { "OBMontaroEventGroupTypeIdentifier", name, path, path, "{}", std::move(movies), {} };
}

inline PrintedGroup printedYear(const std::string& year, std::vector<PrintedGroup> events)
{
    return { "OBMontaroYearGroupTypeIdentifier", year, year, "", "{}", {}, std::move(events) };
}

inline PrintedGroup printedEvents(std::vector<PrintedGroup> years)
{
    return { "OBMontaroEventLibraryGroupTypeIdentifier", "Events", "Events", "", "{}", {}, std::move(years) };
}

inline PrintedGroup printedRoot(std::vector<PrintedGroup> children, std::vector<PrintedMovie> movies = {})
{
    return { "OBMontaroRootGroupTypeIdentifier", "Montaro", "Montaro", "", "{}", std::move(movies),
        std::move(children) };
}

} // namespace tests
