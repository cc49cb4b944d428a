#include <kplib/kplib.h>

#include <gtest/gtest.h>

#include <future>
#include <vector>

namespace {

// All of these choose kernels or read the system on first use.
void computeOnOwnData()
{
    std::vector<short> voxels(64 * 8 * 4, 7), halves(32 * 4 * 2);
    KpRawData::downSample3D(halves.data(), voxels.data(), 64, 8, 4, 2, 2, 2, nullptr);
    EXPECT_EQ(halves, std::vector<short>(32 * 4 * 2, 7));
    unsigned short* labels = nullptr;
    KpConnectedComponents::labelCC(voxels.data(), KpVec3i(64, 8, 4).data(), 26, labels, 0, 5, 9, 0, 0, nullptr);
    EXPECT_EQ(labels[voxels.size() - 1], 1);
    kpfree(labels);
    KpBitfield mask(64 * 8 * 4, KpBitfield::INIT_UNSET), grown;
    mask.set(0);
    KpMorphology::dilation3D(mask, grown, {64, 8, 4}, 1, true);
    EXPECT_EQ(grown.nSetBits(), 4U);
    KpScanConvert(0, 0, 8, 8).render(3, std::vector<KpVec2f>{{0, 0}, {8, 0}, {0, 8}}.data());
    EXPECT_TRUE(KpUUID::generateUUID() != KpUUID() && KpCPUInfo::instance().getCPUCount() > 0);
}

TEST(OwnDataThreads, isComputedSideBySide)
{
    std::vector<std::future<void>> threads;
    for (int t = 0; t < 4; ++t)
        threads.push_back(std::async(std::launch::async, computeOnOwnData));
}

}  // namespace
