#pragma once

#include "host/OBMediaHost.h"
#include "tests/live/LiveMachine.h"
#include "tests/live/RandomOperations.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace tests {

/// A tree that an application leaves open on a machine while anything happens to the disks.
class LiveTree {
public:
    /// `machine` outlives this object.
    explicit LiveTree(LiveMachine& machine);
    ~LiveTree();
    LiveTree(const LiveTree&) = delete;
    LiveTree& operator=(const LiveTree&) = delete;

    /// Lets so many operations come, in bursts and at long intervals, until all is quiet; then answers what differs
    /// between the tree and a fresh load, which is empty when nothing does.
    std::string differenceAfter(int operations);
    /// What has happened, a line each.
    std::string history() const;

private:
    void prepare();
    void follow();
    void live(int operations);
    std::string difference();
    void load(OBMediaManager& manager);
    void reloadUnseen();
    std::shared_ptr<OBMediaManager> makeSource();
    OBMediaGroupRef freshTree();
    void tellVolumesInSearchOrder();
    void waitUntilQuiet();
    bool isAtRest();
    std::vector<std::string> foldersOfOneTree() const;

    LiveMachine& _machine;
    RandomOperations _operations;
    std::unique_ptr<OBMediaHost> _host;
    std::shared_ptr<OBMediaManager> _source {};
    OBObservation _observation {};
    OBObservation _following {};
    std::atomic<std::uint64_t> _publications { 0 };
    std::uint64_t _publicationsSeen = 0;
    std::vector<std::shared_ptr<OBMediaManager>> _freshSources {}; // the end of one would empty what all share
};

} // namespace tests
