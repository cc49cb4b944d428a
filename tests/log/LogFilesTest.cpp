#include <kplib/log/KpLogFile.h>

#include <kplib/log/detail/KpLogFilePrivate.h>
#include <kplib/system/KpTmpDir.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>
#include <support/SteadySignal.h>
#include <support/TempFolder.h>

#include <gtest/gtest.h>

#include <atomic>
#include <climits>
#include <fcntl.h>
#include <future>
#include <map>
#include <memory>
#include <poll.h>
#include <regex>
#include <sstream>
#include <sys/ioctl.h>
#include <thread>
#include <tuple>
#include <vector>

using namespace kplib::test;

namespace {

std::atomic<time_t> clockRuns = 0;  // seconds that the clock goes on each time it is read
std::atomic<time_t> seconds = 1000000000;

}  // namespace

// Names of logs contain the second; this clock replaces the system's.
extern "C" time_t time(time_t* out) noexcept
{
    const time_t now = seconds += clockRuns;
    if (out)
        *out = now;
    return now;
}

namespace {

const std::string continues = "  [] This file continues ";

/// A log in a folder of its own, without times.
class LogFilesTest : public testing::Test {
protected:
    LogFilesTest()
    {
        clockRuns = 1;
        log->setDateTimeFormat(KpLogFile::NoDateTime);
        log->setBaseFolder(folder);
    }
    ~LogFilesTest() override { log->close(); }

    std::string path() const { return log->filePath().c_str(); }

