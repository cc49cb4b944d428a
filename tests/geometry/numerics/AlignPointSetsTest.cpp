#include <kplib/geometry/numerics/KpAlignPointSets.h>

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/numerics/KpDMatrix.h>

#include <support/ExhaustedMemory.h>

#include <Eigen/Dense>
#include <gtest/gtest.h>

#include <random>
#include <vector>

namespace {

using Points = std::vector<KpVec3f>;
using Eigen::Matrix3d, Eigen::MatrixXd, Eigen::RowVector3d, Eigen::VectorXd;

std::mt19937 engine(1);

float number(float low, float high)
{
    return std::uniform_real_distribution<float>(low, high)(engine);
}

Points cloud(int n, const KpVec3f& extent)
{
    Points points(static_cast<std::size_t>(n));
    for (KpVec3f& p : points)
        p = KpVec3f(number(-1, 1), number(-1, 1), number(-1, 1)) * extent + KpVec3f(1, -2, 3);
    return points;
}

KpMat4f someMotion(const KpVec3f& scale)
{
    KpMat4f motion;
    motion.setTransform(KpVec3f(number(-9, 9), 4, -5), KpRotation(number(-1, 1), number(-1, 1), number(-1, 1), 0.5F),
                        scale, KpRotation(0.1F, 0.2F, 0.3F, 1));
    return motion;
}

Points moved(const Points& points, const KpMat4f& motion)
{
    Points result(points.size());
    motion.multVecMatrix(points, result.data());
    return result;
}

/// The pairs of one call, and which overload takes them.
struct Call {
    Points points1, points2;
    std::vector<int> index1, index2;
    std::vector<float> weights1, weights2;
    bool isIndexed;
    int arrays;  // of weights

