#include <kplib/system/KpDirectory.h>

#include <kplib/system/KpFilename.h>
#include <kplib/system/KpFilenameCollector.h>
#include <kplib/system/KpTmpDir.h>

#include <support/FailingMalloc.h>
#include <support/LogCapture.h>
#include <support/TempFolder.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <fcntl.h>
#include <memory>
#include <sys/stat.h>

using namespace kplib::test;

namespace {

std::string joined(const KpDArray<KpString>& names)
{
    std::string all;
    for (const KpString& name : names)
        all += name.c_str() + std::string("|");
    return all;
}

/// Files, a hidden one, folders, and links to what is there and what isn't.
class KpDirectoryTest : public testing::Test {
protected:
    KpDirectoryTest()
    {
        for (const char* const file : {"b", "a b", "new\nline", ".h", "\xC3\x9F", "sub/deep/f", "sub/g"}) {
            temp.folder("tree/sub/deep");
            temp.file(std::string("tree/") + file, file);
        }
        temp.folder("tree/.hidden");
        temp.folder("outside");
        temp.file("outside/kept");
        std::filesystem::create_directory_symlink("../outside", temp / "tree/link");
        std::filesystem::create_symlink("nowhere", temp / "tree/to nowhere");
    }
    TempFolder temp;
    const std::string tree = temp / "tree";
    const LogCapture capture{KpLogWarning};
};

}  // namespace

TEST_F(KpDirectoryTest, listsAreSortedByBytes)
{
    const std::string start = "a b|b|link|new\nline|", end = "to nowhere|\xC3\x9F|";  // bytes have no sign here
    KpDArray<KpString> names, list, folders;
    EXPECT_EQ(KpDirectory::scanSortedByName(tree.c_str(), names, "*", false), 7);
    EXPECT_EQ(joined(names), start + "sub|" + end);
    EXPECT_EQ(KpDirectory::scanSortedByName(tree.c_str(), names, "b", false), 8);  // with those of before
    EXPECT_EQ(std::count(names.begin(), names.end(), KpString("b")), 2);
    names.clear();
    EXPECT_EQ(KpDirectory::scanSortedByName(tree.c_str(), names, nullptr, true), 2);
    EXPECT_EQ(joined(names), ".hidden|sub|");
    EXPECT_TRUE(KpDirectory::scanSortedByName(tree.c_str(), list, folders, "*"));
    EXPECT_EQ(joined(list) + joined(folders), start + end + "sub|");
}

TEST_F(KpDirectoryTest, timesCountFrom1601)
{
    std::vector<KpDirectory::FileInfo> infos(3);
    EXPECT_EQ(KpDirectory::scan(tree.c_str(), infos, "*", false), 6);  // the link to nowhere can't be asked
    const timespec times[] = {{0, 0}, {1, 999999999}};
    utimensat(AT_FDCWD, (temp / "tree/b").c_str(), times, 0);
    EXPECT_EQ(KpDirectory::scan(tree.c_str(), infos, "b", false), 1);
    EXPECT_EQ(infos[0].modificationTime, 116444736010000000U);
    KpDArray<KpString> names;
    KpDArray<unsigned long long> created;
    names.append(KpString("old"));
    EXPECT_EQ(KpDirectory::scanSortedByCreationTime(tree.c_str(), names, &created, nullptr, false), 8);
    ASSERT_EQ(std::tuple(names.size(), created.size()), std::tuple(8, 8));
    EXPECT_TRUE(std::is_sorted(created.begin(), created.end()));
}

TEST_F(KpDirectoryTest, whatIsNoFolderIsOneLine)
{
    for (const std::string& path : {temp / "missing", tree + "/b", std::string()}) {
        KpDArray<KpString> names, folders;
        std::vector<KpDirectory::FileInfo> infos(3);
        LogCapture::lines().clear();
        EXPECT_FALSE(KpDirectory::isDirectory(path.c_str()));
        EXPECT_EQ(remove_dir(path.c_str()), -1);
        EXPECT_TRUE(LogCapture::lines().empty());
        EXPECT_EQ(KpDirectory::scanSortedByName(path.c_str(), names, "*", false), -1);
        EXPECT_FALSE(KpDirectory::scanSortedByName(path.c_str(), names, folders, "*"));
        EXPECT_EQ(KpDirectory::scan(path.c_str(), infos, "*", false), 0);
        EXPECT_EQ(KpDirectory::copy(path.c_str(), (temp / "target").c_str()), -1);
        EXPECT_TRUE(infos.empty());
        EXPECT_EQ(LogCapture::lines(), Lines(4, "E [] Can't open dir " + path + "\n"));
    }
    EXPECT_TRUE(KpDirectory::isDirectory((temp / "tree/link").c_str()));
    EXPECT_FALSE(KpDirectory::isDirectory(nullptr));
}

