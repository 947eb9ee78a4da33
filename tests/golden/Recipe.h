#pragma once

#include <string>
#include <string_view>

namespace tests {

/// Makes the files that a recipe tells of below `root`, and dates all of them 2011-03-03T10:00:00Z. Answers the line
/// that it cannot follow, or nothing.
///
/// A recipe holds one item a line, each with the folders above it; what stands after " | " belongs to the item, and
/// \xHH is a byte:
///
///     folder PATH
///     project PATH                a folder with the marker of a project
///     event PATH                  a folder with the marker of an event
///     movie PATH | WIDTHxHEIGHT   a real movie, two seconds long
///     file PATH | BYTES           the bytes may be left out; \x0a ends a line
///     link PATH | TARGET
std::string makeLibrary(std::string_view recipe, const std::string& root);

} // namespace tests
