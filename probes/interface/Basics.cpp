// Memory, strings, types, the log and its neighbours, the host, threads.
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpException.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/foundation/KpTypeInfo.h>
#include <kplib/foundation/StringUtils.h>
#include <kplib/log/KpCrashDump.h>
#include <kplib/log/KpDbC.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/KpResult.h>
#include <kplib/system/KpBuildInfo.h>
#include <kplib/system/KpCPUInfo.h>
#include <kplib/system/KpProcessInfo.h>
#include <kplib/system/KpVersion.h>
#include <kplib/system/KpWatch.h>
#include <kplib/threads/KpCallable.h>
#include <kplib/threads/KpProgressGuiInterface.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/KpThread.h>
#include <kplib/threads/KpWorkerThread.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <unistd.h>

namespace {

TEST(Interface, memoryAndStrings)
{
    void* const block = KpAlignedMalloc(100, 16);
    EXPECT_TRUE(KpIsAligned(block, 16));
    EXPECT_FALSE(KpIsAligned(static_cast<char*>(block) + 1, 2));
    KpAlignedFree(block);

    EXPECT_EQ(KpString("-9223372036854775808 and more").toInt64(), -9223372036854775807LL - 1);
    std::ostringstream out;
    out << KpString("two words");
    EXPECT_EQ(out.str(), "two words");
    bool ok = false;
    EXPECT_EQ(StringUtils::toULong("18446744073709551615", 7, &ok), ~0UL);
    EXPECT_TRUE(ok);
    EXPECT_EQ(StringUtils::toULong("12 ", 7, &ok), 7U);
    EXPECT_FALSE(ok);
}

TEST(Interface, typesAndOwners)
{
    KpPrimType::Type type = KpPrimType::Byte;
    EXPECT_TRUE(KpPrimType::nameToType("ushort", type));
    EXPECT_EQ(type, KpPrimType::UShort);
    EXPECT_FALSE(KpPrimType::nameToType("UShort", type));
    EXPECT_EQ(type, KpPrimType::UShort);

    EXPECT_EQ(KpTypeInfo::fromName("InterfaceProbe"), nullptr);
    const KpTypeInfo key("InterfaceProbe");
    EXPECT_EQ(KpTypeInfo::fromName("InterfaceProbe"), nullptr) << "a key to search with is not registered";
    EXPECT_EQ(KpTypedObject().getTypeId(), KpTypedObject::getClassTypeId());

    struct Kept : KpHandable {
        explicit Kept(bool* gone) : gone_(gone) {}
        ~Kept() override { *gone_ = true; }
        bool* gone_;
    };
    bool gone = false;
    KpHandle<KpInterfaceOwnerDefaultImpl> owner(new KpInterfaceOwnerDefaultImpl);
    owner->addHandle(new Kept(&gone));
    EXPECT_EQ(owner->getTypeId(), KpInterfaceOwnerDefaultImpl::getClassTypeId());
    EXPECT_EQ(owner->KpInterfaceOwner::getTypeId(), KpInterfaceOwner::getClassTypeId());
    EXPECT_FALSE(gone);
    owner = nullptr;
    EXPECT_TRUE(gone);
}

TEST(Interface, exceptionsAreKeptAndRaisedAgain)
{
    KpException original("slice %d of %d", 3, 9);
    const std::unique_ptr<KpException> copy(original.doClone());
    EXPECT_STREQ(copy->what(), "slice 3 of 9");
    try {
        copy->doRaise();
    } catch (KpException& raised) {
        EXPECT_STREQ(raised.what(), "slice 3 of 9");
        EXPECT_NE(&raised, copy.get());
    }
}

TEST(Interface, threadsAndTheirStorage)
{
    KpThreadLocalStorage<int> slot;
    int value = 1;
    EXPECT_EQ(slot.get(), nullptr);
    slot.set(&value);
    EXPECT_EQ(slot.get(), &value);
    EXPECT_TRUE(KpMutex(true).isRecursive());
    EXPECT_FALSE(KpMutex(false).isRecursive());

    struct Idle : KpThread {
        void run() override {}
    } thread;
    EXPECT_EQ(std::string(thread.threadName()).substr(0, 9), "KpThread ");
    struct Worker : KpWorkerThread {
        Worker() : KpWorkerThread("unnamed") {}
        void compute() override {}
    } worker;
    worker.setName("probe");
    EXPECT_STREQ(worker.name(), "probe");
    EXPECT_TRUE(tmIsMainThread());
    EXPECT_EQ(tmMainThreadId(), tmCurrentThreadId());

    KpWatch watch(true);
    KpThread::sleep(0);
    KpThread::msleep(20);
    EXPECT_GE(watch.getTimeMSec(), 19U);
    EXPECT_GE(watch.getTime(), 0.019F);
    EXPECT_GE(watch.stopMSec(), 19U);
    EXPECT_FALSE(watch.isRunning());

    struct Call : KpCallable {
        explicit Call(int* count) : count_(count) {}
        void call() override { ++*count_; }
        int* count_;
    };
    std::make_unique<Call>(&value)->call();
    EXPECT_EQ(value, 2);
}

TEST(Interface, progressWithoutAWindow)
{
    struct Gui : KpProgressGuiInterface {
        void setText(const std::string&) override {}
        void setMaximum(int) override {}
        void setValue(int) override {}
        void setCompleted(const KpResult&) override {}
    } gui;
    gui.setWindowTitle("no window: ignored");
    gui.show();
    EXPECT_STREQ(KpProgressInterface().progressText(), "");
}

TEST(Interface, theLogsSettings)
{
    const auto folder = std::filesystem::temp_directory_path() / ("kplib-interface-" + std::to_string(getpid()));
    std::filesystem::create_directory(folder);
    KpLogFile log;
    log.setLogToConsoleEnabled(false);
    EXPECT_FALSE(log.logToConsoleEnabled());
    EXPECT_FALSE(log.consoleToLogEnabled());
    EXPECT_FALSE(log.dateFoldersEnabled());
    log.setMaxLogFileSizeInBytes(1234);
    EXPECT_EQ(log.maxLogFileSizeInBytes(), 1234U);
    log.setDateTimeFormat(KpLogFile::DateAndTime);
    EXPECT_EQ(log.dateTimeFormat(), KpLogFile::DateAndTime);
    KpString now;
    log.timeString(now, KpLogFile::DateAndTime);
    EXPECT_EQ(std::string(now.c_str()).size(), std::string("2017-03-01 14:03:59.120").size());
    log.setDateTimeFormat(KpLogFile::NoDateTime);
    log.setBaseFolder(folder.string());
    EXPECT_TRUE(log.open(true));
    log.warn("Probe", "look out");
    log.flush();
    bool found = false;
    for (const auto& file : std::filesystem::directory_iterator(folder)) {
        std::ifstream in(file.path());
        for (std::string line; std::getline(in, line);)
            found |= line.find("[Probe] look out") != std::string::npos;
    }
    EXPECT_TRUE(found) << "flush() makes the line visible while the log is open";
    log.close();
    std::filesystem::remove_all(folder);
}

TEST(Interface, contractHooksAndCrashReports)
{
    EXPECT_EQ(kp_DbC_callback(), nullptr);
    const DbCCallback hook = [](DbCEventType, const char*, const char*, unsigned, const char*, const char*) {};
    kp_DbC_callbackSet(hook);
    EXPECT_EQ(kp_DbC_callback(), hook);
    kp_DbC_callbackSet(nullptr);

    EXPECT_EQ(kpCrashDumpConfig(), nullptr);
    EXPECT_EQ(kpInitCrashDumpWriter("/nowhere"), 0);
    EXPECT_EQ(kpEnableProbeDellBackupAndRecoveryCrash(true), 0);
    kpSetReportCrashCmd("never run");
    spawnNewClientToUploadCrashDump();
}

TEST(Interface, hostAndBuild)
{
    const KpProcessInfo process(getpid());
    process.log();  // no figures on this platform, so no line
    EXPECT_FALSE(process.found());
    EXPECT_TRUE(KpCPUInfo::instance().getMaxCPUIDExtFunc() == 0 ||
                KpCPUInfo::instance().getMaxCPUIDExtFunc() >= 0x80000000U);
    int version[4] = {-1, -1, -1, -1};
    KpBuildInfo::getVersion(version);
    EXPECT_EQ(std::to_string(version[0]), KpBuildInfo::getBuildTag("VERSION_MAJOR"));
    EXPECT_EQ(std::to_string(version[3]), KpBuildInfo::getBuildTag("VERSION_BUILD"));
    EXPECT_EQ(KpBuildInfo::isSnapshotBuild(), KpBuildInfo::isSnapshotBuild());
    EXPECT_TRUE(KpVersion("1.2.3").sameMajorMinor(KpVersion("1.2.4")));
    EXPECT_FALSE(KpVersion("1.2.3").sameMajorMinor(KpVersion("1.3.3")));
}

}  // namespace
