#include <kplib/system/KpFilename.h>

#include <kplib/system/KpTmpDir.h>

#include <support/TempFolder.h>

#include <gtest/gtest.h>

#include <ctime>
#include <fcntl.h>
#include <regex>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

using namespace kplib::test;

namespace {

std::string repeated(const std::string& text, int times)
{
    std::string all;
    while (times-- > 0)
        all += text;
    return all;
}

std::string changed(const std::string& text, void (KpFilename::*change)())
{
    KpFilename name(text.c_str());
    (name.*change)();
    return name.c_str();
}

/// The pieces of a row of a table between bars.
std::vector<std::string> row(const std::string& text)
{
    std::vector<std::string> pieces(1);
    for (const char c : text)
        c == '|' ? pieces.emplace_back() : pieces.back() += c;
    return pieces;
}

}  // namespace

TEST(KpFilename, partsOfAPath)
{
    for (const char* const text :
         {"|||", "file.txt|file.txt|.txt|", "/x|x||/", "a/b/|||a/b/", "a.b/c|c||a.b/", ".profile|.profile|.profile|",
          "a/.x.tar.gz|.x.tar.gz|.gz|a/", "a.|a.|.|", "a\\b/c\\d.e|c\\d.e|.e|a/b/c/"}) {
        const auto c = row(text);  // path, basename, extension, dirname
        KpFilename name(c[0].c_str());
        KpString out("old");
        EXPECT_EQ(name.basename() + ("|" + std::string(name.extension())), c[1] + "|" + c[2]);
        EXPECT_EQ(name.dirname(out), !c[3].empty()) << text;
        EXPECT_EQ(out.c_str(), c[3]);
        name.removeExtension();
        EXPECT_EQ(name.c_str() + c[2], c[0]);
    }
    KpFilename name("a");
    EXPECT_STREQ(name.appendFile(name).appendFile(""), "a/a/");
}

TEST(KpFilename, packTidiesInThreePasses)
{
    for (const char* const text : {"", "a\\b|a/b", "a///b|a//b", "a/././b|a/./b", "x/a/../b|x/b", "a/../b|a/../b",
                                   "a/b/..c|ac", "../../a|../../a", "/a/b/../../c|/c", "/a/../../b|/b", "/..|",
                                   "/../a/b|/a/b", "/..a/..|a/..", "a///../b|a/b"})
        EXPECT_EQ(changed(row(text)[0], &KpFilename::pack), row(text).back()) << text;
    EXPECT_EQ(changed("x" + repeated("/a/..", 819), &KpFilename::pack), "x");
    EXPECT_EQ(changed("/", &KpFilename::canonizePath), "");
    EXPECT_EQ(changed("/a\\./b//", &KpFilename::canonizePath), "/a/b");
}

TEST(KpFilename, relativePathsExpandFromWhereWeAre)
{
    const TempFolder temp;
    const std::string here = temp.folder("here"), before = std::filesystem::current_path();
    const std::string home = std::getenv("HOME") ? std::getenv("HOME") : "", deep = repeated("d/", 2048);
    temp.folder("here/sub");
    temp.file("here/file");
    std::filesystem::create_symlink("file", temp / "here/link");
    std::filesystem::current_path(here);
    for (const char* const text :
         {"|", "~x/y|~x/y", "././file|file", "sub/|sub/", "no/../file|no/../file", "sub/../file|file", "link|filek"})
        EXPECT_EQ(changed(row(text)[0], &KpFilename::expandPath), here + "/" + row(text)[1]);
    EXPECT_EQ(changed(deep, &KpFilename::expandPath), here + "/" + deep);
    EXPECT_EQ(changed("/a/../sub", &KpFilename::expandPath), "/a/../sub");
    setenv("HOME", "/none", 1);
    EXPECT_EQ(changed("~/x", &KpFilename::expandPath), "/none/x");
    std::filesystem::remove_all(here);
    EXPECT_EQ(changed("./x", &KpFilename::expandPath), "./x");
    setenv("HOME", home.c_str(), 1);
    std::filesystem::current_path(before);
}

