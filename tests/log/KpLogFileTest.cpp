#include <kplib/log/KpLogFile.h>

#include <kplib/log/KpLogFileDefaultModuleModifier.h>
#include <kplib/log/KpLogFileWriteCallbackDisabler.h>
#include <kplib/log/detail/KpLogFilePrivate.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <regex>
#include <string>
#include <thread>
#include <vector>

namespace {

// A log that writes to a file of its own.
class FileLog {
public:
    explicit FileLog(const char* path = nullptr) { record().file = path ? std::fopen(path, "w") : std::tmpfile(); }

    KpLogFile* operator->() { return log_.get(); }
    KpLogFilePrivate& record() { return logRecord(*log_); }

    /// What has reached the file, whose stream no longer holds anything back, and empties it.
    std::string take()
    {
        FILE* const file = record().file;
        const int descriptor = fileno(file);
        std::string text(static_cast<size_t>(lseek(descriptor, 0, SEEK_END)), '\0');
        EXPECT_EQ(pread(descriptor, text.data(), text.size(), 0), static_cast<ssize_t>(text.size()));
        std::rewind(file);
        EXPECT_EQ(ftruncate(descriptor, 0), 0);
        return text;
    }

private:
    std::unique_ptr<KpLogFile> log_{KpLogFile::createInstance()};
};

std::vector<std::string> received;

void receive(KpLogLevel level, const KpString& line)
{
    received.push_back(std::to_string(level) + line.c_str());
}

const std::string threadLine(500, 'x');

}  // namespace

TEST(KpLogLevel, lettersAndBack)
{
    const struct {
        const char* text;
        KpLogLevel level;
        bool ok;
    } cases[] = {
        {"D", KpLogDebug, true},           {"DX", KpLogDebug, true},          {"Info", KpLogInfo, true},
        {"Warning", KpLogWarning, true},   {"warning", KpLogCritical, false}, {"E", KpLogError, true},
        {"Critical", KpLogCritical, true}, {"", KpLogCritical, false},        {nullptr, KpLogCritical, false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text ? c.text : "null");
        bool ok = !c.ok;
        EXPECT_EQ(KpLogLevelFromString(c.text, &ok), c.level);
        EXPECT_EQ(ok, c.ok);
        EXPECT_EQ(KpLogLevelFromString(c.text, nullptr), c.level);
        if (c.ok) {
            EXPECT_EQ(*KpLogLevelToString(c.level), *c.text);
        }
    }
    for (int other : {-1, 5, 1000})
        EXPECT_STREQ(KpLogLevelToString(static_cast<KpLogLevel>(other)), "");
}

TEST(KpLogFile, linesHaveOneShape)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::NoDateTime);
    log->setLogLevel(KpLogDebug);
    const struct {
        const char* defaultModule;
        int level;
        const char *module, *text, *line;
    } cases[] = {
        {"", 0, "Dicom", "text", "D [Dicom] text\n"},
        {"", 1, "Dicom", "text", "  [Dicom] text\n"},
        {"", 2, nullptr, "text", "W [] text\n"},
        {"Net", 3, nullptr, "text", "E [Net] text\n"},
        {"Net", 4, "Dicom", "text", "C [Dicom] text\n"},
        {"Net", 7, "", "text", "  [] text\n"},
        {"", 1, nullptr, "", "  [] \n"},
        {"", 2, nullptr, "x\n", "W [] x\n"},
        {"", 2, nullptr, "x\n\n", "W [] x\n\n"},
        {"", 2, nullptr, "100%d", "W [] 100%d\n"},
    };
    for (const auto& c : cases) {
        log->setDefaultModule(c.defaultModule);
        log->trace(static_cast<KpLogLevel>(c.level), c.module, c.text);
        EXPECT_EQ(log.take(), c.line);
    }
    log->writeLine(KpLogError, "");
    EXPECT_EQ(log.take(), "\n");
}

TEST(KpLogFile, eachOperationHasItsLevelAndModule)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::NoDateTime);
    log->setDefaultModule("Def");
    log->print("Mod", "%d");
    log->printf("%d %s", 1, "a");
    log->warn("Mod", "%d");
    log->warnf("%d %s", 2, "b");
    log->error("Mod", "%d");
    log->errorf("%d %s", 3, std::string(5000, 'c').c_str());
    log->tracef(KpLogCritical, "Mod", "%d %s", 4, "d");
    EXPECT_EQ(log.take(), "  [Mod] %d\n  [Def] 1 a\nW [Mod] %d\nW [Def] 2 b\nE [Mod] %d\nE [Def] 3 " +
                              std::string(5000, 'c') + "\nC [Mod] 4 d\n");
}

