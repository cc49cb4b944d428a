#include "OutputFolder.h"

#include "../volume/Volume.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <system_error>
#include <vector>

namespace fs = std::filesystem;

OutputFolder::~OutputFolder()
{
    std::error_code ignored;
    if (!working_.empty())
        fs::remove_all(working_, ignored);
}

KpResult OutputFolder::open(const std::string& target)
{
    fs::path path = fs::absolute(target).lexically_normal();
    if (!path.has_filename())
        path = path.parent_path();
    target_ = path.string();
    std::error_code error;
    isInside_ = fs::exists(path, error);
    if (isInside_ && !fs::is_directory(path, error))
        return badInput("'%s' is no folder", target.c_str());
    fs::create_directories(path.parent_path(), error);
    const fs::path around = isInside_ ? path : path.parent_path();
    KpString pattern(0, "%s/.%s.XXXXXX", around.c_str(), path.filename().c_str());
    if (error || !mkdtemp(pattern.data()))
        return badInput("can't write to '%s': %s", target.c_str(),
                        error ? error.message().c_str() : std::strerror(errno));
    working_ = pattern.c_str();
    unfinished_.remember(working_);
    fs::permissions(working_, fs::perms(0755), error);
    return KpResult();
}

KpResult OutputFolder::publish()
{
    const Publishing publishing;
    std::error_code error;
    if (!isInside_) {
        fs::rename(working_, target_, error);
        isInside_ = bool(error);  // a folder that was made in the meantime is filled
    }
    KpResult result = isInside_ ? publishFiles() : KpResult();
    unfinished_.forget();
    if (result.isOk() && isInside_)
        fs::remove(working_, error);
    working_.clear();
    return result;
}

KpResult OutputFolder::publishFiles()
{
    std::error_code error;
    std::vector<fs::path> files;
    for (fs::directory_iterator entry(working_, error), end; !error && entry != end; entry.increment(error))
        files.push_back(entry->path());
    std::string problems = error ? ": " + error.message() : "";
    for (const fs::path& file : files) {
        const fs::path place = fs::path(target_) / file.filename();
        fs::rename(file, place, error);
        if (error)
            problems += (problems.empty() ? ": '" : ", '") + place.string() + "' (" + error.message() + ")";
    }
    if (problems.empty())
        return KpResult();
    return badInput("can't write to '%s'%s; what could not be moved lies in '%s'", target_.c_str(), problems.c_str(),
                    working_.c_str());
}
