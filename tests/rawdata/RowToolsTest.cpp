#include "Elements.h"

#include <kplib/rawdata/TmSSETools.h>
#include <kplib/rawdata/detail/TmSSEToolsKernels.h>

using namespace kplib::test;
using namespace kplib::detail;

TEST(RowTools, scaledRowsAreRoundedAfterEachStep)
{
    for (long n : {0, 1, 3, 4, 5, 15, 16, 17, 100, 1003})
        for (long start : {0, 1, 3})
            for (float factor : {0.1f, -3e30f}) {
                SCOPED_TRACE(testing::Message() << n << '+' << start << " by " << factor);
                auto src = someValues<float>(n + start, 1);
                const auto dst = someValues<float>(n + start, 2);
                std::vector<float> stored = dst, added = dst;
                for (long i = start; i < n + start; ++i) {
                    volatile float product = src[i] * factor;
                    stored[i] = product;
                    added[i] = dst[i] + product;
                }
                const auto expectRows = [&](auto paths, const auto& expected) {
                    for (const auto& path : paths)
                        if (path.usable) {
                            std::vector<float> result = dst;
                            path.run(src.data() + start, factor, n, result.data() + start);
                            EXPECT_TRUE(areSame(result, expected)) << path.name;
                        }
                };
                expectRows(multiplyAndStorePaths(), stored);
                expectRows(multiplyAndAddPaths(), added);
                EXPECT_EQ(TmSSETools::multiplyAndAddUnaligned(src.data(), factor, n, stored.data()), stored.data() + n);
                EXPECT_EQ(TmSSETools::multiplyAndStoreUnaligned(src.data(), factor, n, src.data()), src.data() + n);
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
                std::vector<std::uint8_t> mirrored = bytes, expected = bytes, copy(n * room, 7), expectedCopy = copy;
                for (long y = 0; y < n; ++y)
                    for (long x = 0; x < width; ++x) {
                        expected[(n - 1 - y) * width + x] = bytes[y * width + x];
                        if (x < room)
                            expectedCopy[(n - 1 - y) * room + x] = bytes[y * width + x];
                    }
                TmSSETools::mirrorY(reinterpret_cast<char*>(mirrored.data()), rows, width);
                EXPECT_EQ(mirrored, expected);
                TmSSETools::memcpyMirrorY(bytes.data(), rows, width, copy.data(), room);
                EXPECT_EQ(copy, expectedCopy);
                for (const auto& path : swapRowsPaths())
                    if (path.usable && n == 2) {
                        mirrored = bytes;
                        auto* const row = reinterpret_cast<char*>(mirrored.data());
                        path.run(row, row + width, width);
                        EXPECT_EQ(mirrored, expected) << path.name;
                    }
            }
}
