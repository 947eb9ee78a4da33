#pragma once

#include "host/OBExport.h"

// The texts that this plug-in shares with the editor, with the framework and with other modules.

inline constexpr const char* OBMontaroPluginIdentifier = "org.ombrix.Montaro";
inline constexpr const char* MontaroBundleIdentifier = "org.ombrix.Montaro";
inline constexpr const char* MontaroPrefsPath = "~/Library/Preferences/org.ombrix.Montaro.plist";
inline constexpr const char* OBMontaroPrefsPath = MontaroPrefsPath;
inline constexpr const char* OBMontaro = "Montaro";

// Attributes of media objects.
inline constexpr const char* OBMontaroProjectPathKey = "Project Path";
inline constexpr const char* OBMontaroProjectFormatVersion = "Project Format Version";
inline constexpr const char* OBMontaroProjectRepresentative = "Project Representative";
inline constexpr const char* OBMontaroPluginKey = "OBMontaroPlugin";

// Pictures in the bundle.
inline constexpr const char* MontaroAppIconFile = "MontaroIcon";
inline constexpr const char* MontaroProjectIconFile = "MontaroProjectIcon";
inline constexpr const char* MontaroEventIconFile = "MontaroEventIcon";
inline constexpr const char* MontaroCalendarIconFile = "MontaroCalendarIcon";

inline constexpr const char* MontaroApplicationName = "Montaro";
inline constexpr const char* MontaroApplicationVersion = "10.0";

// The editor's folders, and the files by which it marks projects and events.
inline constexpr const char* MontaroEventsFolderName = "Montaro Events";
inline constexpr const char* MontaroProjectsFolderName = "Montaro Projects";
inline constexpr const char* MontaroEventIdentifierPathComponent = "CurrentVersion.mtrevent";
inline constexpr const char* MontaroProjectIdentifierPathComponent = "CurrentVersion.mtrproject";

// Attributes of event and year groups.
inline constexpr const char* OBMontaroEventCreationYear = "MontaroEventCreationYear";
inline constexpr const char* OBMontaroEventOldestClipDate = "MontaroEventOldestClipDate";
inline constexpr const char* OBMontaroEventNewestClipDate = "MontaroEventNewestClipDate";

// The plug-in's build, for whoever inspects its library.
extern "C" {
extern OB_EXPORT const double OBMBMontaroPluginVersionNumber;
extern OB_EXPORT const unsigned char OBMBMontaroPluginVersionString[];
}
