#include <cstddef>
#include <cstdio>
#include <string>
#include <vector>

#include <dirent.h>

// The least that a C++ program can be and still list a library: what `ombrix tree` on a small one is held against.

namespace {

/// Every folder below, and how many entries there are in all.
std::size_t entriesBelow(const std::string& start)
{
    std::vector<std::string> folders { start };
    std::size_t entries = 0;
    while (!folders.empty()) {
        const std::string folder = std::move(folders.back());
        folders.pop_back();
        DIR* stream = ::opendir(folder.c_str());
        if (!stream)
            continue;
        while (const dirent* entry = ::readdir(stream)) {
            if (entry->d_name[0] == '.')
                continue;
            ++entries;
            if (entry->d_type == DT_DIR)
                folders.push_back(folder + "/" + static_cast<const char*>(entry->d_name));
        }
        ::closedir(stream);
    }
    return entries;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2) {
        std::fprintf(stderr, "usage: bare_list LIBRARY\n");
        return 2;
    }
    std::printf("%zu\n", entriesBelow(argv[1]));
    return 0;
}
