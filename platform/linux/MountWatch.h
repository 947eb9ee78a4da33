#pragma once

#include "platform/ThreadSafety.h"
#include "platform/linux/Descriptor.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <thread>

namespace platform {

/// Tells whoever asks of every change of the kernel's mount table. Any thread.
///
/// One thread waits for the kernel while anybody asks. No lock is held while a taker is called.
class MountWatch {
public:
    using Changed = std::function<void()>;

    /// Of the table that is open as `table`.
    explicit MountWatch(Descriptor table);
    MountWatch(const MountWatch&) = delete;
    MountWatch& operator=(const MountWatch&) = delete;

    /// The table of this process in `procFolder`; null when it cannot be opened.
    static std::shared_ptr<MountWatch> open(const std::string& procFolder);

    /// Calls `changed` on the waiting thread until the answer is destroyed, which waits for a call that is under way on
    /// another thread. Null when the thread has ended, which it does with its last taker, or none can be had.
    static std::shared_ptr<void> add(const std::shared_ptr<MountWatch>& watch, const Changed& changed);

private:
    std::uint64_t addTaker(const Changed& changed);
    void remove(std::uint64_t number);
    bool startThread(const std::shared_ptr<MountWatch>& self);
    void run();
    bool waitForChange();
    void tellAll();
    bool beginCall(std::uint64_t& number, Changed& changed);

    const Descriptor _table;
    const Descriptor _ending; ///< readable once the thread is to end
    Mutex _lock;
    Condition _takerHasReturned;
    std::map<std::uint64_t, Changed> _takers GUARDED_BY(_lock) {};
    std::uint64_t _lastNumber GUARDED_BY(_lock) = 0;
    bool _hasEnded GUARDED_BY(_lock) = false;
    std::uint64_t _called GUARDED_BY(_lock) = 0; ///< the taker that is being called, or 0
    std::thread::id _caller GUARDED_BY(_lock) {};
};

} // namespace platform
