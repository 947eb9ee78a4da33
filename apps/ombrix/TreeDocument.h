#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ombrix {

/// A group in a tree that was printed as JSON. Texts are slices of the document, as they stand there.
struct DocumentGroup {
    std::size_t parent = 0; ///< of the root itself
    std::vector<std::pair<std::string_view, std::string_view>> facts {}; ///< all but the two lists
    std::vector<std::string_view> objects {}; ///< those set on the group itself
    std::vector<std::size_t> children {};

    /// The value under a key; "null" where there is none.
    std::string_view fact(std::string_view key) const;
};

/// A tree that was printed as JSON, cut into what two trees are compared by. Only documents of this program are read:
/// the values are not checked. Immutable but for the order in which it is looked at.
struct TreeDocument {
    std::shared_ptr<const std::string> bytes {};
    std::vector<DocumentGroup> groups {}; ///< the root first

    bool isTopLevelEventLibrary(std::size_t group) const;
};

/// The tree in a document; absent when the document is none. Takes as long as the document is, however deep the tree.
std::optional<TreeDocument> readTreeDocument(std::string bytes);

/// The value under `key` of the object that `value` is; "null" where there is none.
std::string_view memberOf(std::string_view value, std::string_view key);
/// The text that a JSON value is; empty for any other value.
std::string textOfValue(std::string_view value);

/// Puts the children of the root into the order of the source: by name, case ignored, the library of events last, ties
/// by ID; and the objects of the root into that of the children they stand for.
void sortAsSource(TreeDocument& tree);

} // namespace ombrix
