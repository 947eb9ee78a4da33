#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace platform {

class FolderListing;
class OpenFile;

/// The names that the `.hidden` of one folder lists, one a line: a convention of the desktop's file managers, which do
/// not show what is called so.
///
/// Lines end with a line feed, which the last may lack, and are compared byte by byte.
class HiddenNames {
public:
    /// The name of the file in its folder.
    static constexpr std::string_view fileName = ".hidden";
    /// More than this of a file is no list of the names in a folder: what lies beyond is not read.
    static constexpr std::size_t sizeAtMost = std::size_t { 16 } << 20;

    HiddenNames() = default;
    /// `text` is what the file holds; of a larger file, `sizeAtMost` and one byte more are enough.
    explicit HiddenNames(std::string text);
    /// Those in an open file.
    explicit HiddenNames(const OpenFile& file);

    bool empty() const noexcept { return _text.empty(); }
    /// Whether an item called `name` is not shown: listed here, or hidden by a full stop at its beginning.
    bool hide(std::string_view name) const;
    /// Tells each item of the folder's listing whether it is invisible.
    void applyTo(FolderListing& listing) const;

private:
    std::string _text;
};

} // namespace platform
