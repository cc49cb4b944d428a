#include <kplib/foundation/KpString.h>
#include <kplib/volume/KpBitfield.h>

#include <gtest/gtest.h>

TEST(KpBitfield, countsOneWordBeyondTheFullOnes)
{
    for (auto [bits, words] : {std::pair{0UL, 0UL}, {1, 1}, {31, 1}, {32, 2}, {33, 2}, {64, 3}}) {
        const KpBitfield field(bits, KpBitfield::INIT_UNSET);
        EXPECT_TRUE(field.nBits() == bits && field.nWords() == words && (field.data() != nullptr) == (bits != 0));
    }
}
