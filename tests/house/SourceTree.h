#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

/// The files of this source tree, read as text.
namespace house {

/// One file: its path from the root of the tree, and its bytes.
struct SourceFile {
    std::string path;
    std::string text;
};

/// Every text file of the tree in order of path; without what is built, and without version control's own files.
std::vector<SourceFile> sourceFiles();

/// Whether the file is C++ code: a source or a header.
bool isCode(std::string_view path);

/// The number, from 1, of the line that holds the byte at `offset`.
std::size_t lineNumberAt(std::string_view text, std::size_t offset);

/// The lines joined, each on its own: what a failed check shows.
std::string joined(const std::vector<std::string>& lines);

} // namespace house
