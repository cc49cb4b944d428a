#include "Operation.h"

#include <kplib/system/KpBuildInfo.h>
#include <kplib/system/KpCoder.h>
#include <kplib/system/KpDSO.h>
#include <kplib/system/KpDataBase.h>
#include <kplib/system/KpDirectory.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpFilenameCollector.h>
#include <kplib/system/KpMD5Coder.h>
#include <kplib/system/KpMD5List.h>
#include <kplib/system/KpOSInfo.h>
#include <kplib/system/KpSysInfo.h>
#include <kplib/system/KpTable.h>
#include <kplib/system/KpTmpDir.h>
#include <kplib/system/KpUUID.h>
#include <kplib/system/KpVersion.h>

#include <cstdio>
#include <cstring>
#include <vector>

namespace kplib::probe {

namespace {

void fill(const KpString& path)
{
    for (const char* name : {"a.txt", "b.txt", "c.dat"}) {
        if (FILE* const file = std::fopen((path + name).c_str(), "w")) {
            std::fputs(name, file);
            std::fclose(file);
        }
    }
    const KpTmpDir inner((path + "inner").c_str(), true, false);
}

/// A folder of three files and one folder, made on first use in a place that scripts/oom removes.
const char* folder()
{
    static KpTmpDir made("oom-files", true, false);
    static const bool isFilled = (fill(made.path()), true);
    return isFilled ? made.path().c_str() : nullptr;
}

Outcome paths()
{
    KpFilename name("/usr//share/./doc/../a file with a long name.tar.gz");
    name.pack();
    name.removeExtension();
    name.appendFile("inner");
    KpFilename relative("/usr/share/other/file");
    relative.makeRelativeTo(name);
    KpString numbered;
    KpFilename::enumerate(numbered, "image####.dcm", 17);
    return Digest() << name << relative << numbered << name.dirname();
}

Outcome realPaths()
{
    KpFilename name("./../relative/file");
    name.expandPath();
    KpFilename canonical("/usr/../usr/bin/");
    canonical.canonizePath();
    KpFilename unique("/etc/passwd");
    unique.makeUnique();
    return Digest() << name << canonical << unique;
}

Outcome scans()
{
    KpDArray<KpString> files, folders;
    if (!KpDirectory::scanSortedByName(folder(), files, folders))
        return {};
    std::vector<KpDirectory::FileInfo> infos;
    const long count = KpDirectory::scan(folder(), infos, "*.txt");
    if (count < 2)
        return {};
    return Digest() << files.size() << folders.size() << count << infos.front().name;
}

Outcome collected()
{
    KpDArray<KpString> found;
    KpFilenameCollector::collect(found, "*.txt", folder());
    return Digest() << found.size();
}

Outcome fileCopy()
{
    const KpString source = KpString(folder()) + "a.txt", target = KpString(folder()) + "a.copy";
    if (!KpFilename(source).copy(target) || !KpFilename(target).unlink())
        return {};
    return Digest() << KpFilename(source).fileSize();
}

Outcome folderCopy()
{
    const KpString source = KpString(folder()) + "inner", target = KpString(folder()) + "copy";
    if (KpDirectory::copy(source, target) != 0 || remove_dir(target) != 0)
        return {};
    return Digest() << KpDirectory::isDirectory(source);
}

Outcome temporaryFolder()
{
    KpTmpDir made("oom-temporary", true, true);
    if (!made.doesExist())
        return {};
    const KpTmpDir inner((made.path() + "inner").c_str(), true, true);
    return Digest() << inner.path().isEmpty();
}

Outcome digests()
{
    KpLib::MD5List list(true);
    for (int i = 0; i < 5; ++i)
        list.insert((KpLib::MD5Coder() << i << "text" << KpString("text") << std::string("text")).md5());
    KpString text;
    list.hash().toString(text);
    KpLib::MD5 again;
    again.fromString(text);
    return Digest() << text << again.words()[0];
}

Outcome hexadecimal()
{
    const unsigned char bytes[] = {1, 2, 0xab, 0xff};
    KpString text;
    KpCoder::dataToHexString(bytes, sizeof bytes, text, true);
    KpUUID uuid;
    std::memcpy(uuid.data(), bytes, sizeof bytes);
    const KpString formatted = uuid.toFormattedString();
    uuid.fromFormattedString(formatted);
    return Digest() << text << formatted << uuid.toString();
}

KpTable& fillTable(KpDataBase& base)
{
    KpTable& table = *base.table(base.createTable());
    table.setName("a table with a name that takes memory of its own");
    table.columnAdd(1, KpTable::Plain, 8, nullptr);
    table.columnAdd(2, KpTable::Relation, 0, &table);
    char* first = nullptr;
    table.externalRowPointers().append(&first);
    for (int i = 0; i < 600; ++i) {
        char* const row = table.rowAdd();
        if (!first)
            first = row;
        if (i % 50 == 0)
            table.relationAdd(first, table.columnOffset(2), row);
    }
    table.externalRowPointers().clear();
    return table;
}

Outcome tables()
{
    KpDataBase base;
    KpTable& table = fillTable(base);
    const char* const first = table.rowNext(nullptr);
    return Digest() << table.rowCount() << KpTable::relationGetCount(first, table.columnOffset(2)) << base.check();
}

Outcome clonedBase()
{
    KpDataBase base, other;
    fillTable(base);
    base.clone(other);
    return Digest() << other.tables().size() << other.check();
}

Outcome versions()
{
    return Digest() << KpVersion("1.22.333.4444").toString() << KpBuildInfo::getBuildTag("VERSION_COPYRIGHT")
                    << KpBuildInfo::getBuildString(KpBuildInfo::BuildNumber | KpBuildInfo::Platform)
                    << KpOSInfo::getOSName();
}

Outcome sharedObject()
{
    KpDSO object("libm.so.6");
    if (!object.isOpen())
        return {};
    KpFilename name("plugin");
    KpDSO::fixPath(name);
    return Digest() << (object.getSymbol("cos") != nullptr) << name;
}

Outcome processes()
{
    KpDArray<KpSysInfo::ProcessEntry> list;
    if (!KpSysInfo::process_list(list))
        return {};
    for (const KpSysInfo::ProcessEntry& entry : list) {
        if (entry.processId == 1)
            return Digest() << entry.name;
    }
    return {};
}

}  // namespace

Operations systemOperations()
{
    static constexpr Operation list[] = {
        {"paths", paths},
        {"real paths", realPaths},
        {"scans of a folder", scans},
        {"collected names", collected},
        {"a copy of a file", fileCopy},
        {"a copy of a folder", folderCopy},
        {"temporary folders", temporaryFolder},
        {"digests", digests},
        {"hexadecimal texts", hexadecimal},
        {"tables", tables},
        {"a cloned database", clonedBase},
        {"versions", versions},
        {"a shared object", sharedObject},
        {"processes", processes},
    };
    return list;
}

}  // namespace kplib::probe
