#include "platform/linux/LinuxLanguages.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <string_view>

namespace platform {

namespace {

    std::string_view environmentValue(const char* name)
    {
        const char* value = std::getenv(name);
        return value ? std::string_view(value) : std::string_view();
    }

    // "de_AT.UTF-8@euro" speaks de_AT.
    std::string_view languageOfLocale(std::string_view locale)
    {
        return locale.substr(0, locale.find_first_of(".@"));
    }

    bool isPlain(std::string_view locale)
    {
        return locale == "C" || locale == "POSIX";
    }

    // A code becomes part of a file's name, so nothing else may pass.
    bool isCode(std::string_view language)
    {
        return !language.empty() && std::all_of(language.begin(), language.end(), [](char byte) {
            return (byte >= 'a' && byte <= 'z') || (byte >= 'A' && byte <= 'Z') || (byte >= '0' && byte <= '9')
                || byte == '_' || byte == '-';
        });
    }

    void appendOnce(std::vector<std::string>& languages, std::string_view language)
    {
        if (isCode(language) && std::find(languages.begin(), languages.end(), language) == languages.end())
            languages.emplace_back(language);
    }

    // False when the list ends here.
    bool appendLocale(std::vector<std::string>& languages, std::string_view locale)
    {
        const std::string_view language = languageOfLocale(locale);
        if (isPlain(language))
            return false;
        appendOnce(languages, language);
        appendOnce(languages, language.substr(0, language.find('_')));
        return true;
    }

} // namespace

std::vector<std::string> LinuxLanguages::preferredLanguages() const
{
    const std::array<std::string_view, 3> locales { environmentValue("LC_ALL"), environmentValue("LC_MESSAGES"),
        environmentValue("LANG") };
    const auto* locale = std::find_if(locales.begin(), locales.end(), [](auto value) { return !value.empty(); });
    if (locale != locales.end() && isPlain(*locale))
        return {};
    std::vector<std::string> languages;
    for (std::string_view list = environmentValue("LANGUAGE"); !list.empty();) {
        const std::string_view language = list.substr(0, list.find(':'));
        list.remove_prefix(std::min(list.size(), language.size() + 1));
        if (!appendLocale(languages, language))
            return languages;
    }
    for (const std::string_view value : locales) {
        if (!appendLocale(languages, value))
            break;
    }
    return languages;
}

} // namespace platform
