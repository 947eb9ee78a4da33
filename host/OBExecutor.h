#pragma once

#include <functional>

/// Where an application wants to be called: takes a call and runs it soon, on a thread of the application's choice,
/// such as that of its window. Calls handed over one after the other run in that order. May be called on any thread.
using OBExecutor = std::function<void(std::function<void()>)>;