TEST(KpLogFile, thresholdsOfFileAndCallbackAreIndependent)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::NoDateTime);
    const struct {
        KpLogLevel file, callback, message;
        bool written, called, debug;
    } cases[] = {
        {KpLogWarning, KpLogDebug, KpLogInfo, false, true, true},
        {KpLogInfo, KpLogError, KpLogWarning, true, false, false},
        {KpLogDebug, KpLogOff, KpLogCritical, true, false, true},
        {KpLogOff, KpLogCritical, KpLogCritical, false, true, false},
    };
    for (const auto& c : cases) {
        received.clear();
        log->setLogLevel(c.file);
        log->setWriteCallback(receive, c.callback);
        log->trace(c.message, "M", "text");
        EXPECT_EQ(!log.take().empty(), c.written);
        EXPECT_EQ(received.size(), size_t{c.called});
        EXPECT_EQ(log->debugEnabled(), c.debug);
    }
    received.clear();
    log->error("M", "a");
    log->error("M", "b\n");
    EXPECT_TRUE(received.empty());
    log->setWriteCallback(receive, KpLogError);
    log->error("M", "a");
    log->error("M", "b\n");
    EXPECT_EQ(received, (std::vector<std::string>{"3E [M] a", "3E [M] b\n"})) << "as the line is, no newline added";
}

TEST(KpLogFile, callbackRunsWithoutTheLock)
{
    static KpLogFile* writer;
    FileLog log;
    writer = log.operator->();
    log->setDateTimeFormat(KpLogFile::NoDateTime);
    log->setWriteCallback(
        [](KpLogLevel, const KpString&) { std::thread([] { writer->print("C", "from another thread"); }).join(); },
        KpLogError);
    log->error("A", "text");
    EXPECT_EQ(log.take(), "E [A] text\n  [C] from another thread\n");
}

TEST(KpLogFile, linesGoWhereTheFlagsLead)
{
    const struct {
        bool hasFile, consoleToLog, logToConsole;
        const char *toFile, *toConsole, *rawToFile, *rawToConsole;
    } cases[] = {
        {true, false, false, "E [] x\n", "", "raw", ""}, {true, false, true, "E [] x\n", "E [] x\n", "raw", "raw"},
        {true, true, false, "", "E [] x\n", "raw", ""},  {true, true, true, "", "E [] x\n", "raw", "raw"},
        {false, false, false, "", "E [] x\n", "", ""},   {false, false, true, "", "E [] x\n", "", "raw"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << c.hasFile << c.consoleToLog << c.logToConsole);
        FileLog log;
        FILE* const file = log.record().file;
        log.record().file = c.hasFile ? file : nullptr;
        log.record().consoleToLogEnabled = c.consoleToLog;
        log.record().logToConsoleEnabled = c.logToConsole;
        log->setDateTimeFormat(KpLogFile::NoDateTime);
        testing::internal::CaptureStdout();
        log->error(nullptr, "x");
        EXPECT_EQ(testing::internal::GetCapturedStdout(), c.toConsole);
        EXPECT_EQ(log.record().bytesWritten, 7u);
        log.record().bytesWritten = 0;
        testing::internal::CaptureStdout();
        log->writeCharBuffer("raw");
        EXPECT_EQ(testing::internal::GetCapturedStdout(), c.rawToConsole);
        EXPECT_EQ(log.record().bytesWritten, c.hasFile ? 3u : 0u);
        log.record().file = file;
        EXPECT_EQ(log.take(), std::string(c.toFile) + c.rawToFile);
    }
}

TEST(KpLogFile, aFullDiskIsNobodysBusiness)
{
    FileLog log("/dev/full");
    for (int i = 0; i < 3000; ++i)
        log->error("M", "text");
    log->writeCharBuffer("text");
    log->flush();
}

TEST(KpLogFile, timeIsLocal)
{
    FileLog log;
    KpString text("old");
    log->timeString(text, KpLogFile::NoDateTime);
    EXPECT_TRUE(text.isEmpty());
    log->timeString(text, static_cast<KpLogFile::DateTimeFormat>(3));
    EXPECT_TRUE(text.isEmpty());
    const char* const zone = std::getenv("TZ");
    const std::string before = zone ? zone : "";
    const struct {
        const char* zone;
        long offset;
    } cases[] = {{"UTC0", 0}, {"TST-5:30", 19800}, {"UTC0", 0}, {"TST11", -39600}};
    for (const auto& c : cases) {  // within one second, as a rule
        SCOPED_TRACE(c.zone);
        setenv("TZ", c.zone, 1);
        char expected[32];
        time_t now = 0;
        do {  // again, should the second have changed
            now = kplib::platform::wallTime().seconds;
            const time_t shifted = now + c.offset;
            tm fields{};
            strftime(expected, sizeof expected, "%Y-%m-%d %H:%M:%S.", gmtime_r(&shifted, &fields));
            log->timeString(text, KpLogFile::DateAndTime);
        } while (now != kplib::platform::wallTime().seconds);
        EXPECT_TRUE(std::regex_match(text.c_str(), std::regex(std::string(expected) + "\\d\\d\\d"))) << text;
    }
    zone ? setenv("TZ", before.c_str(), 1) : unsetenv("TZ");
    log->error("M", "text");
    EXPECT_TRUE(std::regex_match(log.take(), std::regex("\\d\\d:\\d\\d:\\d\\d\\.\\d\\d\\d: E \\[M\\] text\n")));
}