    int n() const { return static_cast<int>(index1.size()); }
    KpMat4f align(int mode) const
    {
        KpMat4f result;
        const auto call = [&](auto... lists) {
            kpAlignPointSets(result, points1.data(), points2.data(), lists..., n(), mode);
        };
        const float *const w1 = weights1.data(), *const w2 = weights2.data();
        const auto withWeights = [&](auto... index) {
            arrays == 0 ? call(index...) : arrays == 1 ? call(index..., w1) : call(index..., w1, w2);
        };
        isIndexed ? withWeights(index1.data(), index2.data()) : withWeights();
        return result;
    }
};

MatrixXd gathered(const float* values, int width, const std::vector<int>& index)
{
    MatrixXd rows(index.size(), width);
    for (int i = 0; i < rows.rows(); ++i) {
        for (int j = 0; j < width; ++j)
            rows(i, j) = values[width * index[static_cast<std::size_t>(i)] + j];
    }
    return rows;
}

/// The fit in double precision, with matrices as the textbooks have them; for sets that are not flat.
Eigen::Matrix4d reference(const Call& call, int mode)
{
    VectorXd w1 = VectorXd::Ones(call.n()), w2 = w1;
    if (call.arrays > 0) {
        w1 = gathered(call.weights1.data(), 1, call.index1);
        w2 = gathered((call.arrays == 1 ? call.weights1 : call.weights2).data(), 1, call.index2);
    }
    MatrixXd b = gathered(call.points1[0].data(), 3, call.index1);
    MatrixXd a = gathered(call.points2[0].data(), 3, call.index2);
    const RowVector3d c1 = w1.transpose() * b / w1.sum();
    const RowVector3d c2 = w2.transpose() * a / (call.arrays == 2 ? w2.sum() : w1.sum());
    b.rowwise() -= c1;
    a.rowwise() -= c2;
    a = w2.asDiagonal() * a;
    if (call.arrays == 2)
        b = w1.asDiagonal() * b;
    Matrix3d m;
    if (mode == 2) {
        m = (a.transpose() * a).inverse() * (a.transpose() * b);
    } else {
        const Eigen::JacobiSVD<Matrix3d> svd(a.transpose() * b, Eigen::ComputeFullU | Eigen::ComputeFullV);
        const double mirrored = (svd.matrixU() * svd.matrixV()).determinant() < 0 ? -1 : 1;
        m = svd.matrixU() * Eigen::Vector3d(1, 1, mirrored).asDiagonal() * svd.matrixV().transpose();
        if (mode == 1)
            m *= b.cwiseProduct(a * m).sum() / (a * m).squaredNorm();
    }
    Eigen::Matrix4d result = Eigen::Matrix4d::Identity();
    result.topLeftCorner<3, 3>() = m;
    result.bottomLeftCorner<1, 3>() = c1 - c2 * m;
    return result;
}

TEST(KpAlignPointSets, equalsAPlainFitWithAnyListsAndWeights)
{
    for (int trial = 0; trial < 60; ++trial) {
        Call call{cloud(25, KpVec3f(2, 3, 4)), {}, {}, {}, {}, {}, trial % 2 == 1, trial / 2 % 3};
        call.points2 = moved(call.points1, someMotion(KpVec3f(1, 1.5F, trial < 40 ? 0.7F : -0.7F)));
        for (int i = 0; i < 20; ++i) {
            call.index1.push_back(call.isIndexed ? 7 * i % 25 : i);
            const bool isWrong = call.isIndexed && i == 3;  // one pair, which depends on the list of the weights
            call.index2.push_back((call.index1.back() + (isWrong ? 1 : 0)) % 25);
        }
        for (std::size_t i = 0; i < 25; ++i) {
            call.points1[i] += KpVec3f(number(-0.1F, 0.1F), number(-0.1F, 0.1F), number(-0.1F, 0.1F));
            call.weights1.push_back(number(0.5F, 1.5F));
            call.weights2.push_back(number(0.5F, 1.5F));
        }
        for (const int mode : {0, 1, 2}) {
            SCOPED_TRACE(testing::Message() << "trial " << trial << " mode " << mode);
            const KpMat4f result = call.align(mode);
            const Eigen::Map<const Eigen::Matrix<float, 4, 4, Eigen::RowMajor>> found(result.data());
            EXPECT_LT((found.cast<double>() - reference(call, mode)).norm(), 3e-4);
        }
    }
}

TEST(KpAlignPointSets, carriesFlatSetsBackByAProperRotation)
{
    for (const KpVec3f& extent : {KpVec3f(1, 1, 1), KpVec3f(2, 3, 0), KpVec3f(0, 4, 4), KpVec3f(5, 0, 0)}) {
        for (const float scale : {1.0F, 2.0F}) {
            SCOPED_TRACE(testing::Message() << extent << " scaled by " << scale);
            const Points points2 = cloud(scale == 1 ? 3 : 50, extent);
            const Points points1 = moved(points2, someMotion(KpVec3f(scale, scale, scale)));
            KpMat4f result;
            kpAlignPointSets(result, points1.data(), points2.data(), static_cast<int>(points1.size()), scale != 1);
            EXPECT_NEAR(result.det3(), scale * scale * scale, 1e-3F);
            const Points found = moved(points2, result);
            for (std::size_t i = 0; i < found.size(); ++i)
                EXPECT_LT((found[i] - points1[i]).length(), 1e-3F);
        }
    }
    const KpVec3f p1(1, 2, 3), p2(4, 6, 8);  // a single pair: no direction at all
    KpMat4f result;
    kpAlignPointSets(result, &p1, &p2, 1, 0);
    EXPECT_EQ(result, KpMat4f(1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, -3, -4, -5, 1));
}

TEST(KpAlignPointSets, appliesTheInitialMatrixToWhateverThereIs)
{
    const Points points = cloud(3, KpVec3f(1, 2, 3));
    const float zeros[] = {1, -1, 0}, ones[] = {1, 1, 1};
    const int index[] = {0, 1, 2};
    const KpMat4f initial = someMotion(KpVec3f(1, 2, 3)), before = someMotion(KpVec3f(1, 1, 1));
    const KpVec3f* const p = points.data();
    for (const KpMat4f* const with : {static_cast<const KpMat4f*>(nullptr), &initial}) {
        const auto expectIdentity = [&](auto... arguments) {
            KpMat4f result = before;
            kpAlignPointSets(result, p, p, arguments..., with);
            EXPECT_EQ(result, with ? initial : KpMat4f::identity());
        };
        int none = 0;
        expectIdentity(none, 0);
        expectIdentity(index, index, none, 0);
        expectIdentity(ones, -1, 0);
        expectIdentity(zeros, 3, 0);
        expectIdentity(zeros, ones, 3, 1);
        expectIdentity(index, index, zeros, 3, 2);
        expectIdentity(index, index, ones, zeros, 3, 0);
        KpMat4f result = before;
        kpAlignPointSets(result, p, p, 3, 3, with);
        EXPECT_EQ(result, with ? before * initial : before);
    }
    KpMat4f result = initial;
    kpAlignPointSets(result, p, p, 0, 0, &result);
    EXPECT_EQ(result, initial);
}

TEST(KpAlignPointSets, leavesTheResultWithoutMemory)
{
    const Points points1 = cloud(9, KpVec3f(1, 2, 3)), points2 = cloud(9, KpVec3f(1, 2, 3));
    for (const int mode : {0, 1, 2}) {
        KpMat4f result = KpMat4f::identity(), expected;
        kpAlignPointSets(expected, points1.data(), points2.data(), 9, mode);
        kplib::test::failAtEachAllocation(
            [&] { kpAlignPointSets(result, points1.data(), points2.data(), 9, mode); },
            [&] { EXPECT_TRUE(result == KpMat4f::identity() || result == expected) << mode; });
    }
}

TEST(KpAlignPointSets, keepsItsAccuracyOverManyDistantPairs)
{
    Points points2 = cloud(1000000, KpVec3f(50, 60, 70));
    for (KpVec3f& p : points2)
        p += KpVec3f(2000, 0, 0);
    KpMat4f motion;
    motion.setTransform(KpVec3f(-9, 4, 7), KpRotation(0.1F, -0.2F, 0.05F, 0.97F), KpVec3f(1, 1, 1), KpRotation());
    const Points points1 = moved(points2, motion);
    for (const int mode : {0, 1, 2}) {
        KpMat4f result;
        kpAlignPointSets(result, points1.data(), points2.data(), static_cast<int>(points1.size()), mode);
        float furthest = 0;
        for (std::size_t i = 0; i < 1000; ++i)
            furthest = std::max(furthest, (result.multVecMatrix(points2[i]) - points1[i]).length());
        EXPECT_LT(furthest, 0.01F) << mode;
    }
}

TEST(KpCompTransform, takesCentredMatrices)
{
    KpDMatrix<float> a(4, 3), b(4, 3);
    const float points[] = {1.F, 0.F, 0.F, 0.F, 2.F, 0.F, 0.F, 0.F, 3.F, -1.F, -2.F, -3.F};
    std::copy_n(points, 12, a.data());
    std::transform(a.data(), a.data() + 12, b.data(), [](float v) { return 2 * v; });
    const KpMat4f expected(2, 0, 0, 0, 0, 2, 0, 0, 0, 0, 2, 0, 4 - 2, 5 - 4, 6 - 6, 1);
    KpMat4f scaled, affine;
    kpCompRigidTransform(a, b, KpVec3f(1, 2, 3), KpVec3f(4, 5, 6), scaled, true);
    kpCompAffineTransform(a, b, KpVec3f(1, 2, 3), KpVec3f(4, 5, 6), affine);
    EXPECT_TRUE(scaled.equals(expected, 1e-5F));
    EXPECT_TRUE(affine.equals(expected, 1e-5F));
}

}  // namespace
