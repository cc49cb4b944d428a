#include "Elements.h"

#include <kplib/rawdata/TmSSETools.h>
#include <kplib/rawdata/detail/RowToolsKernels.h>

using namespace kplib::test;
using namespace kplib::detail;

TEST(RowTools, scaledRowsAreRoundedAfterEachStep)
{
    for (long n : {0, 1, 3, 4, 5, 15, 16, 17, 102, 1003})
        for (float factor : {0.1f, -3e30f})
            for (bool adds : {false, true}) {
                SCOPED_TRACE(testing::Message() << n << " by " << factor << (adds ? " added" : " stored"));
                const long start = n % 4;
                auto src = someValues<float>(n + start, 1);
                const auto dst = someValues<float>(n + start, 2);
                std::vector<float> expected = dst, result = dst;
                for (long i = start; i < n + start; ++i) {
                    volatile float product = src[i] * factor;
                    expected[i] = adds ? dst[i] + product : product;
                }
                auto* const run = adds ? TmSSETools::multiplyAndAddUnaligned : TmSSETools::multiplyAndStoreUnaligned;
                EXPECT_EQ(run(src.data() + start, factor, n, result.data() + start), result.data() + n + start);
                EXPECT_TRUE(areSame(result, expected));
                for (const auto& path : adds ? multiplyAndAddPaths() : multiplyAndStorePaths())
                    if (path.usable) {
                        result = dst;
                        path.run(src.data() + start, factor, n, result.data() + start);
                        EXPECT_TRUE(areSame(result, expected)) << path.name;
                    }
            }
}

TEST(RowTools, mirrorsRowsInPlaceAndInCopies)
{
    for (long rows : {-1, 0, 1, 2, 3, 8})
        for (long width : {0, 1, 15, 16, 17, 64, 131})
            for (long room : {width, width / 2, width + 5}) {
                SCOPED_TRACE(testing::Message() << rows << " rows of " << width << " to " << room);
                const long n = std::max(rows, 0L);
                const auto bytes = someValues<std::uint8_t>(n * width, 5);
                Bytes copy(n * room, 7), expected = copy, mirrored = bytes;
                for (long y = 0; y < n; ++y)
                    std::copy_n(bytes.data() + y * width, std::min(width, room), expected.data() + (n - 1 - y) * room);
                TmSSETools::memcpyMirrorY(bytes.data(), rows, width, copy.data(), room);
                EXPECT_EQ(copy, expected);
                if (room != width)
                    continue;
                auto* const data = reinterpret_cast<char*>(mirrored.data());
                TmSSETools::mirrorY(data, rows, width);
                EXPECT_EQ(mirrored, expected);
                for (const auto& path : swapRowsPaths())
                    if (path.usable && n == 2) {
                        path.run(data, data + width, width);
                        EXPECT_EQ(mirrored, bytes) << path.name;
                        mirrored = expected;
                    }
            }
}
