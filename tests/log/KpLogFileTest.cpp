#include <kplib/log/KpLogFile.h>

#include <kplib/log/KpLogFileDefaultModuleModifier.h>
#include <kplib/log/KpLogFileWriteCallbackDisabler.h>
#include <kplib/log/detail/KpLogFilePrivate.h>

#include <support/ExhaustedMemory.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <future>
#include <memory>
#include <regex>
#include <string>
#include <string_view>
#include <thread>
#include <utility>

namespace {

// A log that writes to a file in memory, without times.
class FileLog {
public:
    FileLog()
    {
        record().file = open_memstream(&text_, &size_);
        log_->setDateTimeFormat(KpLogFile::NoDateTime);
    }
    ~FileLog()
    {
        log_.reset();
        std::free(text_);
    }
    KpLogFile* operator->() { return log_.get(); }
    KpLogFilePrivate& record() { return kplib::detail::logRecord(*log_); }

    /// What was flushed since the last take().
    std::string take()
    {
        const std::string text(text_, size_);
        std::rewind(record().file);
        size_ = 0;
        return text;
    }

private:
    char* text_ = nullptr;
    size_t size_ = 0;
    std::unique_ptr<KpLogFile> log_{KpLogFile::createInstance()};
};

std::string received;

void receive(KpLogLevel level, const KpString& line)
{
    received += std::to_string(level) + line.c_str();
}

}  // namespace

TEST(KpLogLevel, isReadByItsFirstLetter)
{
    const std::pair<const char*, int> cases[] = {{"DX", 0}, {"Info", 1},    {"W", 2}, {"E", 3},
                                                 {"C", 4},  {"warning", 5}, {"", 5},  {nullptr, 5}};
    for (const auto& [text, level] : cases) {
        bool ok = level == 5;
        EXPECT_EQ(KpLogLevelFromString(text, &ok), std::min(level, 4));
        EXPECT_EQ(ok, level < 5);
    }
}

TEST(KpLogFile, linesHaveOneShape)
{
    FileLog log;
    log->setLogLevel(KpLogDebug);
    // clang-format off
    const struct {
        int level;
        const char *module, *text, *line;
    } cases[] = {
        {0, "Dicom", "text", "D [Dicom] text\n"},
        {1, "Dicom", "text", "  [Dicom] text\n"},
        {2, nullptr, "text", "W [] text\n"},
        {3, "", "text", "E [] text\n"},
        {4, "Dicom", "%d", "C [Dicom] %d\n"},
        {7, nullptr, "text", "  [] text\n"},
        {1, nullptr, "", "  [] \n"},
        {2, nullptr, "x\n\n", "W [] x\n\n"},
    };
    // clang-format on
    for (const auto& c : cases) {
        log->trace(static_cast<KpLogLevel>(c.level), c.module, c.text);
        EXPECT_EQ(log.take(), c.line);
    }
    log->writeLine(KpLogError, "");
    log->setDefaultModule("Def");
    log->print("Mod", "%d");
    log->warnf("%d %s", 2, "b");
    log->errorf("%d %s", 3, std::string(5000, 'c').c_str());
    log->tracef(KpLogCritical, "Mod", "%d %s", 4, "d");
    const std::string lines = "\n  [Mod] %d\nW [Def] 2 b\nE [Def] 3 " + std::string(5000, 'c') + "\nC [Mod] 4 d\n";
    EXPECT_EQ(log.take(), lines);
}

TEST(KpLogFile, thresholdsOfFileAndCallbackAreIndependent)
{
    FileLog log;
    // clang-format off
    const struct {
        KpLogLevel file, callback, message;
        const char *written, *called;
        bool debug;
    } cases[] = {
        {KpLogWarning, KpLogDebug, KpLogInfo, "", "1  [] text", true},  // without the added newline
        {KpLogInfo, KpLogError, KpLogWarning, "W [] text\n", "", false},
        {KpLogDebug, KpLogOff, KpLogCritical, "C [] text\n", "", true},
        {KpLogOff, KpLogCritical, KpLogCritical, "", "4C [] text", false},
    };
    // clang-format on
    for (const auto& c : cases) {
        received.clear();
        log->setLogLevel(c.file);
        log->setWriteCallback(receive, c.callback);
        log->trace(c.message, nullptr, "text");
        EXPECT_TRUE(log.take() == c.written && received == c.called && log->debugEnabled() == c.debug);
    }
}

