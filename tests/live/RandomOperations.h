#pragma once

#include "tests/live/LiveMachine.h"
#include "tests/live/RandomPlaces.h"
#include "tests/live/UnseenChanges.h"

#include <cstdint>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// What happens to the disks of a machine while a tree is open: one operation after the other, drawn from the
/// seed, with a line in the log for each.
class RandomOperations {
public:
    /// `machine` outlives this object.
    explicit RandomOperations(LiveMachine& machine);
    ~RandomOperations();
    RandomOperations(const RandomOperations&) = delete;
    RandomOperations& operator=(const RandomOperations&) = delete;

    /// Performs one operation on the disks, or begins it: some go on while time passes.
    void perform();
    /// Some disks with some libraries, to begin with.
    void prepare();
    void makeEditor();

    /// Asks the application of the tree for a load, after a cancel at times.
    std::function<void(bool cancelsFirst)> load {};

    /// Any thread.
    void log(const std::string& line);
    const std::vector<std::string>& lines() const { return _lines; }

    UnseenChanges unseen {};
    bool preferenceChanged = false;
    bool editorWasMissing = false;

private:
    struct Operation {
        int weight;
        void (RandomOperations::*perform)();
    };
    static const std::vector<Operation>& operations();

    void makeLibrary();
    void makeProject();
    void makeEvent();
    void addFile();
    void makeFolder();
    void renameItem();
    void moveItem();
    void removeItem();
    void replaceItem();
    void makeLink();
    void closeFolder();
    void dateFolder();
    void hideNames();
    void mountOrUnmount();
    void dropReports();
    void askForLoad();
    void changePreference();
    void takeEditor();
    void rewriteFile();
    void failFolder();

    void performSlowly(std::vector<std::function<void()>> steps);
    void writeSlowly(const std::string& path, const std::string& text);
    void diskChanged(platform::PathChange::Kind kind, const std::string& path);
    void noteLinksThrough(const std::string& path);

    LiveMachine& _machine;
    Chance& _chance;
    LiveDisk& _disk;
    RandomPlaces _places;
    std::vector<std::uint64_t> _links {};
    std::set<std::string> _failing {};
    std::vector<std::string> _lines {};
    bool _mayBeUnseen = false;
};

} // namespace tests
