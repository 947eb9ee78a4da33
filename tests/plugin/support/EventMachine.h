#pragma once

#include "tests/plugin/support/SourceMachine.h"

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace tests {

/// Noon of a day, in UTC: the same day, or at least the same year, wherever the tests run.
platform::Date noonOf(int year, unsigned month = 7, unsigned day = 1);

/// A machine for the events half. Its source tells when clips were recorded, of those that a test lists.
struct EventMachine : SourceMachine {
    EventMachine();
    ~EventMachine();

    LibraryBuilder events() const { return LibraryBuilder(disk.path("home/Movies/Montaro Events")); }
    LibraryBuilder bootEvents() const { return LibraryBuilder(disk.path("boot/Montaro Events")); }
    LibraryBuilder volumeEvents(const std::string& name) const;

    /// An event of the home's library, and a clip in it that was made at `date`.
    void clip(std::string_view event, std::string_view name, platform::Date date) const;
    /// The same at any event.
    static void datedClip(BundleBuilder event, std::string_view name, platform::Date date);
    /// A clip of the home's library without any date: a link that leads nowhere.
    void undatedClip(std::string_view event, std::string_view name) const;
    /// Dates folders, so that whole records can be compared; what was given to clips stays.
    void dateFolders() const;
    /// What the editor's user has chosen; a source reads it when it is made and when it is told to.
    void arrangeNewestFirst(bool isNewestFirst);

    /// The tree of the events, from a new source's first load.
    OBMediaGroupRef library();
    /// The same as text.
    std::string libraryText();
    /// The same in short.
    std::string libraryOutline() { return outline(library()); }

    /// Records as lines, with the home's library called EVENTS, and days in place of dates.
    std::string textOf(const OBMediaGroupRef& group) const;
    /// Years and their events with their clips: "2012: Trip(a b) Walk(c) | 2010: Old(d)".
    static std::string outline(const OBMediaGroupRef& library);
    /// What an event got from its clips: "2012, 2010-07-01 to 2012-07-01"; "-" for what is absent.
    static std::string yearAndDates(const OBMediaGroup& event);
    /// The names of the events in the flat list, separated by blanks.
    static std::string flatNames(OBMontaroPlugin& source);

    /// Called with the path of each clip before it is told when it was recorded. Set before a source scans; any thread.
    static std::function<void(std::string_view path)>& whenDateIsAsked();
    /// When clips were recorded, by their file names. Set before a source scans.
    static std::map<std::string, platform::Date, std::less<>>& recordedDates();
};

} // namespace tests