TEST_F(KpDirectoryTest, treesAreCopied)
{
    const std::string copy = temp / "copy", nested = copy + "/tree";
    chmod((temp / "tree/sub").c_str(), 0700);
    ASSERT_EQ(mkfifo((temp / "tree/pipe").c_str(), 0600), 0);
    ASSERT_EQ(KpDirectory::copy(tree.c_str(), copy.c_str()), 0);
    EXPECT_EQ(LogCapture::lines(), Lines{"E [] Can't copy " + tree + "/pipe: not a file, folder or link\n"});
    ASSERT_EQ(KpDirectory::copy(tree.c_str(), copy.c_str()), 0);
    EXPECT_EQ(KpDirectory::copy(tree.c_str(), copy.c_str()), -1);  // nested already
    for (const std::string& made : {copy, nested}) {
        std::set<std::string> expected = namesIn(tree);
        expected.erase("pipe");
        if (made == copy)
            expected.insert("tree");
        EXPECT_EQ(namesIn(made), expected);
        for (const char* const file : {"b", "new\nline", "sub/deep/f", "sub/g"})
            EXPECT_EQ(contentOf(made + "/" + file), file);
        EXPECT_EQ(KpFilename((made + "/sub").c_str()).getMode(), S_IFDIR | 0700);
        EXPECT_EQ(std::filesystem::read_symlink(made + "/link"), "../outside");
        EXPECT_EQ(std::filesystem::read_symlink(made + "/to nowhere"), "nowhere");
    }
    ASSERT_EQ(KpDirectory::copy(tree.c_str(), (temp / "tree/sub/inside").c_str()), 0);
    EXPECT_EQ(namesIn(temp / "tree/sub/inside/sub"), (std::set<std::string>{"deep", "g"}));
    LogCapture::lines().clear();
    setSizeLimit(9);
    EXPECT_EQ(KpDirectory::copy((tree + "/sub").c_str(), (temp / "part").c_str()), 0);
    setSizeLimit(RLIM_INFINITY);
    const std::string cannot = "E [] Can't copy " + tree + "/sub/";
    EXPECT_EQ(LogCapture::lines(), (Lines{cannot + "deep/f\n", cannot + "inside/sub/deep/f\n"}));
    EXPECT_EQ(namesIn(temp / "part/deep"), std::set<std::string>());
}

TEST_F(KpDirectoryTest, treesAreRemovedButNotWhatLinksLeadTo)
{
    temp.folder(std::string("tree/") + std::string(200, 'a') + "/" + std::string(200, 'b') + "/" +
                std::string(200, 'c'));
    for (const char* const link : {"tree/link", "tree/link/", "tree/b"})
        EXPECT_EQ(remove_dir((temp / link).c_str()), -1);
    EXPECT_EQ(remove_dir((tree + "/").c_str()), 0);
    EXPECT_EQ(namesIn(temp.path), std::set<std::string>{"outside"});
    EXPECT_EQ(namesIn(temp / "outside"), std::set<std::string>{"kept"});
    temp.folder("closed/within/sub");
    const bool isRoot = geteuid() == 0;  // may read everything
    for (const char* const folder : {".", "closed", "closed/within"}) {
        EXPECT_TRUE(!isRoot || chown((temp / folder).c_str(), 65534, 65534) == 0);
    }
    chmod((temp / "closed/within").c_str(), 0);
    EXPECT_TRUE(!isRoot || seteuid(65534) == 0);
    EXPECT_EQ(remove_dir((temp / "closed").c_str()), -1);
    EXPECT_TRUE(!isRoot || seteuid(0) == 0);
    const std::string cannot = "E [] Can't delete " + temp / "closed";
    EXPECT_EQ(LogCapture::lines(),
              (Lines{cannot + "/within:\nPermission denied\n", cannot + ":\nDirectory not empty\n"}));
    chmod((temp / "closed/within").c_str(), 0700);
    LogCapture::lines().clear();
    EXPECT_NE(remove_dir("/proc/self/fdinfo"), 0);  // where nothing can be deleted
    EXPECT_EQ(LogCapture::lines().front(), "E [] Can't delete /proc/self/fdinfo/0:\nOperation not permitted\n");
}

