#pragma once

#include "platform/Value.h"

#include <string>
#include <string_view>

namespace tests {

/// A real folder of its own that is removed, with all that is in it, when this object ends. Its path holds no link.
///
/// A failure to arrange ends the test program with a message: there is nothing to check then.
class TemporaryFolder {
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::string& path() const noexcept { return _path; }
    /// The absolute path of `relativePath` inside.
    std::string path(std::string_view relativePath) const;

    /// Each makes what it names, with the folders above it, and answers its absolute path.
    std::string folder(std::string_view relativePath) const;
    std::string file(std::string_view relativePath, std::string_view bytes = {}) const;
    std::string link(std::string_view relativePath, const std::string& target) const;
    std::string pipe(std::string_view relativePath) const;

private:
    std::string _path;
};

/// Makes the folder at the absolute `path`, with those above it.
void makeFolder(const std::string& path);

/// Writes the file at the absolute `path`, with the folders above it.
void writeFile(const std::string& path, std::string_view bytes);

/// Makes a symbolic link at the absolute `path`, with the folders above it; the target is stored as it is given.
void makeLink(const std::string& path, const std::string& target);

/// Sets when the item at `path`, links not followed, was last modified.
void setModificationDate(const std::string& path, platform::Date date);

/// Makes `levels` folders called `name`, each in the one before, below the absolute `path`, and answers the path of the
/// deepest, which may be longer than the system takes.
std::string makeNestedFolders(const std::string& path, const std::string& name, int levels);

/// Removes the item at `path`, with all that is in it, however deep.
void removeItem(const std::string& path);

} // namespace tests
