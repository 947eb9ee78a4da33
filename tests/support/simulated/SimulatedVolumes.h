#pragma once

#include "platform/Volumes.h"
#include "tests/support/BareMachine.h"
#include "tests/support/simulated/SimulatedThreads.h"

#include <functional>
#include <map>
#include <memory>
#include <utility>

namespace tests {

/// Volumes that come and go; who follows that is told after a while, once for several changes at times.
class SimulatedVolumes : public ListedVolumes {
public:
    SimulatedVolumes(SimulatedThreads& threads, Chance& chance)
        : _threads(threads)
        , _chance(chance)
    {
    }

    /// The lists have changed.
    void listsChanged()
    {
        ++currentGeneration;
        for (const auto& [number, changed] : *_followers)
            _threads.after(_chance.time(std::chrono::seconds(2)), [followers = _followers, number = number] {
                if (const auto known = followers->find(number); known != followers->end())
                    known->second();
            });
    }

    std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const override
    {
        const SimulatedThreads::Undisturbed here;
        const int number = ++_last;
        _followers->emplace(number, changed);
        return std::shared_ptr<void>(nullptr, [followers = _followers, number](void*) { followers->erase(number); });
    }

private:
    using Followers = std::map<int, std::function<void()>>;

    SimulatedThreads& _threads;
    Chance& _chance;
    const std::shared_ptr<Followers> _followers = std::make_shared<Followers>();
    mutable int _last = 0;
};

} // namespace tests
