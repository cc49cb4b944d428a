#include <kplib/kplib.h>

#include <gtest/gtest.h>

#if defined(KPLIB_CHECKS)

namespace {

TEST(Checks, abortWithFileLineAndDuty)
{
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    KpDArray<int> array{1, 2};
    KpBitfield bits(5, KpBitfield::INIT_UNSET);
    EXPECT_DEATH(array[2] = 0, R"(KpDArray\.h:[0-9]+: KpDArray: the index)");
    EXPECT_DEATH(bits.set(32), "KpBitfield: the bit");
    EXPECT_DEATH(KpMat4f::identity()[4], "KpMat4f: the row");
    EXPECT_DEATH(*KpHandle<TmDataAccess>(), "KpHandle: dereferenced");
    EXPECT_DEATH(TmDataAccess().dataPtr(0), "TmDataAccess: dataPtr");
}

}  // namespace

#endif