TEST_F(KpDirectoryTest, freeSpaceAsksTheFolderOfAPath)
{
    const std::string warning = "W [] Free space determination has not been tested under MacX";
    EXPECT_GT(KpDirectory::freeSpace((temp.path + "\\missing").c_str()), 0);
    EXPECT_EQ(KpDirectory::freeSpace("/proc/x"), 0);
    EXPECT_EQ(KpDirectory::freeSpace("tree"), -1);
    EXPECT_EQ(LogCapture::lines(), (Lines{warning, warning, warning, "E [] Could not determine free disk space\n"}));
}

TEST_F(KpDirectoryTest, theCollectorGoesDownFromTheLastName)
{
    KpDArray<KpString> found;
    temp.file("tree/.hidden/e");
    temp.file("tree/sub/deep/e");
    KpFilenameCollector::collect(found, "*e*", tree.c_str());
    std::string expected;
    for (const char* const path : {"to nowhere", "new\nline", "sub/deep", "sub/deep/e", "link/kept"})
        expected += tree + "/" + path + "|";
    KpFilenameCollector::collect(found, nullptr, tree.c_str());
    KpFilenameCollector::collect(found, "*", (tree + "/b").c_str());
    EXPECT_EQ(joined(found), expected) << joined(found);
    EXPECT_TRUE(LogCapture::lines().empty()) << joined(found);
    for (const char* const loop : {"outside/1", "outside/2"})
        std::filesystem::create_directory_symlink(".", temp / loop);
    found.clear();
    KpFilenameCollector::collect(found, "k*", (temp / "outside").c_str());
    EXPECT_EQ(joined(found), temp / "outside/kept" + "|");
    std::filesystem::create_directory_symlink("deep", tree + "/sub/again");  // beside what it leads to
    found.clear();
    KpFilenameCollector::collect(found, "f", (tree + "/sub").c_str());
    EXPECT_EQ(joined(found), tree + "/sub/deep/f|" + tree + "/sub/again/f|");
}

TEST_F(KpDirectoryTest, temporaryFoldersAreUniqueAndGo)
{
    const std::string tmp = temp.folder("tmp") + "/", work = temp / "work";
    const char* const before = std::getenv("TMPDIR");
    setenv("TMPDIR", (temp / "tmp").c_str(), 1);
    const std::string cases[][2] = {{work, work + "/"},  {work, work + ".2/"}, {work, work + ".3/"},
                                    {"a/x", tmp + "x/"}, {"", tmp + "tmp/"},   {tmp, tmp + "tmp.2/"}};
    const mode_t mask = umask(077);
    for (const auto& [name, path] : cases) {
        const KpTmpDir dir(name.c_str(), true, false);
        EXPECT_STREQ(dir.path(), path.c_str());
        EXPECT_EQ(KpFilename(dir.path()).getMode(), S_IFDIR | 0775);
    }
    umask(mask);
    {
        KpTmpDir dir("gone", true, true), kept("kept", true, false);
        temp.file("tmp/gone/file");
        EXPECT_FALSE(dir.create(0700));  // is there
        EXPECT_EQ(std::tuple(dir.doesExist(), kept.doesExist()), std::tuple(true, true));
        EXPECT_EQ(kept.remove(), 0);
        EXPECT_FALSE(kept.doesExist());
    }
    for (long first = 0; first < 40; ++first) {  // without memory the folder may stay
        auto gone = std::make_unique<KpTmpDir>("gone", true, true);
        temp.file("tmp/gone/file");
        {
            const FailingMalloc failing(first);
            gone.reset();
        }
        std::filesystem::remove_all(tmp + "gone");
    }
    EXPECT_EQ(namesIn(tmp), (std::set<std::string>{"x", "tmp", "tmp.2"}));
    setenv("TEMP", "/temp", 1);
    setenv("TMPDIR", "", 1);  // set, even if to nothing
    EXPECT_STREQ(KpTmpDir::getSystemTmpPath(), "/");
    unsetenv("TMPDIR");
    EXPECT_STREQ(KpTmpDir::getSystemTmpPath(), "/temp/");
    unsetenv("TEMP");
    if (before)
        setenv("TMPDIR", before, 1);
}
