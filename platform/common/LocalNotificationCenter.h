#pragma once

#include "platform/Notifications.h"
#include "platform/ThreadSafety.h"

#include <memory>
#include <vector>

namespace platform {

/// A notification centre within this process.
///
/// An observer may add and remove observers, itself included, and post. One that is added while a notification is being
/// posted hears of the next.
class LocalNotificationCenter : public NotificationCenter {
public:
    LocalNotificationCenter();
    ~LocalNotificationCenter() override;

    Token addObserver(std::string_view name, const void* object, Handler handler) override;
    void removeObserver(Token token) override;
    void post(const Notification& notification) override;

private:
    struct Observer;

    Mutex _lock;
    std::vector<std::shared_ptr<Observer>> _observers GUARDED_BY(_lock); ///< in the order in which they were added
    Token _lastToken GUARDED_BY(_lock) = 0;
};

} // namespace platform
