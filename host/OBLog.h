#pragma once

#include "host/OBExport.h"

#include <functional>
#include <string_view>

class OBMediaManager;

/// Logs one message at `level` (1 failures, 2 what an operator may want to know, 3 and above details) on behalf of
/// `sender`, which may be null. Goes to where the application sends logs; nowhere while there is no host. Any thread.
OB_EXPORT void OBLog(std::string_view message, int level, const OBMediaManager* sender);

/// Where an application sends logs. Called on any thread.
using OBLogSink = std::function<void(std::string_view message, int level, const OBMediaManager* sender)>;