TEST(KpLogFile, linesGoWhereTheFlagsLead)
{
    const struct {
        bool hasFile, consoleToLog, logToConsole;
        const char *toFile, *toConsole;
    } cases[] = {{true, false, false, "E [] x\nraw", ""}, {true, false, true, "E [] x\nraw", "E [] x\nraw"},
                 {true, true, false, "raw", "E [] x\n"},  {true, true, true, "raw", "E [] x\nraw"},
                 {false, false, false, "", "E [] x\n"},   {false, false, true, "", "E [] x\nraw"}};
    for (const auto& c : cases) {
        FileLog log;
        FILE* const file = std::exchange(log.record().file, c.hasFile ? log.record().file : nullptr);
        log.record().consoleToLogEnabled = c.consoleToLog;
        log.record().logToConsoleEnabled = c.logToConsole;
        testing::internal::CaptureStdout();
        log->error(nullptr, "x");
        log->writeCharBuffer("raw");
        EXPECT_EQ(testing::internal::GetCapturedStdout(), c.toConsole);
        log.record().file = file;
        EXPECT_EQ(log.take(), c.toFile);
    }
}

TEST(KpLogFile, timeIsLocalOrSinceTheStamp)
{
    FileLog log;
    KpString text;
    setenv("TZ", "TST-5:30", 1);
    char before[32], after[32];
    const auto expect = [](char* expected) {
        const time_t shifted = kplib::platform::wallTime().seconds + 19800;
        strftime(expected, 32, "%Y-%m-%d %H:%M:%S.", gmtime(&shifted));
    };
    expect(before);
    log->timeString(text, KpLogFile::DateAndTime);
    expect(after);
    unsetenv("TZ");
    EXPECT_TRUE(std::regex_match(text.c_str(), std::regex(std::string(before) + "\\d{3}|" + after + "\\d{3}"))) << text;
    log->setDateTimeFormat(KpLogFile::TimeOnly);
    log->error("M", "text");
    EXPECT_TRUE(std::regex_match(log.take(), std::regex("\\d\\d:\\d\\d:\\d\\d\\.\\d{3}: E \\[M\\] text\n")));

    kplib::detail::KpLogClock clock;
    EXPECT_EQ(clock.elapsed({1000, 900}, {1001, 100}), "00:00:00.200");
    EXPECT_EQ(clock.elapsed({1000, 100}, {1000 + 3600 + 2 * 60 + 3, 104}), "01:02:03.004");
    log->resetTimeStamp();
    log.record().timeStamp.seconds -= 25 * 3600;
    log->timeString(text, KpLogFile::TimeOnly);
    EXPECT_TRUE(std::string_view(text).starts_with("01:00:00.")) << text;
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
        EXPECT_TRUE(!log.writeCallback() && log.writeCallbackLogLevel() == KpLogOff);
    }
    EXPECT_EQ(log.defaultModule(), nullptr);
    EXPECT_TRUE(log.writeCallback() == receive && log.writeCallbackLogLevel() == KpLogWarning);
    log.setWriteCallback(nullptr, KpLogOff);
}

TEST(KpLogFile, exhaustedMemoryLeavesTheLogAsItWas)
{
    FileLog log;
    log->setDateTimeFormat(KpLogFile::DateAndTime);
    kplib::test::failAtEachAllocation(
        [&] {
            log->tracef(KpLogError, nullptr, "%0100d", 1);
            log->setDefaultModule("a module that is too long for the memory that there is");
        },
        [&] { EXPECT_TRUE(std::async([&] { return log->dateTimeFormat(); }).get()) << "with no lock left behind"; });
}

TEST(KpLogFileThreads, linesDontInterleave)
{
    FileLog log;
    const std::string text(500, 'x');
    const auto work = [&] {
        for (int k = 0; k < 200; ++k) {
            log->errorf("%s", text.c_str());
            log->setDefaultModule(k % 2 ? "a" : "b");
        }
    };
    for (std::jthread threads[] = {std::jthread(work), std::jthread(work), std::jthread(work)}; auto& t : threads)
        t.join();
    const std::string all = std::regex_replace(log.take(), std::regex("E \\[[ab]?\\] x{500}\n"), ".");
    EXPECT_EQ(all, std::string(600, '.'));
}