TEST(KpFilename, pathsAreRelativeToAFolder)
{
    for (const char* const text :
         {"/a/b/c.txt|/a/d/e.txt|../b/c.txt", "/a/b/c.txt|/a/b/x|./c.txt", "/a/b/d/e/f|/a/b/x|./d/e/f",
          "/c|/a/b/d|../../c", "c.txt|/a/b|c.txt", "a//x|b/y|a/x", "a/x|y|a/x", "/a/b/../c/f|/a\\c/g|./f",
          "/A/f|/a/f|../A/f", "/a/b\\c.txt|/a/x|./b/b/c.txt"}) {
        KpFilename name(row(text)[0].c_str()), base(row(text)[1].c_str());
        name.makeRelativeTo(base);
        EXPECT_EQ(name.c_str(), row(text)[2]) << text;
        EXPECT_EQ(base.c_str(), row(text)[1]);
    }
}

TEST(KpFilename, numbersAndFreshNames)
{
    KpString result;
    for (const char* const text : {"a.png|1|a.png", "a.png|2|a0002.png", "a###.png|7|a007.png", "#a##|1234|#a1234",
                                   "d.x/a|5|d0005.x/a", "a|12345|a12345", "a|-1|a", "###|-1|-01", "%s#.x|3|%s3.x"}) {
        KpFilename::enumerate(result, row(text)[0].c_str(), std::stoi(row(text)[1]));
        EXPECT_EQ(result.c_str(), row(text)[2]);
    }
    const TempFolder temp;
    temp.folder("d.x");
    for (const char* const text : {"f%d.txt|f%d.1.txt|f%d.2.txt", "f|f.1|f.2", ".rc|.1.rc|.2.rc", "d.x/f|d.x/f.1"}) {
        for (const std::string& expected : row(text)) {
            KpFilename name((temp / row(text)[0]).c_str());
            name.makeUnique();
            EXPECT_EQ(name.c_str(), temp / expected);
            temp.file(expected);
        }
    }
    const std::string first = KpFilename::getTempFilename(temp.path.c_str()).c_str();
    EXPECT_TRUE(std::regex_match(first, std::regex(temp.path + "/kp\\.\\d{4}"))) << first;
    const int number = std::stoi(first.substr(first.size() - 4));
    std::ofstream(first.substr(0, first.size() - 4) + std::string(KpString(0, "%04d", number + 1))) << "taken";
    EXPECT_EQ(KpFilename::getTempFilename(temp.path.c_str()),
              KpString(0, "%s/kp.1.%04d", temp.path.c_str(), number + 1));
    EXPECT_EQ(KpFilename::getTempFilename(nullptr), KpTmpDir::getSystemTmpPath() + KpString(0, "kp.%04d", number + 2));
}

TEST(KpFilename, placesForNewFilesAreMade)
{
    const TempFolder temp;
    temp.file("file");
    const std::string stamp = "|\\d{8}-\\d{6}-" + std::to_string(getpid());
    for (const std::string& text : {"new//|/new" + stamp, "new|/new/\\d{4}/\\d\\d/\\d\\d" + stamp + "_[0-9A-F]{32}",
                                    std::string("file||"), std::string("missing/new||")}) {
        KpString dir("old"), name("old");
        const auto c = row(text);
        KpFilename::generateFilePath(dir, name, (temp / c[0]).c_str(), c[0] == "new", c[0] == "new");
        EXPECT_TRUE(std::regex_match(dir.c_str(), std::regex(c[1].empty() ? "" : temp.path + c[1]))) << dir;
        EXPECT_TRUE(std::regex_match(name.c_str(), std::regex(c[2]))) << name;
    }
    KpString both("///"), name;
    KpFilename::generateFilePath(both, name, both, false, false);
    EXPECT_STREQ(both, "/");
}

