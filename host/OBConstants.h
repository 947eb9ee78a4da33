#pragma once

#include "host/OBExport.h"

#include <string_view>

/// The tag of a kind of group. Compared by identity: two tags with equal texts are different tags.
class OB_EXPORT OBTypeIdentifier {
public:
    explicit constexpr OBTypeIdentifier(std::string_view text)
        : _text(text)
    {
    }
    OBTypeIdentifier(const OBTypeIdentifier&) = delete;
    OBTypeIdentifier& operator=(const OBTypeIdentifier&) = delete;

    /// What people and documents call it.
    std::string_view text() const { return _text; }

private:
    std::string_view _text;
};

/// How groups and their users name a tag: by its one instance; null is no tag.
using OBTypeIdentifierRef = const OBTypeIdentifier*;

/// The groups of the Montaro source.
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroRootGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroProjectLibraryGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroProjectGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroFolderGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroEventLibraryGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroEventGroupTypeIdentifier;
extern OB_EXPORT const OBTypeIdentifierRef OBMontaroEventCalendarGroupTypeIdentifier;

/// Attribute of a movie: its size as shown, in pixels.
inline constexpr std::string_view OBMediaObjectResolutionKey = "OBMediaObjectResolutionKey";
/// Attribute of a movie: its length in seconds.
inline constexpr std::string_view OBMediaObjectDurationKey = "OBMediaObjectDurationKey";

/// Attribute of an object that only stands for a movie which is an object itself.
inline constexpr std::string_view OBMediaObjectRepresentativeKey = "Project Representative";

/// Preferences that the maker's consumer applications share; a change there makes sources read theirs again.
inline constexpr std::string_view OBZunoPrefsPath = "~/Library/Preferences/org.ombrix.Zuno.plist";

/// The preferences domain of the host application itself.
inline constexpr std::string_view OBHostPreferencesDomain = "org.ombrix.browser";

/// Posted on the default notification centre, with the source as object, before it opens or reveals an item.
inline constexpr std::string_view OBWillOpenOrRevealInSourceNotification = "willOpenOrRevealInSourceNotification";

inline constexpr int OBMediaTypeMovie = 3; ///< media type of an object
inline constexpr int OBMediaSourceTypePlugin = 4; ///< media source type of an object
inline constexpr int OBMediaTypesMovies = 4; ///< what `mediaTypesSupported` answers for movies
inline constexpr int OBQueryRunModeLive = 4; ///< a query that keeps reporting after it has gathered

/// What the name of a bundle's folder ends with, behind a full stop.
inline constexpr std::string_view OBBundleExtension = "obplugin";

/// The version of the interface between this host and its plug-ins; a bundle names the range it was made for.
inline constexpr int OBHostInterfaceVersion = 1;
/// Grows when the interface gains something and keeps everything: it refuses no bundle.
inline constexpr int OBHostInterfaceMinorVersion = 1;
