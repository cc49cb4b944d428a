#include "OutputFolder.h"

#include "Volume.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <system_error>

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
    if (fs::exists(path, error) && !fs::is_directory(path, error))
        return badInput("'%s' is no folder", target.c_str());
    fs::create_directories(path.parent_path(), error);
    KpString pattern(0, "%s/.%s.XXXXXX", path.parent_path().c_str(), path.filename().c_str());
    if (!error && mkdtemp(pattern.data())) {
        working_ = pattern.c_str();
        fs::permissions(working_, fs::perms(0755), error);
        return KpResult();
    }
    return badInput("can't write to '%s': %s", target.c_str(), error ? error.message().c_str() : std::strerror(errno));
}

KpResult OutputFolder::publish()
{
    std::error_code error;
    if (!fs::exists(target_, error))
        fs::rename(working_, target_, error);
    else
        for (fs::directory_iterator entry(working_, error), end; !error && entry != end; entry.increment(error))
            fs::rename(entry->path(), fs::path(target_) / entry->path().filename(), error);
    if (error)
        return badInput("can't write to '%s': %s", target_.c_str(), error.message().c_str());
    return KpResult();
}