TEST(KpFilename, filesOfAnyNameAreCopiedAndRenamed)
{
    const TempFolder temp;
    const mode_t mask = umask(0);
    for (const std::string& text : {std::string("with blank"), std::string("\"'`"), std::string("\xC3\x9F"),
                                    std::string("new\nline\t\x01"), std::string("%s%n"), std::string(255, 'n')}) {
        KpFilename name((temp / text).c_str());
        const KpFilename other((temp / "other").c_str());
        EXPECT_FALSE(name.doesExist());
        EXPECT_TRUE(name.create(0640));
        EXPECT_EQ(std::tuple(name.isReadable(), name.isWriteable(), name.getMode()),
                  std::tuple(true, true, S_IFREG | 0640));
        for (const int size : {0, 1, 4095, 4096, 4097, 100000}) {
            const std::string content = repeated("xyz", size / 3) + std::string(static_cast<size_t>(size % 3), '\0');
            std::ofstream(name.c_str()) << content;
            EXPECT_TRUE(name.setMode(0600));
            EXPECT_TRUE(name.copy(other));
            EXPECT_TRUE(name.copy(name));
            EXPECT_EQ(contentOf(other.c_str()), content);
            EXPECT_EQ(std::tuple(name.fileSize(), other.getMode()), std::tuple(content.size(), S_IFREG | 0600));
        }
        EXPECT_TRUE(name.rename(other));
        EXPECT_EQ(name, other);
        EXPECT_FALSE(KpFilename((temp / text).c_str()).doesExist());
        EXPECT_TRUE(name.unlink());
        EXPECT_FALSE(name.unlink());
    }
    umask(mask);
}

TEST(KpFilename, whatCantBeHadIsFalseOrNothing)
{
    const TempFolder temp;
    temp.file("file");
    std::filesystem::create_symlink("nowhere", temp / "dangling");
    for (const char* const text : {"missing", "no/folder", "file/below", "dangling", "", "/"}) {
        KpFilename name(*text == '/' ? "" : (temp / text).c_str());
        if (*text == '\0')
            name = (temp / std::string(5000, 'n')).c_str();
        EXPECT_FALSE(name.doesExist() || name.isReadable() || name.isWriteable() || name.isDirectory()) << text;
        EXPECT_FALSE(name.setMode(0600) || name.copy((temp / "target").c_str())) << text;
        EXPECT_EQ(std::tuple(name.getModTime(), name.getAccessTime(), name.getCreateTime()), std::tuple(0, 0, 0))
            << text;
        EXPECT_EQ(std::tuple(name.fileSize(), name.getMode()), std::tuple(~0ULL, 0)) << text;
        EXPECT_FALSE(name.rename("/taken/anyway"));
        EXPECT_STREQ(name, "/taken/anyway");
    }
    const KpFilename file((temp / "file").c_str()), folder(temp.path.c_str());
    EXPECT_TRUE(folder.isWriteable());
    EXPECT_EQ(std::tuple(folder.isDirectory(), file.isDirectory()), std::tuple(true, false));
    EXPECT_FALSE(folder.unlink() || folder.create(0600) || file.copy(folder) || file.copy((temp / "no/x").c_str()));
    setSizeLimit(1);
    EXPECT_FALSE(KpFilename("/proc/self/status").copy((temp / "half").c_str()));  // a write error
    setSizeLimit(RLIM_INFINITY);
    EXPECT_FALSE(KpFilename("/proc/self/mem").copy((temp / "half").c_str()));  // a read error
    EXPECT_FALSE(file.copy("/dev/full") || !KpFilename("/dev/full").doesExist());
    std::filesystem::create_symlink("led to", temp / "link");
    EXPECT_FALSE(KpFilename("/proc/self/mem").copy((temp / "link").c_str()));
    EXPECT_EQ(namesIn(temp.path), (std::set<std::string>{"dangling", "file", "led to", "link"}));
    const timespec times[] = {{111, 0}, {222, 999999999}};
    utimensat(AT_FDCWD, file, times, 0);
    EXPECT_EQ(std::tuple(file.getAccessTime(), file.getModTime()), std::tuple(111L, 222L));
    EXPECT_NEAR(static_cast<double>(file.getCreateTime()), static_cast<double>(std::time(nullptr)), 60);
}
