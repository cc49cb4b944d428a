#include <kplib/geometry/numerics/KpRandom.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>
#include <future>
#include <random>
#include <vector>

namespace {

TEST(KpRandom, shufflesTheMinimalStandardSequence)
{
    for (const int seed : {0, 1, 2, 127773, 1234567890, 2147483646}) {
        SCOPED_TRACE(seed);
        KpRandom random(7);
        random.initialize(seed);
        std::minstd_rand0 states(seed == 0 ? 1 : seed);
        states.discard(8);
        std::array<std::uint_fast32_t, 32> table{};
        std::generate(table.rbegin(), table.rend(), std::ref(states));
        std::uint_fast32_t last = table[0], state = 0;
        for (int i = 0; i < 1000; ++i) {
            std::uint_fast32_t& entry = table[last >> 26];
            last = entry;
            entry = state = states();
            ASSERT_NEAR(random.next(), static_cast<double>(last) / 2147483647, 1e-12) << i;
        }
        ASSERT_EQ(random.idum(), state);
    }
}

TEST(KpRandom, staysInItsRangeForAnySeed)
{
    EXPECT_EQ(KpRandom(1198190221).next(), 0.99999988);  // it draws one of the last states below the modulus
    for (const std::int64_t seed : {INT64_MIN, std::int64_t{-1}, std::int64_t{1} << 40, INT64_MAX}) {
        KpRandom random(seed);
        for (int i = 0; i < 10000; ++i) {
            const double drawn = random.next();
            ASSERT_GT(drawn, 0) << seed;
            ASSERT_LE(drawn, 0.99999988) << seed;
        }
    }
}

TEST(KpRandom, servesManyThreadsFromOneGenerator)
{
    std::vector<std::future<void>> threads;
    for (int t = 0; t < 4; ++t)
        threads.push_back(std::async(std::launch::async, [] {
            double sum = 0;
            for (int i = 0; i < 20000; ++i) {
                const double drawn = KpRandom::rand();
                ASSERT_GT(drawn, 0);
                ASSERT_LE(drawn, 0.99999988);
                sum += drawn;
            }
            EXPECT_NEAR(sum / 20000, 0.5, 0.05);
        }));
}

}  // namespace
