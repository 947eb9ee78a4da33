#pragma once

#include "platform/Preferences.h"

namespace platform {

class FileSystem;

/// Preferences as property lists below the home folder: `Library/Preferences/DOMAIN.plist`.
class FilePreferences : public Preferences {
public:
    /// `files`, which also knows the home folder, outlives this object.
    explicit FilePreferences(const FileSystem& files);

    PreferencesAnswer valuesOfDomain(std::string_view domain) const override;

private:
    const FileSystem& _files;
};

} // namespace platform
