#pragma once

#include "platform/Languages.h"

namespace platform {

/// The languages that the environment names: LANGUAGE, a list that counts unless the locale is C, then LC_ALL,
/// LC_MESSAGES and LANG. The C locale ends the list.
class LinuxLanguages : public Languages {
public:
    std::vector<std::string> preferredLanguages() const override;
};

} // namespace platform
