#include <kplib/system/KpFilename.h>

#include <kplib/system/KpTmpDir.h>

#include <support/TempFolder.h>

#include <gtest/gtest.h>

#include <ctime>
#include <fcntl.h>
#include <regex>
#include <sys/stat.h>
#include <unistd.h>

using kplib::test::contentOf;
using kplib::test::TempFolder;

namespace {

std::string repeated(const std::string& text, int times)
{
    std::string all;
    while (times-- > 0)
        all += text;
    return all;
}

template <typename Change>
std::string changed(const std::string& text, Change change)
{
    KpFilename name(text.c_str());
    (name.*change)();
    return name.c_str();
}

}  // namespace

TEST(KpFilename, partsOfAPath)
{
    const char* const cases[][4] = {// path, basename, extension, dirname
                                    {"", "", "", ""},
                                    {"file.txt", "file.txt", ".txt", ""},
                                    {"/x", "x", "", "/"},
                                    {"a/b/", "", "", "a/b/"},
                                    {"a.b/c", "c", "", "a.b/"},
                                    {".profile", ".profile", ".profile", ""},
                                    {"a/.x.tar.gz", ".x.tar.gz", ".gz", "a/"},
                                    {"a.", "a.", ".", ""},
                                    {"a\\b/c\\d.e", "c\\d.e", ".e", "a/b/c/"}};
    for (const auto& [path, base, extension, dir] : cases) {
        KpFilename name(path);
        KpString out("old");
        EXPECT_STREQ(name.basename(), base);
        EXPECT_STREQ(name.extension(), extension);
        EXPECT_EQ(KpFilename::dirname(path, out), *dir != '\0') << path;
        EXPECT_STREQ(out, dir);
        name.removeExtension();
        EXPECT_EQ(std::string(name.c_str()) + extension, path);
        EXPECT_EQ(name.isRelative(), *path != '/');
    }
    KpFilename name("a");
    EXPECT_STREQ(name.appendFile(name).appendFile(""), "a/a/");
    EXPECT_STREQ(name, "a/a/");
}

TEST(KpFilename, packTidiesInThreePasses)
{
    const std::string cases[][2] = {
        {"", ""},
        {"a\\b", "a/b"},
        {"a///b", "a//b"},
        {"a/././b", "a/./b"},
        {"x/a/../b", "x/b"},
        {"a/../b", "a/../b"},
        {"a/b/..c", "ac"},
        {"../../a", "../../a"},
        {"/a/b/../../c", "/c"},
        {"/a/../../b", "/b"},
        {"/..", ""},
        {"/../a/b", "/a/b"},
        {"/..a/..", "a/.."},
        {"a///../b", "a/b"},
        {"x" + repeated("/a/..", 819), "x"},
    };
    for (const auto& [text, packed] : cases)
        EXPECT_EQ(changed(text, &KpFilename::pack), packed) << text;
    EXPECT_EQ(changed("/", &KpFilename::canonizePath), "");
    EXPECT_EQ(changed("/a\\./b//", &KpFilename::canonizePath), "/a/b");
}

TEST(KpFilename, relativePathsExpandFromWhereWeAre)
{
    const TempFolder temp;
    const std::string here = temp.folder("here"), before = std::filesystem::current_path();
    const std::string home = std::getenv("HOME") ? std::getenv("HOME") : "";
    temp.folder("here/sub");
    temp.file("here/file");
    std::filesystem::create_symlink("file", temp / "here/link");
    std::filesystem::current_path(here);
    setenv("HOME", "/none", 1);
    const std::string cases[][2] = {
        {"/a/../sub", "/a/../sub"},
        {"~/x", "/none/x"},
        {"~", here + "/~"},
        {"~x/y", here + "/~x/y"},
        {"", here + "/"},
        {"./missing", here + "/missing"},
        {"././file", here + "/file"},
        {"sub/", here + "/sub/"},
        {"sub/../file", here + "/file"},
        {"no/../file", here + "/no/../file"},
        {"link", here + "/filek"},  // the last character stays, whatever it is
        {repeated("d/", 2048), here + "/" + repeated("d/", 2048)},
    };
    for (const auto& [text, expanded] : cases)
        EXPECT_EQ(changed(text, &KpFilename::expandPath), expanded);
    unsetenv("HOME");
    EXPECT_EQ(changed("~/x", &KpFilename::expandPath), "/x");
    std::filesystem::remove_all(here);
    EXPECT_EQ(changed("./x", &KpFilename::expandPath), "./x");
    setenv("HOME", home.c_str(), 1);
    std::filesystem::current_path(before);
}

TEST(KpFilename, pathsAreRelativeToAFolder)
{
    const char* const cases[][3] = {{"/a/b/c.txt", "/a/d/e.txt", "../b/c.txt"},
                                    {"/a/b/c.txt", "/a/b/x", "./c.txt"},
                                    {"/a/b/d/e/f", "/a/b/x", "./d/e/f"},
                                    {"/c", "/a/b/d", "../../c"},
                                    {"c.txt", "/a/b", "c.txt"},
                                    {"a//x", "b/y", "a/x"},
                                    {"a/x", "y", "a/x"},
                                    {"/a/b/../c/f", "/a\\c/g", "./f"},
                                    {"/A/f", "/a/f", "../A/f"},
                                    {"/a/b\\c.txt", "/a/x", "./b/b/c.txt"}};  // the base name is of the text as it was
    for (const auto& [path, base, expected] : cases) {
        KpFilename name(path);
        const KpFilename other(base);
        name.makeRelativeTo(other);
        EXPECT_STREQ(name, expected) << path << ' ' << base;
        EXPECT_STREQ(other, base);
    }
}

