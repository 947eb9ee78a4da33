#pragma once

#include <string>
#include <string_view>

namespace platform {

/// Whether a component of `path` is "." or "..".
bool hasDotComponent(std::string_view path) noexcept;

/// Whether `path` is spelled as `lexicallyNormalised` spells it.
bool isLexicallyNormalised(std::string_view path) noexcept;

/// `path` with single slashes, without "." components and without a slash at its end; "/" stays, ".." stays, for what
/// it means depends on links.
std::string lexicallyNormalised(std::string_view path);

/// `path` made absolute by `folder`, normalised, each ".." taken together with the component before it. For paths that
/// a person wrote down, where "../x" means what the text says.
std::string lexicallyAbsolute(std::string_view path, std::string_view folder);

} // namespace platform
