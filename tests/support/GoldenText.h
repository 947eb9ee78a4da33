#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace tests {

/// The bytes of a file; none where there is no such file.
std::string contentOf(const std::filesystem::path& path);

/// `text` with `to` in place of every `from`.
std::string replaced(std::string text, std::string_view from, std::string_view to);

/// A JSON document with its layout made uniform: one line a value, nothing else between values.
std::string uniformLayout(std::string_view json);

} // namespace tests