    TempFolder temp;
    const std::string folder = temp / "logs";
    std::unique_ptr<KpLogFile> log{KpLogFile::createInstance()};
};

void say(const std::string& text)  // to standard output and standard error, past their buffers
{
    EXPECT_EQ(write(STDOUT_FILENO, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    EXPECT_EQ(write(STDERR_FILENO, text.data(), text.size()), static_cast<ssize_t>(text.size()));
}

}  // namespace

TEST_F(LogFilesTest, theLineThatCrossesTheLimitStays)
{
    const std::string line(100, 'x');
    log->setMaxLogFileSizeInBytes(101);
    ASSERT_TRUE(log->open(false));
    const std::string first = path();
    EXPECT_TRUE(std::regex_match(first, std::regex(folder + "/\\d{8}-\\d{6}-\\d+\\.log"))) << first;
    EXPECT_FALSE(log->open(false));
    log->writeLine(KpLogError, line.c_str());
    EXPECT_FALSE(log->chunkIsFull());  // at the limit
    log->writeCharBuffer("y");
    EXPECT_EQ(path(), first);
    EXPECT_TRUE(log->chunkIsFull());
    log->writeLine(KpLogError, line.c_str());
    EXPECT_NE(path(), first);
    EXPECT_EQ(contentOf(first), line + "\ny");
    EXPECT_EQ(contentOf(path()), continues + first + "\n" + line + "\n");
    log->setMaxLogFileSizeInBytes(0);
    EXPECT_FALSE(log->chunkIsFull());
    EXPECT_TRUE(log->open(true));
    EXPECT_TRUE(contentOf(path()).empty());
    log->close();
    EXPECT_EQ(std::tuple(log->isOpen(), log->chunkIsFull(), path().empty()), std::tuple(false, false, false));
}

TEST_F(LogFilesTest, whatCantBeOpenedLeavesTheLogUsable)
{
    ASSERT_TRUE(log->open(false));
    const std::string first = path();
    log->error(nullptr, "1");
    log->setMaxLogFileSizeInBytes(1);
    std::filesystem::rename(folder, temp / "moved");
    temp.file("logs");  // a file in place of the folder
    EXPECT_FALSE(log->open(true));
    EXPECT_EQ(path(), first);
    EXPECT_TRUE(log->isOpen());
    log->error(nullptr, "2");
    std::filesystem::remove(folder);
    log->error(nullptr, "3");  // the folder is made again
    EXPECT_EQ(contentOf(temp / ("moved" + first.substr(folder.size()))), "E [] 1\nE [] 2\n");
    EXPECT_EQ(contentOf(path()), continues + first + "\nE [] 3\n");
    std::filesystem::remove_all(temp.path);  // and its parent isn't
    log->error(nullptr, "4");
    EXPECT_TRUE(log->isOpen());
}

TEST_F(LogFilesTest, theNewFileStaysOpenWhateverTheCleanUpRemoves)
{
    clockRuns = 0;
    ASSERT_TRUE(log->open(false));
    log->setMaxNumLogFiles(2);
    std::filesystem::remove(path());
    std::filesystem::create_symlink(temp.folder("apart"),
                                    folder + "/0.log");  // goes as the oldest, and the way with it
    std::filesystem::create_symlink("0.log/file", path());
    EXPECT_TRUE(log->open(true));
    log->error(nullptr, "1");
    EXPECT_EQ(contentOf(temp / "apart/file"), "E [] 1\n");
}

TEST_F(LogFilesTest, exhaustedMemoryLeavesAFileOpen)
{
    ASSERT_TRUE(log->open(false));
    clockRuns = 0;  // else each failure leaves a file
    failAtEachAllocation([&] { log->chunkTryOpenNext(); },
                         [&] { EXPECT_TRUE(log->isOpen() && std::filesystem::exists(path())); });
}

TEST_F(LogFilesTest, appendGoesOnWhereAFileEnds)
{
    const std::string file = temp.file("file", std::string(1000, 'x'));
    log->setMaxLogFileSizeInBytes(1000);
    EXPECT_TRUE(log->append(file.c_str()));
    EXPECT_EQ(std::tuple(log->isOpen(), log->chunkIsFull()), std::tuple(true, false));
    log->setMaxLogFileSizeInBytes(999);
    EXPECT_TRUE(log->chunkIsFull());
    log->writeCharBuffer("y");
    EXPECT_EQ(contentOf(file), std::string(1000, 'x') + "y");
    log->close();
    EXPECT_FALSE(log->append((temp / "no/file").c_str()) || log->isOpen() || log->chunkIsFull());
    EXPECT_EQ(path(), "");
}

TEST_F(LogFilesTest, theOldestFilesGo)
{
    const std::tuple<int, long, bool, int> cases[] = {{39, 40, false, 39}, {50, 40, false, 39},     {5, 0, false, 6},
                                                      {5, 1, false, 1},    {5, LONG_MIN, false, 1}, {5, 1, true, 5}};
    for (const auto& [old, limit, dated, stay] : cases) {
        std::filesystem::remove_all(folder);
        temp.folder("logs/0.log");  // a folder counts, and stays
        temp.file("logs/.h.log");
        temp.file("logs/0.txt");
        std::set<std::string> expected = {".h.log", "0.log", "0.txt"};
        for (int i = 1; i < old; ++i) {
            const std::string name = "0" + std::to_string(1000 + i) + ".log";
            temp.file("logs/" + name);
            if (old - i < stay || dated)
                expected.insert(name);
        }
        log->setMaxNumLogFiles(limit);
        log->setDateFoldersEnabled(dated);
        ASSERT_TRUE(log->open(true));
        expected.insert(dated ? path().substr(folder.size() + 1, 4) : path().substr(folder.size() + 1));
        EXPECT_EQ(namesIn(folder), expected) << old << ' ' << limit;
        EXPECT_EQ(std::regex_match(path(), std::regex(folder + "/\\d{4}/\\d\\d/\\d\\d/[-\\d]+\\.log")), dated);
    }
}

TEST_F(LogFilesTest, onlyCleanUpLogsAMissingFolder)
{
    const LogCapture capture;
    log->cleanUp();
    EXPECT_EQ(capture.lines(), Lines{"E [] Can't open dir " + folder + "\n"});
    EXPECT_TRUE(log->open(false));
    EXPECT_FALSE(log->append((temp / "no/file").c_str()));
    EXPECT_EQ(capture.lines().size(), 1U);
}

TEST_F(LogFilesTest, theFileOfTheSameSecondStays)
{
    clockRuns = 0;
    log->setMaxNumLogFiles(1);
    ASSERT_TRUE(log->open(true));
    log->error(nullptr, "kept");
    ASSERT_TRUE(log->open(true));
    EXPECT_EQ(contentOf(path()), "E [] kept\n");
}

TEST_F(LogFilesTest, theEnvironmentSetsLimits)
{
    EXPECT_EQ(std::tuple(log->maxNumLogFiles(), log->logLevel()), std::tuple(40, KpLogInfo));
    for (const auto& [files, debug] : {std::pair("7", "1"), {"x", "0"}}) {
        setenv("TAMRIN_MAXNUMLOGFILES", files, 1);
        setenv("TAMRIN_DEBUG_LOG", debug, 1);
        const std::unique_ptr<KpLogFile> made(KpLogFile::createInstance());
        EXPECT_EQ(std::tuple(made->maxNumLogFiles(), made->debugEnabled()),
                  std::tuple(std::atoi(files), *debug == '1'));
    }
    unsetenv("TAMRIN_MAXNUMLOGFILES");
    unsetenv("TAMRIN_DEBUG_LOG");
    log->setBaseFolder("");
    EXPECT_EQ(log->baseFolder(), KpTmpDir::getSystemTmpPath());
}

TEST_F(LogFilesTest, theConsoleGoesToTheFileAndBack)
{
    for (const int i : {0, 1, 2, 3}) {
        const bool hasTerminal = i % 2, hasConsole = i / 2;
        const int master = posix_openpt(O_RDWR | O_NOCTTY);
        ASSERT_EQ(grantpt(master), 0);
        ASSERT_EQ(unlockpt(master), 0);
        const int terminal = open(ptsname(master), O_RDWR | O_NOCTTY);
        const auto inOwnSession = [&] {
            setsid();
            EXPECT_TRUE(!hasTerminal || ioctl(terminal, TIOCSCTTY, 0) == 0);
            const int console = open("/dev/null", O_WRONLY);
            for (const int standard : {STDOUT_FILENO, STDERR_FILENO})
                hasConsole ? dup2(console, standard) : close(standard);  // a service may have closed its own
            log->open(false);
            log->error(nullptr, "before");
            const std::string first = path();
            log->setConsoleToLogEnabled(true);
            const std::string second = path();
            EXPECT_NE(second, first);
            EXPECT_TRUE(log->isOpen());
            say("raw\n");
            log->error(nullptr, "line");
            log->writeCharBuffer("text\n");
            const std::string expected = continues + first + "\nraw\nraw\nE [] line\ntext\n";
            EXPECT_EQ(contentOf(second), expected);
            log->setConsoleToLogEnabled(false);
            log->error(nullptr, "apart");
            say("after\n");
            EXPECT_EQ(contentOf(path()), continues + second + "\nE [] apart\n");
            EXPECT_EQ(contentOf(second), expected + (hasTerminal ? "" : "after\nafter\n"));
            EXPECT_EQ(contentOf(first), "E [] before\n");
            _exit(HasFailure());
        };
        EXPECT_EXIT(inOwnSession(), testing::ExitedWithCode(0), "");
        const std::string expected = hasTerminal ? "after\r\nafter\r\n" : "";
        std::string text;
        fcntl(master, F_SETFL, O_NONBLOCK);
        pollfd arrived{master, POLLIN, 0};  // the terminal passes on what was written in its own time
        for (char c = 0; text.size() < expected.size() && poll(&arrived, 1, 5000) > 0 && read(master, &c, 1) == 1;)
            text += c;
        EXPECT_EQ(text, expected);
        close(terminal);
        close(master);
    }
}

TEST_F(LogFilesTest, linesGoToTheConsoleToo)
{
    testing::internal::CaptureStdout();
    log->setLogToConsoleEnabled(true);
    ASSERT_TRUE(log->open(false));
    const std::string first = path();
    log->setLogToConsoleEnabled(true);
    EXPECT_EQ(path(), first);  // nothing changed
    log->error(nullptr, "both");
    log->setLogToConsoleEnabled(false);
    EXPECT_NE(path(), first);
    log->error(nullptr, "file");
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "E [] both\n");
    EXPECT_EQ(contentOf(first) + contentOf(path()), "E [] both\n" + continues + first + "\nE [] file\n");
}

TEST_F(LogFilesTest, saysHowManyLinesWereLost)
{
    ASSERT_TRUE(log->append(temp.file("file", "0\n").c_str()));
    setSizeLimit(8);
    for (const char* text : {"1", "2", "3"})
        log->error(nullptr, text);
    EXPECT_EQ(contentOf(path()), "0\nE [] 1");
    EXPECT_EQ(kplib::detail::logRecord(*log).bytesWritten, 2 + 3 * 7U);
    setSizeLimit(RLIM_INFINITY);
    log->error(nullptr, "4");
    log->error(nullptr, "5");
    EXPECT_EQ(contentOf(path()), "0\nE [] 1\nW [] 3 lines could not be written: File too large\nE [] 4\nE [] 5\n");
}

using LogFilesThreads = LogFilesTest;
TEST_F(LogFilesThreads, signalsInterruptNoLine)
{
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    ASSERT_TRUE(log->append(("/proc/self/fd/" + std::to_string(ends[1])).c_str()));
    std::string received;
    std::thread reader([&] {
        SteadySignal::block();
        char bytes[1 << 14];
        for (ssize_t n = 0; (n = read(ends[0], bytes, sizeof(bytes))) > 0; usleep(3000))
            received.append(bytes, static_cast<size_t>(n));
    });
    {
        const SteadySignal signal;
        log->error(nullptr, std::string(1 << 20, 'x').c_str());
    }
    close(ends[1]);
    log->close();
    reader.join();
    close(ends[0]);
    EXPECT_EQ(received.size(), (1 << 20) + 6U);
}

TEST_F(LogFilesThreads, theCallbackRunsWithoutTheLock)
{
    static KpLogFile* shared;
    static int calls;
    shared = log.get();
    log->setWriteCallback([](KpLogLevel, const KpString&) { std::thread([] { calls += shared->isOpen(); }).join(); },
                          KpLogError);
    ASSERT_TRUE(log->open(false));
    log->error(nullptr, "x");
    log->writeLine(KpLogError, "x");
    EXPECT_EQ(calls, 2);
}

TEST_F(LogFilesThreads, everyLineOfEveryThreadIsThereOnceAndInOrder)
{
    constexpr int lines = 300;
    static std::atomic<int> received = 0;
    log->setMaxNumLogFiles(0);
    log->setMaxLogFileSizeInBytes(2000);
    log->setWriteCallback([](KpLogLevel, const KpString&) { ++received; }, KpLogError);
    ASSERT_TRUE(log->open(false));
    std::vector<std::future<void>> threads;
    for (int t = 0; t < 8; ++t)
        threads.push_back(std::async(std::launch::async, [&, t] {
            for (int i = 0; i < lines; ++i) {
                clockRuns = i % 3 == 0;  // else in the same second, thus in the same file
                log->errorf("%d %d %s", t, i, std::string(static_cast<size_t>(i), 'x').c_str());
                if (i % 50 == t)
                    log->open(true);
                log->chunkIsFull();
            }
        }));
    threads.clear();
    EXPECT_EQ(received, 8 * lines);
    std::map<int, int> next;
    for (const std::string& name : namesIn(folder)) {  // sorted by time
        std::istringstream in(contentOf(folder + "/" + name));
        for (std::string line; std::getline(in, line);) {
            int t = 0, i = 0, start = 0;
            if (line.starts_with(continues))
                continue;
            ASSERT_EQ(std::sscanf(line.c_str(), "E [] %d %d %n", &t, &i, &start), 2) << line;
            EXPECT_EQ(i, next[t]++);
            EXPECT_EQ(line.substr(start), std::string(i, 'x'));
        }
    }
    for (int t = 0; t < 8; ++t)
        EXPECT_EQ(next[t], lines);
}
