#include "platform/common/LocalNotificationCenter.h"

#include <algorithm>
#include <atomic>
#include <utility>

namespace platform {

struct LocalNotificationCenter::Observer {
    const Token token;
    const Text name;
    const void* const object;
    const Handler handler;
    /// Set under the lock, asked before each call: whoever took the observer into account before it was removed must
    /// not call it afterwards.
    std::atomic<bool> isRemoved { false };

    Observer(Token newToken, std::string_view nameToHear, const void* objectToHear, Handler newHandler)
        : token(newToken)
        , name(nameToHear)
        , object(objectToHear)
        , handler(std::move(newHandler))
    {
    }

    bool hears(const Notification& notification) const
    {
        return name == notification.name && (!object || object == notification.object);
    }
};

LocalNotificationCenter::LocalNotificationCenter() = default;
LocalNotificationCenter::~LocalNotificationCenter() = default;

NotificationCenter::Token LocalNotificationCenter::addObserver(
    std::string_view name, const void* object, Handler handler)
{
    Locked guard(_lock);
    const Token token = ++_lastToken;
    _observers.push_back(std::make_shared<Observer>(token, name, object, std::move(handler)));
    return token;
}

void LocalNotificationCenter::removeObserver(Token token)
{
    // Outlives the lock, for a handler may own whatever ends with it.
    std::shared_ptr<Observer> removed;
    Locked guard(_lock);
    const auto found = std::find_if(_observers.begin(), _observers.end(),
        [token](const std::shared_ptr<Observer>& observer) { return observer->token == token; });
    if (found == _observers.end())
        return;
    removed = std::move(*found);
    removed->isRemoved = true;
    _observers.erase(found);
}

void LocalNotificationCenter::post(const Notification& notification)
{
    std::vector<std::shared_ptr<Observer>> hearing;
    {
        Locked guard(_lock);
        std::copy_if(_observers.begin(), _observers.end(), std::back_inserter(hearing),
            [&notification](const std::shared_ptr<Observer>& observer) { return observer->hears(notification); });
    }
    for (const std::shared_ptr<Observer>& observer : hearing) {
        if (!observer->isRemoved && observer->handler)
            observer->handler(notification);
    }
}

} // namespace platform
