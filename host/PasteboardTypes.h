#pragma once

#include "host/OBMediaObjectList.h"

#include <string>
#include <string_view>

/// The types under which every desktop program takes files.
inline constexpr std::string_view uriListType = "text/uri-list"; // RFC 2483
inline constexpr std::string_view copiedFilesType = "x-special/gnome-copied-files";
inline constexpr std::string_view plainTextType = "text/plain";

/// Files in those representations.
struct PasteboardFiles {
    std::string uriList {}; ///< one URI a line, each ended by CRLF
    std::string copiedFiles {}; ///< what is done with them, then one URI a line
    std::string plainText {}; ///< one path a line, bytes as they are

    bool empty() const { return uriList.empty(); }
    /// Adds the file of an object by its real path; nothing when it is gone.
    void add(const OBMediaObject& object);
};
