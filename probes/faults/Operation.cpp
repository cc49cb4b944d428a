#include "Operation.h"

#include "Calls.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <unistd.h>

namespace kplib::probe {

std::string pathOf(const char* name)
{
    static const std::string folder = [] {
        const char* const place = std::getenv("TMPDIR");
        std::string made = std::string(place ? place : "/tmp") + "/faults-" + std::to_string(getpid());
        std::filesystem::create_directories(made);
        return made + "/";
    }();
    return folder + name;
}

void put(const char* name, const std::string& content)
{
    std::ofstream(pathOf(name), std::ios::binary) << content;
}

std::string contentOf(const std::string& path)
{
    const Exempt exempt;
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

std::uint64_t digestOf(const char* name)
{
    const std::filesystem::path path = pathOf(name);
    if (!exists(symlink_status(path)))
        return 0;
    if (!is_directory(path))
        return (Digest() << contentOf(path.string())).value();
    std::map<std::string, std::string> entries;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(path))
        entries[entry.path().string()] = entry.is_regular_file() ? contentOf(entry.path().string()) : "";
    Digest digest;
    for (const auto& [entry, content] : entries)
        digest << entry << content;
    return digest.value();
}

}  // namespace kplib::probe
