#include "support/ExhaustedMemory.h"
#include "support/LogCapture.h"
#include "support/TempFolder.h"

#include <kplib/system/KpDSO.h>
#include <kplib/system/KpFilename.h>

#include <dlfcn.h>
#include <gtest/gtest.h>

namespace fs = std::filesystem;
using namespace kplib::test;

namespace {

/// A folder for copies of the sample plug-in, each with a state of its own; the search path is the test's.
class SharedObject : public testing::Test {
protected:
    ~SharedObject() override
    {
        KpDSO::dsoSearchPath.clear();
        KpDSO::verbose = 0;
    }

    std::string plugin(const std::string& name) const
    {
        fs::create_directories((folder / name).parent_path());
        fs::copy_file(KPLIB_SAMPLE_PLUGIN, folder / name);
        return folder / name;
    }

    const kplib::test::TempFolder temp;  // what is loaded twice is there but once
    const fs::path folder = temp.path;
    LogCapture log;
};

}  // namespace

TEST_F(SharedObject, makesTheNameOfALibraryOfABareOne)
{
    const std::pair<const char*, const char*> cases[] = {{"foo", "libfoo.so"},     {"library", "library.so"},
                                                         {"/a/foo", "/a/foo.so"},  {"a/foo", "liba/foo.so"},
                                                         {"libfoo.1", "libfoo.1"}, {"./foo", "./foo"}};
    for (const auto& [name, expected] : cases) {
        KpFilename fixed(name);
        KpDSO::fixPath(fixed);
        EXPECT_STREQ(fixed, expected) << name;
    }
}

TEST_F(SharedObject, isLookedForFromTheLastFolderToTheFirst)
{
    for (const char* name :
         {"one/libpick.so", "two/libpick.so", "one/libskip.so", "one/libtext.so", "one/sub/deep.so", "two/libpick.7"})
        plugin(name);
    std::ofstream(plugin("two/libskip.so")) << "neither an object nor a script";
    std::ofstream(plugin("two/libtext.so")) << "/* GNU ld script */\nINPUT ( libm.so.6 )\n";
    std::string searched[] = {folder / "one", folder / "two", folder / "gone"};
    for (std::string& path : searched)
        KpDSO::dsoSearchPath.append(path.data());
    EXPECT_NE(KpDSO("libm.so.6").getSymbol("cos"), nullptr) << "when all folders have failed";
    const std::pair<const char*, const char*> cases[] = {
        {"pick", "two/libpick.so"}, {"libpick", "two/libpick.so"},      {"libpick.7", "two/libpick.7"},
        {"skip", "one/libskip.so"}, {"sub/deep.so", "one/sub/deep.so"}, {"text", "one/libtext.so"}};
    for (const auto& [name, expected] : cases) {
        KpDSO object(nullptr);
        EXPECT_EQ(object.open(name, true), 0) << name;
        Dl_info origin{};
        EXPECT_TRUE(dladdr(object.getSymbol("sampleStarts"), &origin));
        EXPECT_EQ(origin.dli_fname, (folder / expected).string());
    }
    KpDSO object(nullptr);
    for (const char* missing : {"pick.so", "deep", "libskip.7", static_cast<const char*>(nullptr)}) {
        EXPECT_EQ(object.open("pick", true), 0);
        EXPECT_EQ(object.open(missing, true), -1);
        EXPECT_FALSE(object.isOpen()) << "the object before is forgotten";
    }
}

TEST_F(SharedObject, isStartedAtEachOpeningIfItHasAFunctionForThat)
{
    const std::tuple<const char*, const char*, int> cases[] = {{"a/libsample.x.so", "a/libsample.x.so", 0},
                                                               {"b/libsample.so", "b/libsample", 1},
                                                               {"xyzsample.9", "xyzsample.9", 1},
                                                               {"d/s.", "d/s.", 0}};
    for (const auto& [name, opened, expected] : cases) {
        plugin(name);
        KpDSO object((folder / opened).c_str());
        ASSERT_TRUE(object.isOpen()) << name;
        EXPECT_EQ(object.executeInt("sampleStarts"), expected) << name;
        EXPECT_EQ(object.open((folder / opened).c_str(), false), 0);
        EXPECT_EQ(object.executeInt("sampleStarts"), 2 * expected) << name;
    }
}

TEST_F(SharedObject, isCalledWithUpToFivePointersWhileItIsOpen)
{
    const std::string path = plugin("libcalls.so");
    KpDSO object(path.c_str());
    EXPECT_NE(dlsym(RTLD_DEFAULT, "sampleTold"), nullptr) << "for those that are loaded later";
    int n[] = {1, 2, 3, 4, 5};
    EXPECT_EQ(object.executeInt("sampleTwo", n, n + 1), 12);
    object.execute("sampleTell", n + 4, n + 3, n + 2, n + 1, n);
    EXPECT_EQ(object.executeInt("sampleTold"), 54321);
    EXPECT_EQ(object.executePtr("sampleLast", nullptr, n, n, n, n + 3), n + 3);
    const auto told = reinterpret_cast<int (*)()>(object.getSymbol("sampleTold"));
    object.close();
    EXPECT_EQ(object.executeInt("sampleTwo", n, n), 0);
    object.execute("sampleTell", n, n, n, n, n);
    EXPECT_EQ(object.executePtr("sampleLast", n, n, n, n, n), nullptr);
    EXPECT_EQ(object.getSymbol("sampleTold"), nullptr);
    EXPECT_EQ(told(), 54321) << "the code stays in the process";
}

TEST_F(SharedObject, tellsInTheLogThatThereWasSomething)
{
    const auto linesOf = [](auto) { return std::exchange(LogCapture::lines(), {}); };
    const std::string path = plugin("libother.so"), missing = folder / "libmissing.so";
    KpDSO object(nullptr);
    const auto open = [&](const std::string& name, bool quiet) { return linesOf(object.open(name.c_str(), quiet)); };
    const auto look = [&](const char* symbol) { return linesOf(object.getSymbol(symbol)); };
    const std::string line = "  [] DSO", fixed = "  [] Fixed symbol sampleUnderscored by prepending '_'\n";
    EXPECT_EQ(open(missing, false), Lines{line});
    EXPECT_EQ(open(missing, true), Lines());
    EXPECT_EQ(open(path, false), Lines());
    EXPECT_EQ(look("sampleNone"), Lines());
    EXPECT_EQ(look("sampleUnderscored"), Lines{fixed});
    KpDSO::verbose = 1;
    EXPECT_EQ(look("sampleNone"), (Lines{line, "E [] DSO"}));
    EXPECT_EQ(look("sampleUnderscored"), (Lines{line, fixed}));
    EXPECT_EQ(open(path, false), (Lines{line, line, "E [] DSO"})) << "with the look for the function that starts it";

    EXPECT_EQ(object.executeInt("sampleUnderscored"), 77);
    KpString message;
    EXPECT_EQ(object.tryOpen(path.c_str(), message), 0);
    EXPECT_EQ(message, ("Successfully opened " + path + ".\n").c_str());
    EXPECT_EQ(object.tryOpen(missing.c_str(), message), -1);
    EXPECT_EQ(std::string(message).find("Couldn't open " + missing + ":\n" + missing), 0U) << message;
    EXPECT_FALSE(object.isOpen());
}

TEST_F(SharedObject, leavesNothingWhereItsOpeningThrows)
{
    failAtEachAllocation([] { const KpDSO missing("/missing.so"); }, [] {});
}
