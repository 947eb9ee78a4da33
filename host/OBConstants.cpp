#include "host/OBConstants.h"

namespace {

constexpr OBTypeIdentifier rootGroup("OBMontaroRootGroupTypeIdentifier");
constexpr OBTypeIdentifier projectLibraryGroup("OBMontaroProjectLibraryGroupTypeIdentifier");
constexpr OBTypeIdentifier projectGroup("OBMontaroProjectGroupTypeIdentifier");
constexpr OBTypeIdentifier folderGroup("OBMontaroFolderGroupTypeIdentifier");
constexpr OBTypeIdentifier eventLibraryGroup("OBMontaroEventLibraryGroupTypeIdentifier");
constexpr OBTypeIdentifier eventGroup("OBMontaroEventGroupTypeIdentifier");
constexpr OBTypeIdentifier eventCalendarGroup("OBMontaroEventCalendarGroupTypeIdentifier");

} // namespace

constinit const OBTypeIdentifierRef OBMontaroRootGroupTypeIdentifier = &rootGroup;
constinit const OBTypeIdentifierRef OBMontaroProjectLibraryGroupTypeIdentifier = &projectLibraryGroup;
constinit const OBTypeIdentifierRef OBMontaroProjectGroupTypeIdentifier = &projectGroup;
constinit const OBTypeIdentifierRef OBMontaroFolderGroupTypeIdentifier = &folderGroup;
constinit const OBTypeIdentifierRef OBMontaroEventLibraryGroupTypeIdentifier = &eventLibraryGroup;
constinit const OBTypeIdentifierRef OBMontaroEventGroupTypeIdentifier = &eventGroup;
constinit const OBTypeIdentifierRef OBMontaroEventCalendarGroupTypeIdentifier = &eventCalendarGroup;