TEST(KpLogFile, relativeTimeCountsFromTheStamp)
{
    kplib::detail::KpLogClock clock;
    EXPECT_EQ(clock.elapsed({1000, 900}, {1001, 100}), "00:00:00.200");
    EXPECT_EQ(clock.elapsed({1000, 100}, {1000 + 3600 + 2 * 60 + 3, 104}), "01:02:03.004");
    FileLog log;
    KpString text;
    log->resetTimeStamp();
    log->timeString(text, KpLogFile::TimeOnly);
    EXPECT_TRUE(std::string(text.c_str()).starts_with("00:00:00.")) << text;
    log.record().timeStamp.seconds -= 25 * 3600;
    log->timeString(text, KpLogFile::TimeOnly);
    EXPECT_TRUE(std::string(text.c_str()).starts_with("01:00:00.")) << text;
    log->timeString(text, KpLogFile::DateAndTime);
    EXPECT_EQ(text.length(), 23);
}

TEST(KpLogFileCompanions, defaultModulesNest)
{
    KpLogFile& log = getTheLogInstance();
    EXPECT_EQ(log.defaultModule(), nullptr);
    {
        const KpLogFileDefaultModuleModifier outer("outer");
        {
            const KpLogFileDefaultModuleModifier inner(nullptr);
            EXPECT_EQ(log.defaultModule(), nullptr);
        }
        EXPECT_STREQ(log.defaultModule(), "outer");
        log.setDefaultModule(log.defaultModule() + 2);
        EXPECT_STREQ(log.defaultModule(), "ter");
    }
    EXPECT_EQ(log.defaultModule(), nullptr);
    kplib::test::failAtEachAllocation(
        [] { const KpLogFileDefaultModuleModifier modifier(std::string(100, 'm').c_str()); },
        [&] { EXPECT_EQ(log.defaultModule(), nullptr); });
}

TEST(KpLogFileCompanions, callbackIsTurnedOffAndOn)
{
    KpLogFile& log = getTheLogInstance();
    log.setWriteCallback(receive, KpLogWarning);
    KpLogFileWriteCallbackDisabler disabler;
    EXPECT_EQ(log.writeCallback(), receive);
    {
        const KpLogFileScopedWriteCallbackDisabler scoped;
        EXPECT_EQ(log.writeCallback(), nullptr);
        EXPECT_EQ(log.writeCallbackLogLevel(), 5);
    }
    disabler.disableWriteCallback();
    EXPECT_EQ(log.writeCallback(), nullptr);
    disabler.restoreWriteCallback();
    EXPECT_EQ(log.writeCallback(), receive);
    EXPECT_EQ(log.writeCallbackLogLevel(), KpLogWarning);
    log.setWriteCallback(nullptr, KpLogOff);
}

TEST(KpLogFile, exhaustedMemoryLeavesTheLogAsItWas)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::DateAndTime);
    log->setDefaultModule("before");
    kplib::test::failAtEachAllocation(
        [&] {
            log->tracef(KpLogError, nullptr, "%0100d", 1);
            KpString time;
            log->timeString(time, KpLogFile::TimeOnly);
            log->setDefaultModule("a module that is too long for the memory that there is");
        },
        [&] {
            bool free = false;
            std::thread([&] {
                free = log.record().mutex.tryLock();
                if (free)
                    log.record().mutex.unlock();
            }).join();
            EXPECT_TRUE(free);
        });
    EXPECT_STREQ(log->defaultModule(), "a module that is too long for the memory that there is");
}

TEST(KpLogFileThreads, linesDontInterleave)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::TimeOnly);
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] {
            for (int k = 0; k < 200; ++k) {
                log->errorf("%s", threadLine.c_str());
                log->setDefaultModule(k % 2 ? "a" : "b");
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    const std::string text = log.take();
    EXPECT_EQ(text.size(), log.record().bytesWritten);
    const std::string tail = "] " + threadLine + "\n";
    size_t lines = 0;
    for (size_t at = 0; at < text.size(); ++lines) {
        const size_t end = text.find('\n', at) + 1;
        EXPECT_EQ(text.find(tail, at) + tail.size(), end);
        at = end;
    }
    EXPECT_EQ(lines, 800u);
}
