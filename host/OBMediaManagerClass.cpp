#include "host/OBMediaManagerClass.h"

#include "host/OBMediaManager.h"

OBMediaManagerClass::~OBMediaManagerClass() = default;

bool OBMediaManagerClass::isManagedMediaSource() const
{
    return true;
}

platform::Value OBMediaManagerClass::supportedPasteboardTypes() const
{
    return platform::Value::List {};
}
