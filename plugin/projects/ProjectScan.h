#pragma once

#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanReport.h"

#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "platform/FileSystem.h"

#include <memory>
#include <vector>

/// What one scan of the project libraries carries through its folders.
struct ProjectScan {
    ScanReport report;
    MontaroFlatGroupList flatGroups;
    std::shared_ptr<const OBMediaObjectKind> movieKind;
    OBImageRef projectIcon;
    OBImageRef emptyProjectIcon;

    void addToFlatGroups(OBMediaGroupRef group)
    {
        flatGroups->update([&](OBMediaGroupList groups) { return groups.appending(std::move(group)); });
    }
};

/// The listing of a project's folder of shared movies, and which of its items are movies.
struct SharedMovies {
    platform::Text folder;
    platform::FolderListing listing;
    std::vector<OBFileOfFolder> files; ///< names belong to the listing
};

/// The movies that were shared from `project`, in listing order; none when the folder is missing.
SharedMovies sharedMoviesOfProject(OBMediaManager& manager, const ScanReport& report, const platform::Text& project);
