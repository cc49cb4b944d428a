#pragma once

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>
#include <sys/resource.h>

namespace kplib::test {

/// A fresh folder, which goes at the end with all that is in it.
class TempFolder {
public:
    TempFolder()
    {
        char name[] = "/tmp/kplib-test-XXXXXX";
        path = mkdtemp(name);
    }
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;
    ~TempFolder()
    {
        std::error_code ignored;
        std::filesystem::remove_all(path, ignored);
    }

    std::string operator/(const std::string& name) const { return path + "/" + name; }
    std::string file(const std::string& name, const std::string& content = "x") const
    {
        std::ofstream(*this / name) << content;
        return *this / name;
    }
    std::string folder(const std::string& name) const
    {
        std::filesystem::create_directories(*this / name);
        return *this / name;
    }

    std::string path;
};

inline std::string contentOf(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), {});
}

inline std::set<std::string> namesIn(const std::string& folder)
{
    std::set<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        names.insert(entry.path().filename());
    return names;
}

/// Files that this process writes fail to grow beyond `bytes`, as on a full disk, until the limit is RLIM_INFINITY.
inline void setSizeLimit(rlim_t bytes)
{
    std::signal(SIGXFSZ, SIG_IGN);
    const rlimit limit{bytes, RLIM_INFINITY};
    setrlimit(RLIMIT_FSIZE, &limit);
}

}  // namespace kplib::test
