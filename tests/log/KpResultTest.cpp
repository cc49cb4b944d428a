#include <kplib/log/KpResult.h>

#include <kplib/log/KpLastError.h>
#include <kplib/log/KpLogFile.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <utility>

using kplib::test::Lines;
using kplib::test::LogCapture;

namespace {

std::string asked;

template <char Name, bool Answer>
bool ask(const KpResult& result)
{
    asked += Name + std::to_string(result.codeValue()) + ' ';
    return Answer;
}

// Fails when all that was made after it, and perhaps the library's own statics, is gone.
struct FailsAtExit {
    ~FailsAtExit()
    {
        getTheLogInstance().setLogLevel(KpLogOff);
        if (!Tm::fail(KpResult(KpResult::Failed, "late", nullptr)) || Tm::lastError(true).isOk())
            std::abort();
    }
} failsAtExit;

class TmTest : public testing::Test {
protected:
    ~TmTest() override
    {
        KpResult::notificationCallbackRemoveAll();
        Tm::setError(KpResult());
    }
    LogCapture log{KpLogError};
};

}  // namespace

TEST(KpResult, recordsAFailureOnceAndNoSuccess)
{
    static_assert(sizeof(KpResult) == sizeof(void*));
    const LogCapture log;
    const KpResult ok(KpResult::Ok, 7, "f", "t", "d"), result(5000, 12, "f.cpp", "text", "data"), shared = result;
    EXPECT_TRUE(ok.isOk() && !ok.isBad() && std::string(ok.text()) + ok.file() + ok.data() == "" && ok.line() == 0);
    EXPECT_EQ(log.lines(), Lines{"D [KpResult::Error] code: 1388 file: f.cpp line: 12 message: text data: data"});
    EXPECT_TRUE(shared.isBad() && shared.code() == 5000 && shared.line() == 12 && shared.text() == result.text());
    const KpResult bare(5000, nullptr, nullptr);
    EXPECT_EQ(std::string(bare.text()) + bare.file() + bare.data() + std::to_string(bare.line()), "0");
}

TEST(KpResult, codesHaveTheirOwnTexts)
{
    const LogCapture log;
    // clang-format off
    const struct {
        int code;
        const char *given, *data, *shortText;
    } cases[] = {
        {1, nullptr, "", ""},
        {2, nullptr, "internal error", "internal error"},
        {2, "given", "given", "internal error"},
        {11, nullptr, "operation interrupted", ""},
        {12, "", "", "failed to write file"},
        {17, nullptr, "one of the arguments is invalid", "one of the arguments is invalid"},
        {120, nullptr, "Could not save snapshot image!", ""},
        {4112, nullptr, "Resource busy.", ""},
        {-1, nullptr, "", ""},
    };
    // clang-format on
    for (const auto& [code, given, data, shortText] : cases) {
        const KpResult result(code, "x", given);
        EXPECT_TRUE(result.hasData() == (*data != '\0') && result.data() == std::string(data)) << code;
        const KpResult made = Tm::tmError(KpResult::Code(code), "f", 3, "fn", "d", "t", given, false, false);
        EXPECT_TRUE(made.text() == std::string(shortText) && made.data() == std::string(data)) << code;
    }
}

TEST(KpResult, firstFailureWins)
{
    const LogCapture log;
    const KpResult ok, first(1, "first", nullptr), second(2, "second", nullptr);
    KpResult sum;
    EXPECT_STREQ((sum << ok << first << second << ok).text(), "first");
    EXPECT_THROW(sum.throwOnFail(), KpResult);
}

TEST_F(TmTest, failLogsRemembersAndNotifies)
{
    KpResult::notificationCallbackAdd(ask<'a', false>);
    EXPECT_FALSE(Tm::fail(KpResult()));
    EXPECT_TRUE(Tm::fail(KpResult(0x1F, 7, "a.cpp", "100%s", "da%nta")));
    EXPECT_TRUE(Tm::failWin(KpResult(1, "second", nullptr)));
    EXPECT_EQ(log.lines(), (Lines{"E [] \nFile: a.cpp\nLine: 7\nCode: 1F\nText: 100%s\nData: da%nta",
                                  "E [] \nFile: \nLine: 0\nCode: 1\nText: second\nData: "}));
    EXPECT_EQ(std::exchange(asked, {}), "a31 a1 ");
    EXPECT_EQ(Tm::lastError(true).code(), 0x1F) << "the first one stays, until it is taken";
    EXPECT_TRUE(Tm::lastError(true).isOk());
}

TEST_F(TmTest, callbacksAreAskedFromTheLastToTheFirst)
{
    const auto heard = [failure = KpResult(1, "x", nullptr)] {
        failure.notify();
        return std::exchange(asked, {});
    };
    for (auto callback : {ask<'a', false>, ask<'b', false>, ask<'a', false>})
        KpResult::notificationCallbackAdd(callback);
    EXPECT_EQ(heard(), "a1 b1 a1 ");
    KpResult::notificationCallbackRemove(ask<'a', false>);
    EXPECT_EQ(heard(), "b1 a1 ");
    KpResult::notificationCallbackAdd(ask<'c', true>);
    EXPECT_EQ(heard(), "c1 ");
    KpResult::notificationCallbackAdd([](const KpResult&) {
        KpResult::notificationCallbackRemoveAll();
        return false;
    });
    EXPECT_EQ(heard(), "") << "and none that is no longer there";
}

TEST_F(TmTest, tmErrorTellsThePlace)
{
    EXPECT_STREQ(Tm::tmError(KpResult::ReadOnly, "f", 3, "fn", "d", "t", nullptr, true, false).data(),
                 "in_function=fn\ndate=d\ntime=t");
    EXPECT_STREQ(Tm::tmError(KpResult::ReadOnly, "f", 3, "fn", "d", "t", "more", true, false).data(),
                 "more\nin_function=fn\ndate=d\ntime=t");
    EXPECT_TRUE(Tm::lastError(true).isOk()) << "which was not to be set";
    const KpResult here = KP_ERROR_DATA(KpResult::OutOfRange, "index");
    EXPECT_TRUE(here.line() == __LINE__ - 1 && Tm::lastError(true).text() == here.text());
    EXPECT_TRUE(KP_ERROR(KpResult::Ok).isOk() && Tm::lastError(true).isOk()) << "a success clears it";
}

TEST(TmThreads, eachThreadHasItsLastError)
{
    const LogCapture log(KpLogOff);
    Tm::setError(KpResult(1, "mine", nullptr));
    std::thread([] {
        EXPECT_TRUE(Tm::lastError(true).isOk());
        const KpResult failure(1, "text", "data");
        kplib::test::failAtEachAllocation([&] { Tm::fail(failure); }, [] {});
        EXPECT_STREQ(Tm::lastError(true).text(), "text");
        kplib::test::failAtEachAllocation(
            [] { Tm::tmError(KpResult::ReadOnly, "f", 3, "fn", "day", "hour", "data", true, true); }, [] {});
        EXPECT_EQ(Tm::lastError(true).code(), KpResult::ReadOnly);
        kplib::test::failAtEachAllocation([] { KpResult::notificationCallbackAdd(ask<'a', true>); }, [] {});
        KpResult::notificationCallbackRemoveAll();
    }).join();
    EXPECT_STREQ(Tm::lastError(false).text(), "mine");
}
