#pragma once

#include "platform/linux/Descriptor.h"
#include "tests/live/LiveDisk.h"

#include <map>

namespace tests {

/// Real files below a folder, which stands for the top of the disks.
class RealDisk : public LiveDisk {
public:
    /// `top` is absolute and holds no link.
    explicit RealDisk(std::string top);
    ~RealDisk() override;

    std::string systemPath(const std::string& path) const;

    std::optional<platform::ItemKind> kindOf(const std::string& path) const override;
    std::vector<Item> itemsIn(const std::string& path) const override;
    std::string linkTarget(const std::string& path) const override;
    std::string realPath(const std::string& path) const override;
    std::uint64_t numberOf(const std::string& path) override;
    std::string pathOf(std::uint64_t number) const override;

    bool makeFolder(const std::string& path) override;
    std::uint64_t beginFile(const std::string& path) override;
    void endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date) override;
    bool writeFile(const std::string& path, const std::string& text) override;
    bool makeLink(const std::string& path, const std::string& target) override;
    bool rename(const std::string& from, const std::string& to) override;
    bool remove(const std::string& path) override;
    bool setOpen(const std::string& path, bool isOpen) override;
    bool setModified(const std::string& path, platform::Date date) override;

    /// Whether somebody still writes to a file.
    bool isWriting() const { return !_written.empty(); }
    /// Renames a file in `folder` there and back until the kernel has had `reports` reports to make.
    void storm(const std::string& folder, std::uint64_t reports) const;

private:
    struct Key {
        std::uint64_t device = 0;
        std::uint64_t number = 0;
        platform::ItemKind kind = platform::ItemKind::file;

        friend bool operator==(const Key&, const Key&) = default;
    };
    struct Writing {
        platform::Descriptor file;
        std::string path;
    };

    static std::optional<Key> keyOf(const std::string& systemPath);
    std::string ownPath(const std::string& systemPath) const;
    void tell(platform::PathChange::Kind kind, const std::string& path) const;
    void tellContents(platform::PathChange::Kind kind, const std::string& path) const;

    const std::string _top;
    std::map<std::uint64_t, Key> _keys {}; // of the items that are found again
    std::map<std::uint64_t, Writing> _written {};
    std::uint64_t _last = 0;
};

} // namespace tests
