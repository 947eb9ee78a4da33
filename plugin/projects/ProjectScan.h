#pragma once

#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanFindings.h"
#include "plugin/ScanReport.h"

#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// What one scan of the project libraries carries through its folders.
struct ProjectScan {
    ScanReport report;
    MontaroFlatGroupList flatGroups;
    std::shared_ptr<const OBMediaObjectKind> movieKind;
    OBImageRef projectIcon;
    OBImageRef emptyProjectIcon;
};

/// What is in a project's folder of shared movies that is a movie, in listing order.
struct SharedMovies {
    explicit SharedMovies(const platform::Text& path)
        : project { path }
    {
    }
    SharedMovies(const SharedMovies&) = delete;
    SharedMovies& operator=(const SharedMovies&) = delete;
    SharedMovies(SharedMovies&&) = default;
    SharedMovies& operator=(SharedMovies&&) = default;

    OBFolderOfFiles project;
    platform::FolderListing listing {}; ///< where the folder was listed by itself
    std::vector<OBFileOfFolder> files {}; ///< names belong to the listing that they were taken from

    std::string folder() const { return platform::pathJoined(project.path, sharedItemsFolder); }

    template <class Items> void take(const ScanReport& report, const Items& items)
    {
        const std::string place = report.isObserved() ? folder() : std::string();
        if (items.size() != 0)
            report.found([&] { return findings::moviesFolder(place, items.size()); });
        files.reserve(items.size());
        for (std::size_t index = 0; index < items.size(); ++index) {
            const platform::FolderItem item = items[index];
            if (report.passes(rules::hasMovieExtension, item, place))
                files.push_back({ item.name, item.kind == platform::ItemKind::file });
        }
    }
};

/// The movies that were shared from `project`; none when the folder is missing.
SharedMovies sharedMoviesOfProject(OBMediaManager& manager, const ScanReport& report, const platform::Text& project);

/// The same for a project whose listing, that of its item in `library`, told them already.
SharedMovies sharedMoviesOfListedProject(const ScanReport& report, const platform::Text& project,
    const platform::FolderListing& library, const platform::FolderItem& item);
