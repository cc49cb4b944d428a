#include <kplib/log/KpResult.h>

#include <kplib/log/KpLastError.h>
#include <kplib/log/KpLogFile.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <utility>

using namespace kplib::test;

namespace {

std::string asked;

template <char Name, bool Answer>
bool ask(const KpResult& result)
{
    asked += Name + std::to_string(result.codeValue()) + ' ';
    return Answer;
}

struct TmTest : testing::Test {
    ~TmTest() override { KpResult::notificationCallbackRemoveAll(); }
    LogCapture log{KpLogError};
};

}  // namespace

TEST(KpResult, recordsAFailureOnceAndNoSuccess)
{
    static_assert(sizeof(KpResult) == sizeof(void*));
    const LogCapture log;
    const KpResult ok(KpResult::Ok, 7, "f", "t", "d"), result(5000, 12, "f.cpp", "text", "data"), shared = result;
    EXPECT_EQ(std::tuple(ok.isOk(), ok.line()), std::tuple(true, 0));
    EXPECT_EQ(std::string(ok.text()) + ok.file() + ok.data(), "");
    EXPECT_EQ(log.lines(), Lines{"D [KpResult::Error] code: 1388 file: f.cpp line: 12 message: text data: data"});
    EXPECT_EQ(std::tuple(shared.isBad(), shared.code(), shared.line(), shared.text()),
              std::tuple(true, 5000, 12, result.text()));
}

TEST_F(TmTest, codesHaveTheirOwnTexts)
{
    const auto texts = [](int code, const char* data) {
        const KpResult made = Tm::tmError(KpResult::Code(code), "f", 3, "fn", "d", "t", data, false, false);
        return std::string(made.text()) + '|' + made.data();
    };
    EXPECT_EQ(texts(1, nullptr), "|");
    EXPECT_EQ(texts(12, "given"), "failed to write file|given");
    EXPECT_EQ(texts(17, nullptr), "one of the arguments is invalid|one of the arguments is invalid");
    EXPECT_EQ(texts(4112, nullptr), "|Resource busy.");
}

TEST_F(TmTest, firstFailureWins)
{
    KpResult sum;
    sum << KpResult() << KpResult(1, "first", nullptr) << KpResult(2, "second", nullptr) << KpResult();
    EXPECT_STREQ(sum.text(), "first");
    EXPECT_THROW(sum.throwOnFail(), KpResult);
}

TEST_F(TmTest, failLogsRemembersAndNotifies)
{
    KpResult::notificationCallbackAdd(ask<'a', false>);
    EXPECT_FALSE(Tm::fail(KpResult()));
    EXPECT_TRUE(Tm::fail(KpResult(0x1F, 7, "a.cpp", "100%s", "da%nta")));
    EXPECT_EQ(log.lines(), Lines{"E [] \nFile: a.cpp\nLine: 7\nCode: 1F\nText: 100%s\nData: da%nta"});
    EXPECT_TRUE(Tm::failWin(KpResult(1, "second", nullptr)));
    EXPECT_EQ(std::exchange(asked, {}), "a31 a1 ");
    EXPECT_EQ(Tm::lastError(false).code(), 0x1F) << "the first one stays, until it is taken";
}

TEST_F(TmTest, callbacksAreAskedFromTheLastToTheFirst)
{
    const auto heard = [failure = KpResult(1, "x", nullptr)] {
        failure.notify();
        return std::exchange(asked, {});
    };
    for (auto callback : {ask<'a', false>, ask<'b', false>, ask<'a', false>})
        KpResult::notificationCallbackAdd(callback);
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
    EXPECT_STREQ(Tm::tmError(KpResult::ReadOnly, "f", 3, "fn", "d", "t", "more", true, false).data(),
                 "more\nin_function=fn\ndate=d\ntime=t");
    EXPECT_TRUE(Tm::lastError(true).isOk()) << "which was not to be set";
    const KpResult here = KP_ERROR_DATA(KpResult::OutOfRange, "index");
    EXPECT_EQ(here.line(), __LINE__ - 1);
    EXPECT_EQ(Tm::lastError(true).text(), here.text());
    EXPECT_TRUE(KP_ERROR(KpResult::Ok).isOk()) << "a success clears it";
    EXPECT_TRUE(Tm::lastError(true).isOk()) << "a success clears it";
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
    }).join();
    EXPECT_STREQ(Tm::lastError(false).text(), "mine");
}
