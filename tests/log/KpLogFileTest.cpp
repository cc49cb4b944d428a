#include <kplib/log/KpLogFile.h>

#include <kplib/log/KpLogFileDefaultModuleModifier.h>
#include <kplib/log/KpLogFileWriteCallbackDisabler.h>
#include <kplib/log/detail/KpLogFilePrivate.h>

#include <support/ExhaustedMemory.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <future>
#include <memory>
#include <regex>
#include <string>
#include <sys/mman.h>
#include <thread>
#include <tuple>
#include <unistd.h>

namespace {

std::string received;

void receive(KpLogLevel level, const KpString& line)
{
    received += std::to_string(level) + line.c_str();
}

// A log that writes to a file in memory, without times.
class KpLogFileTest : public testing::Test {
protected:
    KpLogFileTest()
    {
        record.file = memfd_create("log", 0);
        log->setDateTimeFormat(KpLogFile::NoDateTime);
    }
    // What was written since the last take().
    std::string take() const
    {
        std::string text(static_cast<size_t>(lseek(record.file, 0, SEEK_CUR)), ' ');
        EXPECT_EQ(pread(record.file, text.data(), text.size(), 0), lseek(record.file, 0, SEEK_CUR));
        lseek(record.file, 0, SEEK_SET);
        return text;
    }

    std::unique_ptr<KpLogFile> log{KpLogFile::createInstance()};
    KpLogFilePrivate& record = kplib::detail::logRecord(*log);
};

}  // namespace

TEST_F(KpLogFileTest, linesHaveOneShape)
{
    log->setLogLevel(KpLogDebug);
    const char* const cases[][4] = {{"DX", "Dicom", "text", "D [Dicom] text\n"}, {"Info", "", "%d", "  [] %d\n"},
                                    {"W", nullptr, "x\n\n", "W [] x\n\n"},       {"E", "", "text", "E [] text\n"},
                                    {"warning", nullptr, "text", "C [] text\n"}, {nullptr, nullptr, "", "C [] \n"}};
    for (const auto& [level, module, message, line] : cases) {
        log->trace(KpLogLevelFromString(level, nullptr), module, message);
        EXPECT_EQ(take(), line);
    }
    log->writeLine(KpLogError, "");
    log->setDefaultModule("Def");
    log->print("Mod", "%d");
    log->errorf("%d %s", 3, std::string(5000, 'c').c_str());
    log->tracef(KpLogCritical, "Mod", "%d %s", 4, "d");
    EXPECT_EQ(take(), "\n  [Mod] %d\nE [Def] 3 " + std::string(5000, 'c') + "\nC [Mod] 4 d\n");
}

TEST_F(KpLogFileTest, thresholdsOfFileAndCallbackAreIndependent)
{
    for (int i = 0; i < 6 * 6 * 5; ++i) {
        const int file = i % 6, callback = i / 6 % 6, message = i / 36;  // 5 is off
        received.clear();
        log->setLogLevel(KpLogLevel(file));
        log->setWriteCallback(receive, KpLogLevel(callback));
        log->trace(KpLogLevel(message), nullptr, "text");
        EXPECT_EQ(take().empty(), message < file) << i;
        EXPECT_EQ(received, message < callback ? "" : std::to_string(message) + "D WEC"[message] + " [] text") << i;
        EXPECT_EQ(log->debugEnabled(), file == 0 || callback == 0) << i;
    }
}

TEST_F(KpLogFileTest, linesGoWhereTheFlagsLead)
{
    const std::tuple<bool, bool, bool, const char*, const char*> cases[] = {
        {true, false, false, "E [] x\nraw", ""}, {true, false, true, "E [] x\nraw", "E [] x\nraw"},
        {true, true, false, "raw", "E [] x\n"},  {true, true, true, "raw", "E [] x\nraw"},
        {false, false, false, "", "E [] x\n"},   {false, false, true, "", "E [] x\nraw"}};
    const int file = record.file;
    for (const auto& [hasFile, consoleToLog, logToConsole, toFile, toConsole] : cases) {
        record.file = hasFile ? file : -1;
        record.consoleToLogEnabled = consoleToLog;
        record.logToConsoleEnabled = logToConsole;
        testing::internal::CaptureStdout();
        log->error(nullptr, "x");
        log->writeCharBuffer("raw");
        const auto isFree = [] { return ftrylockfile(stdout) == 0 && (funlockfile(stdout), true); };
        EXPECT_TRUE(std::async(std::launch::async, isFree).get());
        EXPECT_EQ(testing::internal::GetCapturedStdout(), toConsole);
        record.file = file;
        EXPECT_EQ(take(), toFile);
    }
}

TEST_F(KpLogFileTest, timeIsLocalOrSinceTheStamp)
{
    kplib::detail::LogClock clock;
    setenv("TZ", "TST-5:30", 1);
    EXPECT_EQ(clock.dateAndTime({59, 7}), "1970-01-01 05:30:59.007");
    setenv("TZ", "UTC0", 1);
    EXPECT_EQ(clock.dateAndTime({59, 900}), "1970-01-01 00:00:59.900");
    unsetenv("TZ");
    EXPECT_EQ(clock.elapsed({1000, 900}, {1001, 100}), "00:00:00.200");
    EXPECT_EQ(clock.elapsed({1000, 100}, {1000 + 25 * 3600 + 2 * 60 + 3, 104}), "01:02:03.004");
    log->resetTimeStamp();
    record.timeStamp.seconds -= 3600;
    log->setDateTimeFormat(KpLogFile::TimeOnly);
    log->error("M", "text");
    EXPECT_TRUE(std::regex_match(take(), std::regex("01:00:\\d\\d\\.\\d{3}: E \\[M\\] text\n")));
}

TEST(KpLogFileCompanions, restoreWhatTheyFound)
{
    KpLogFile& log = getTheLogInstance();
    log.setWriteCallback(receive, KpLogWarning);
    {
        const KpLogFileDefaultModuleModifier outer("outer");
        kplib::test::failAtEachAllocation(
            [] { const KpLogFileDefaultModuleModifier longer("longer than there was room"); },
            [&] { EXPECT_STREQ(log.defaultModule(), "outer"); });
        const KpLogFileScopedWriteCallbackDisabler scoped;
        EXPECT_FALSE(log.writeCallback());
    }
    EXPECT_FALSE(log.defaultModule());
    EXPECT_EQ(std::tuple(log.writeCallback(), log.writeCallbackLogLevel()), std::tuple(&receive, KpLogWarning));
    log.setWriteCallback(nullptr, KpLogOff);
}

TEST_F(KpLogFileTest, exhaustedMemoryLeavesNoLockBehind)
{
    kplib::test::failAtEachAllocation(
        [&] { log->tracef(KpLogError, nullptr, "%0100d", 1); },
        [&] { std::thread([&] { EXPECT_TRUE(record.mutex.tryLock() && (record.mutex.unlock(), true)); }).join(); });
}
