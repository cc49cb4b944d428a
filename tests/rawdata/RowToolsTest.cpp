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
                const auto src = someValues<float>(n, 1), dst = someValues<float>(n, 2);
                std::vector<float> expected = dst;
                for (long i = 0; i < n; ++i) {
                    volatile float product = src[i] * factor;
                    expected[i] = adds ? dst[i] + product : product;
                }
                const auto expectOf = [&](const char* name, auto run) {
                    for (long start = 0; start < 8; ++start)
                        worked(src, 3 * start % 8, [&](void* from) {
                            const auto result = worked(dst, start, [&](void* to) {
                                run(static_cast<float*>(from), factor, n, static_cast<float*>(to));
                            });
                            EXPECT_TRUE(areSame(result, expected)) << name << '+' << start;
                        });
                };
                auto* const chosen = adds ? TmSSETools::multiplyAndAddUnaligned : TmSSETools::multiplyAndStoreUnaligned;
                expectOf("chosen", [&](auto* from, float by, long count, auto* to) {
                    EXPECT_EQ(chosen(from, by, count, to), to + count);
                });
                for (const auto& path : adds ? multiplyAndAddPaths() : multiplyAndStorePaths())
                    if (path.usable)
                        expectOf(path.name, path.run);
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
