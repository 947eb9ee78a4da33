#pragma once

namespace platform {

class Bundles;
class Calendar;
class Clock;
class Console;
class FileSystem;
class Languages;
class MainRunLoop;
class MetadataIndex;
class Movies;
class NotificationCenter;
class PathWatching;
class Preferences;
class Threads;
class Volumes;
class Workspace;

/// Everything this system asks of the machine it runs on, one reference a role.
///
/// The roles outlive whoever is handed this bundle, and every thread that was started through `threads`.
struct Platform {
    FileSystem& fileSystem;
    PathWatching& pathWatching;
    Volumes& volumes;
    Workspace& workspace;
    Preferences& preferences;
    MetadataIndex& metadataIndex;
    Movies& movies;
    NotificationCenter& notifications; ///< the process's default centre
    NotificationCenter& workspaceNotifications; ///< volumes mounted
    Clock& clock;
    Calendar& calendar;
    Threads& threads;
    MainRunLoop& mainRunLoop;
    Console& console;
    Bundles& bundles;
    Languages& languages;
};

} // namespace platform
