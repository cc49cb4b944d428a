#include "Calls.h"
#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpDirectory.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpFilenameCollector.h>
#include <kplib/system/KpSysInfo.h>
#include <kplib/system/KpTmpDir.h>

#include <filesystem>
#include <vector>

namespace kplib::probe {

namespace {

std::uint64_t copied()
{
    return digestOf("copy");
}

void folder()
{
    std::filesystem::remove_all(pathOf("copy"));
    std::filesystem::create_directories(pathOf("folder/inner"));
    for (const char* name : {"folder/a.txt", "folder/b.txt", "folder/inner/c.txt"})
        put(name, name);
}

/// A copy too, which can be removed.
void folderAndCopy()
{
    folder();
    std::filesystem::copy(pathOf("folder"), pathOf("copy"), std::filesystem::copy_options::recursive);
}

Outcome scanNames()
{
    KpDArray<KpString> files, folders;
    if (!KpDirectory::scanSortedByName(pathOf("folder").c_str(), files, folders))
        return {};
    Digest digest;
    for (const auto* names : {&files, &folders}) {
        for (const KpString& name : *names)
            digest << name;
    }
    return digest;
}

Outcome scanTimes()
{
    std::vector<KpDirectory::FileInfo> infos;
    const long count = KpDirectory::scan(pathOf("folder").c_str(), infos);
    Digest digest;
    for (const KpDirectory::FileInfo& info : infos)
        digest << info.name;
    return digest << count;
}

Outcome collect()
{
    KpDArray<KpString> names;
    KpFilenameCollector::collect(names, "*.txt", pathOf("folder").c_str());
    Digest digest;
    for (const KpString& name : names)
        digest << name;
    return digest;
}

Outcome copyFolder()
{
    if (KpDirectory::copy(pathOf("folder").c_str(), pathOf("copy").c_str()) != 0)
        return {};
    return Digest() << true;
}

Outcome removeFolder()
{
    if (remove_dir(pathOf("copy").c_str()) != 0)
        return {};
    return Digest() << true;
}

Outcome temporaryFolder()
{
    KpTmpDir made(pathOf("temporary").c_str(), true, false);
    if (!made.doesExist() || made.remove() != 0)
        return {};
    return Digest() << true;
}

Outcome uniqueName()
{
    KpFilename name(pathOf("folder/a.txt").c_str());
    name.makeUnique();
    return Digest() << name;
}

Outcome placeOfNewFile()
{
    KpString dir("dated"), name;
    KpFilename::generateFilePath(dir, name, pathOf("copy").c_str(), true, false);
    if (dir.isEmpty())
        return {};
    const Exempt exempt;
    return Digest() << KpDirectory::isDirectory(dir);
}

Outcome freeSpace()
{
    if (KpDirectory::freeSpace(pathOf("folder").c_str()) < 0)
        return {};
    return Digest() << true;
}

Outcome processes()
{
    KpDArray<KpSysInfo::ProcessEntry> list;
    if (!KpSysInfo::process_list(list))
        return {};
    return Digest() << (list.size() > 0);
}

}  // namespace

Operations folderOperations()
{
    static constexpr const char* left = "entries that fail are left out, each with an error in the log";
    static constexpr Operation list[] = {
        {"names in a folder", scanNames, folder},
        {"times in a folder", scanTimes, folder, nullptr, "files whose times cannot be read are left out"},
        {"names that fit a pattern", collect, folder, nullptr, "what cannot be opened is no folder"},
        {"a folder copied", copyFolder, folder, copied, nullptr, left},
        {"a folder deleted", removeFolder, folderAndCopy, copied, nullptr, left},
        {"a temporary folder", temporaryFolder, folder},
        {"a unique name", uniqueName, folder, nullptr, "a file that cannot be asked does not exist"},
        {"a place for a new file", placeOfNewFile, folder},
        {"free space", freeSpace, folder},
        {"processes", processes},
    };
    return list;
}

}  // namespace kplib::probe