TEST(KpFilename, numbersAndFreshNames)
{
    const std::tuple<const char*, int, const char*> cases[] = {
        {"a.png", 1, "a.png"},    {"a.png", 2, "a0002.png"}, {"a###.png", 7, "a007.png"},
        {"#a##", 1234, "#a1234"}, {"d.x/a", 5, "d0005.x/a"}, {"a", 12345, "a12345"},
        {"a", -1, "a"},           {"###", -1, "-01"},        {"100%s#.png", 3, "100%s3.png"}};
    KpString result;
    for (const auto& [pattern, number, expected] : cases) {
        KpFilename::enumerate(result, pattern, number);
        EXPECT_STREQ(result, expected);
    }
    const TempFolder temp;
    temp.folder("d.x");
    const char* const unique[][3] = {{"f%d.txt", "f%d.1.txt", "f%d.2.txt"},
                                     {"f", "f.1", "f.2"},
                                     {".rc", ".1.rc", ".2.rc"},
                                     {"d.x/f", "d.x/f.1", "d.x/f.2"}};
    for (const auto& names : unique) {
        for (const char* const expected : names) {
            KpFilename name((temp / names[0]).c_str());
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
    EXPECT_EQ(KpFilename::getTempFilename(""), KpString(0, "kp.%04d", number + 2));
    EXPECT_EQ(KpFilename::getTempFilename(nullptr), KpTmpDir::getSystemTmpPath() + KpString(0, "kp.%04d", number + 3));
}

TEST(KpFilename, placesForNewFilesAreMade)
{
    const TempFolder temp;
    temp.file("file");
    struct Case {
        std::string root;
        bool dated, withUuid;
        const char *dir, *name;
    };
    const std::string stamp = "\\d{8}-\\d{6}-" + std::to_string(getpid());
    const std::string uuid = stamp + "_[0-9A-F]{32}";
    const Case cases[] = {
        {temp / "new//", false, false, "/new", stamp.c_str()},
        {temp / "new", true, true, "/new/\\d{4}/\\d\\d/\\d\\d", uuid.c_str()},
        {temp / "file", false, false, nullptr, ""},
        {temp / "missing/new", true, false, nullptr, ""},
    };
    for (const Case& c : cases) {
        KpString dir("old"), name("old");
        KpFilename::generateFilePath(dir, name, c.root.c_str(), c.dated, c.withUuid);
        EXPECT_TRUE(std::regex_match(dir.c_str(), std::regex(c.dir ? temp.path + c.dir : ""))) << dir;
        EXPECT_TRUE(std::regex_match(name.c_str(), std::regex(c.name))) << name;
        EXPECT_EQ(KpFilename(dir).isDirectory(), c.dir != nullptr);
    }
    KpString both((temp / "new").c_str()), name;
    const std::string year = *kplib::test::namesIn(temp / "new").begin();
    std::filesystem::remove_all(temp / "new/" + year);
    temp.file("new/" + year);  // in the way
    KpFilename::generateFilePath(both, name, both, true, false);
    EXPECT_TRUE(both.isEmpty() && name.isEmpty());
    KpFilename::generateFilePath(both, name, "///", false, false);
    EXPECT_STREQ(both, "/");
}

TEST(KpFilename, filesOfAnyNameAreCopiedAndRenamed)
{
    const TempFolder temp;
    const mode_t mask = umask(0);
    for (const std::string& text : {std::string("with blank"), std::string("\"'`"),
                                    std::string("Gr\xC3\xB6\xC3\x9F"
                                                "e"),
                                    std::string("new\nline\t\x01"), std::string("%s%n"), std::string(255, 'n')}) {
        KpFilename name((temp / text).c_str());
        const KpFilename other((temp / "other").c_str());
        EXPECT_TRUE(!name.doesExist() && name.create(0640) && name.doesExist() && name.isReadable() &&
                    name.isWriteable());
        EXPECT_EQ(name.getMode(), S_IFREG | 0640);
        for (const int size : {0, 1, 4095, 4096, 4097, 100000}) {
            const std::string content = repeated("xyz", size / 3) + std::string(static_cast<size_t>(size % 3), '\0');
            std::ofstream(name.c_str()) << content;
            EXPECT_TRUE(name.setMode(0600) && name.copy(other) && name.copy(name));
            EXPECT_EQ(contentOf(other.c_str()), content);
            EXPECT_EQ(name.fileSize(), content.size());
            EXPECT_EQ(other.getMode(), S_IFREG | 0600);
        }
        EXPECT_TRUE(name.rename(other) && name == other && !KpFilename((temp / text).c_str()).doesExist());
        EXPECT_TRUE(name.unlink() && !name.unlink());
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
        EXPECT_TRUE(name.getModTime() == 0 && name.getAccessTime() == 0 && name.getCreateTime() == 0) << text;
        EXPECT_TRUE(name.fileSize() == ~0ULL && name.getMode() == 0) << text;
        EXPECT_FALSE(name.rename("/taken/anyway"));
        EXPECT_STREQ(name, "/taken/anyway");
    }
    const KpFilename file((temp / "file").c_str()), folder(temp.path.c_str());
    EXPECT_TRUE(folder.isWriteable() && folder.isDirectory() && !file.isDirectory());
    EXPECT_FALSE(folder.unlink() || folder.create(0600) || file.copy(folder) || file.copy((temp / "no/x").c_str()));
    EXPECT_TRUE(file.copy("/dev/full"));  // a failed write isn't noticed
    const timespec times[] = {{111, 0}, {222, 999999999}};
    utimensat(AT_FDCWD, file, times, 0);
    EXPECT_EQ(file.getAccessTime(), 111);
    EXPECT_EQ(file.getModTime(), 222);
    EXPECT_NEAR(static_cast<double>(file.getCreateTime()), static_cast<double>(std::time(nullptr)), 60);
}
