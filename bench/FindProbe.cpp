#include "apps/common/NameSearch.h"
#include "host/OBConstants.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObjectList.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <random>
#include <string>
#include <string_view>
#include <vector>

// A search by name in a tree of a million clips, to one pass of memmem over the same names laid one after the other.
// Both run in turn, and the figure is the median of the ratios. The tree is made here through the host's public
// headers, shaped as a load shapes it: events below years, and the root's own list repeating every clip.

namespace {

constexpr std::size_t years = 10;
constexpr std::size_t eventsOfYear = 1000;
constexpr std::size_t clipsOfEvent = 100;
constexpr int rounds = 9;

using Random = std::mt19937;

std::string number(Random& random, int digits)
{
    std::string text(static_cast<std::size_t>(digits), '0');
    for (char& digit : text)
        digit = static_cast<char>('0' + random() % 10);
    return text;
}

/// What cameras call their files, and what people make of it.
std::string clipName(Random& random, bool withAccents)
{
    constexpr std::array<std::string_view, 10> places { "beach", "harbour", "garden", "Lake", "Old town", "kitchen",
        "Grandma", "mountain hut", "Birthday", "school yard" };
    constexpr std::array<std::string_view, 8> things { "sunrise", "walk", "dinner", "speech", "rain", "take", "dance",
        "b-roll" };
    const std::string place(places[random() % places.size()]);
    const std::string thing(things[random() % things.size()]);
    if (random() % 1000 == 0)
        return place + " sunset " + number(random, 2);
    const std::uint32_t percent = random() % 100;
    if (percent < 2 && withAccents)
        return "Fête à " + place + " – " + thing;
    if (percent < 10)
        return place + " " + thing + " " + number(random, 2);
    if (percent < 18)
        return "2026-" + number(random, 2) + "-" + number(random, 2) + " " + number(random, 2);
    return (percent < 26 ? "GX01" : "IMG_") + number(random, 4);
}

struct Library {
    OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    std::string names {}; ///< one after the other
    std::size_t clips = 0;
};

OBMediaGroupRef addGroup(Library& library, OBMediaGroup& parent, OBTypeIdentifierRef type, const std::string& name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    group->setID(name);
    parent.addChildGroup(group);
    library.names += name;
    return group;
}

void addClips(Library& library, OBMediaGroup& event, const std::shared_ptr<const OBMediaObjectKind>& kind,
    Random& random, bool withAccents)
{
    std::vector<std::string> fileNames;
    for (std::size_t clip = 0; clip < clipsOfEvent; ++clip) {
        const std::string name = clipName(random, withAccents);
        library.names += name;
        fileNames.push_back(name + ".mov");
    }
    std::vector<OBFileOfFolder> files;
    files.reserve(fileNames.size());
    for (const std::string& name : fileNames)
        files.push_back({ name, true });
    const std::string folder = "/Events/" + event.name().string() + "/Original Media";
    event.setMediaObjects(OBMediaObjectBatch::objects(kind, { folder, true }, files));
    library.clips += clipsOfEvent;
}

Library makeLibrary(bool withAccents)
{
    Library library;
    Random random(20260309);
    const auto kind = std::make_shared<OBMediaObjectKind>();
    library.root->setName("Montaro");
    const OBMediaGroupRef events = addGroup(library, *library.root, OBMontaroEventLibraryGroupTypeIdentifier, "Events");
    for (std::size_t year = 0; year < years; ++year) {
        const OBMediaGroupRef calendar
            = addGroup(library, *events, OBMontaroEventCalendarGroupTypeIdentifier, std::to_string(2026 - year));
        for (std::size_t event = 0; event < eventsOfYear; ++event) {
            const std::string name = "Event " + std::to_string(year) + "-" + std::to_string(event);
            addClips(library, *addGroup(library, *calendar, OBMontaroEventGroupTypeIdentifier, name), kind, random,
                withAccents);
        }
    }
    library.root->setMediaObjects(events->mediaObjects());
    return library;
}

double processorSeconds()
{
    struct timespec now { };
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

std::size_t countOf(std::string_view names, std::string_view needle)
{
    std::size_t count = 0;
    while (const void* at = ::memmem(names.data(), names.size(), needle.data(), needle.size())) {
        ++count;
        names.remove_prefix(static_cast<std::size_t>(static_cast<const char*>(at) - names.data()) + needle.size());
    }
    return count;
}

template <class Number> Number median(std::vector<Number> numbers)
{
    std::nth_element(numbers.begin(), numbers.begin() + numbers.size() / 2, numbers.end());
    return numbers[numbers.size() / 2];
}

/// Prints what a search for `text` costs, to a pass for `needle`, its longest word.
void measure(const Library& library, std::string_view text, std::string_view needle)
{
    std::vector<double> passes;
    std::vector<double> searches;
    std::vector<double> ratios;
    std::size_t occurrences = 0;
    std::size_t hits = 0;
    for (int round = 0; round < rounds; ++round) {
        const double start = processorSeconds();
        occurrences = countOf(library.names, needle);
        const double between = processorSeconds();
        hits = apps::findNames(library.root, apps::NameQuery(text)).hits.size();
        const double end = processorSeconds();
        passes.push_back(between - start);
        searches.push_back(end - between);
        ratios.push_back((end - between) / (between - start));
    }
    std::printf("{\"text\": \"%.*s\", \"hits\": %zu, \"occurrences\": %zu, \"passSeconds\": %.6f, \"searchSeconds\": "
                "%.6f, \"ratio\": %.2f}",
        static_cast<int>(text.size()), text.data(), hits, occurrences, median(passes), median(searches),
        median(ratios));
}

void measureLibrary(bool withAccents)
{
    const Library library = makeLibrary(withAccents);
    std::printf("{\"clips\": %zu, \"nameBytes\": %zu, \"withAccents\": %s, \"searches\": [\n ", library.clips,
        library.names.size(), withAccents ? "true" : "false");
    measure(library, "sunset", "sunset");
    std::printf(",\n ");
    measure(library, "SUN beach", "beach");
    std::printf(",\n ");
    measure(library, "nowhere", "nowhere");
    std::printf(",\n ");
    measure(library, "img", "IMG");
    std::printf("]}");
}

} // namespace

int main()
{
    std::printf("[");
    measureLibrary(false);
    std::printf(",\n");
    measureLibrary(true);
    std::printf("]\n");
    return 0;
}
