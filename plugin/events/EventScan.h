#pragma once

#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanReport.h"

/// What one scan of the event libraries carries through its folders.
struct EventScan {
    ScanReport report;
    MontaroFlatGroupList flatGroups;
};
