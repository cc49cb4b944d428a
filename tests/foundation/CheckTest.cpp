#include <kplib/kplib.h>

#include <gtest/gtest.h>

#if defined(KPLIB_CHECKS)

namespace {

TEST(Checks, abortWithFileLineAndDuty)
{
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    KpDArray<int> array{1, 2};
    EXPECT_DEATH(array[2] = 0, R"(KpDArray\.h:[0-9]+: KpDArray: the index)");
    EXPECT_DEATH(*KpHandle<TmDataAccess>(), "KpHandle: dereferenced");
    EXPECT_DEATH(TmDataAccess().dataPtr(0), "TmDataAccess: dataPtr");
}

}  // namespace

#endif
