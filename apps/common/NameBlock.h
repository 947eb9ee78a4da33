#pragma once

#include "apps/common/NameSearch.h"
#include "host/OBMediaObjectList.h"
#include "platform/formats/FoldedText.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace apps {

/// Folded names one after the other, until there are enough of them to be looked through at once. The lists that hold
/// the objects, and the query, outlive it. One thread at a time.
class NameBlock {
public:
    /// Whose name it is; a group's, unless it has an object or a batch.
    struct Owner {
        std::size_t group = 0;
        std::uint32_t position = 0; ///< as a hit has it; of a run, that of its first object
        OBMediaObjectRef object {}; ///< made by itself
        const OBMediaObjectBatch* batch = nullptr;
        std::size_t index = 0; ///< in the batch
        bool isOnlyHere = true; ///< no other list that is looked through is known to hold it
    };

    explicit NameBlock(const NameQuery& query);

    void addName(const Owner& owner, std::string_view name);
    /// Adds the names of the first `count` objects of a batch. Where they cannot be folded all at once, those that are
    /// not ASCII go to `strays`.
    void addRun(const Owner& owner, std::size_t count, NameBlock& strays);

    /// The hits among the names added so far, in the order in which they were added.
    std::vector<NameHit> takeHits();
    /// Whether a hit may stand in more than one list.
    bool mayRepeat() const { return _mayRepeat; }

private:
    /// One name, or the file names of a run; a zero byte, which no name holds, stands behind it.
    struct Piece {
        std::size_t start;
        std::size_t end;
        Owner owner;
        std::string_view fileNames; // of a run, unfolded
        std::size_t count; // of a run; 0 for one name
        std::size_t firstOther; // of a run: where its characters that are not ASCII begin among those of all
    };

    void moveStrays(const Owner& owner, std::string_view names, std::size_t start, NameBlock& strays);
    void endPiece(const Piece& piece);
    void search();
    std::optional<std::size_t> nextNeedle(std::size_t start) const;
    std::size_t takeOfRun(const Piece& run, std::size_t at);
    platform::FoldedCharacter otherBefore(
        const Piece& run, std::size_t platform::FoldedCharacter::*place, std::size_t position) const;
    void take(const Owner& owner, std::string_view folded);

    const NameQuery& _query;
    const std::string_view _needle;
    std::string _folded;
    std::vector<Piece> _pieces;
    std::vector<platform::FoldedCharacter> _others; // of all runs; their `end` counts within the file names of the run
    std::vector<NameHit> _hits;
    bool _mayRepeat = false;
};

} // namespace apps
