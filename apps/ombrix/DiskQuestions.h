#pragma once

#include "platform/FileSystem.h"
#include "platform/PathWatching.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ombrix {

// Questions that may wait for a disk for ever. Each is asked in a process of its own, which is this program again, so
// that whoever asks goes on without an answer.

/// How long a disk is given to answer.
inline constexpr std::chrono::seconds untilSilent { 2 };

/// What is asked. The words that follow the first depend on it.
enum class DiskQuestion : std::uint8_t {
    volumes, ///< what is mounted
    source, ///< which folders and preferences the source reads
    editor,
    videos, ///< where the desktop keeps videos
    preferences, ///< of the domain that follows
    folder, ///< the state of the folder that follows
    count, ///< how many folders are at and below the folder that follows, and which may not be read
};

/// A question as words for the command line.
std::vector<std::string> wordsOf(DiskQuestion question, std::string_view about = {});
/// The question that words ask; absent when they ask none.
std::optional<std::pair<DiskQuestion, std::string>> questionOfWords(const std::vector<std::string>& words);

/// An answer as named texts, in order; absent when none came in time. Names may repeat. Texts are any bytes but zero.
using DiskAnswer = std::optional<std::vector<std::pair<std::string, std::string>>>;

/// Asks all at once, and waits until each has answered or its time is over.
using AskDisks = std::function<std::vector<DiskAnswer>(const std::vector<std::vector<std::string>>& questions)>;

/// An answer on its way from one process to the other, and back; absent when `bytes` are not whole.
std::string bytesOfAnswer(const std::vector<std::pair<std::string, std::string>>& answer);
DiskAnswer answerOfBytes(std::string_view bytes);

/// The text called `name` that came first; absent where there is none.
std::optional<std::string> textIn(const DiskAnswer& answer, std::string_view name);
/// All of them.
std::vector<std::string> textsIn(const DiskAnswer& answer, std::string_view name);

/// What is to be known of a folder that is searched, or of a volume.
struct FolderState {
    std::string path {};
    std::string name {}; ///< of a volume: what a person calls it
    bool isSilent = false; ///< its disk has not answered, and nothing else is known
    platform::FileProblem problem = platform::FileProblem::none;
    std::string blockedAt {}; ///< where reading it is not permitted: the folder that forbids it
    std::string realPath {};
    std::string fileSystem {}; ///< its type; empty where nothing is there
    bool isFit = false; ///< for the source's libraries
    platform::FollowingMeans means = platform::FollowingMeans::nothing;
    std::size_t timesSearched = 1; ///< of a folder that is searched: how often it is named
    std::optional<std::uint64_t> folders {}; ///< at and below it; absent where they have not been counted
    bool hasMore = false; ///< there was no time to count them all
    std::vector<std::string> closed {}; ///< of those, some that may not be read
    bool hasMoreClosed = false;

    bool isThere() const
    {
        return !isSilent && problem != platform::FileProblem::missing && problem != platform::FileProblem::notAFolder;
    }
};

std::vector<std::pair<std::string, std::string>> answerOfState(const FolderState& state);
/// The state of the folder that `asked` names, as it was answered; silent without an answer.
FolderState stateOfAnswer(const FolderState& asked, const DiskAnswer& answer);

} // namespace ombrix
