#include "SomeVectors.h"
#include "support/LogCapture.h"

#include <kplib/geometry/KpMat4fCache.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/detail/Mat4fKernels.h>

#include <vector>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

constexpr float eps = std::numeric_limits<float>::epsilon();
const KpVec3f ones(1, 1, 1);

KpMat4f someAffine(std::mt19937& random, bool special = false)
{
    auto matrix = some<KpMat4f>(random, special);
    for (int i = 0; i < 4; ++i)
        matrix[i][3] = i == 3;
    return matrix;
}

KpMat4f product(const KpMat4f& a, const KpMat4f& b)
{
    KpMat4f c;
    for (int i = 0; i < 16; ++i) {
        float& sum = c[i / 4][i % 4] = a[i / 4][0] * b[0][i % 4];
        for (int k = 1; k < 4; ++k)
            sum += a[i / 4][k] * b[k][i % 4];
    }
    return c;
}

// What is left of a * b - 1, in units of the rounding that an element of the product may have.
double residue(const KpMat4f& a, const KpMat4f& b)
{
    double worst = 0;
    for (int i = 0; i < 16; ++i) {
        double sum = i % 5 == 0 ? -1 : 0, size = 1e-30;
        for (int k = 0; k < 4; ++k) {
            const double term = static_cast<double>(a[i / 4][k]) * b[k][i % 4];
            sum += term;
            size += std::abs(term);
        }
        worst = std::max(worst, std::abs(sum) / (size * eps));
    }
    return worst;
}

TEST(KpMat3f, invertsAndGivesTheAdjugateOfSingularOnes)
{
    EXPECT_EQ(KpMat3f(2, 0, 0, 0, 0, 0, 0, 0, 3).inverse(), KpMat3f(0, 0, 0, 0, 6, 0, 0, 0, 0));
    std::mt19937 random(1);
    for (int i = 0; i < 200; ++i) {
        const KpMat3f m = some<KpMat3f>(random) + 5 * KpMat3f::identity(), symmetric = m + m.transpose();
        EXPECT_LE(residue(KpMat4f(m), KpMat4f(m.inverse())), 16);
        EXPECT_EQ(symmetric.symmInverse(-2), symmetric.inverse(-2));
        EXPECT_EQ(m.multMatrixVec(untouched), m.transpose().multVecMatrix(untouched));
        const std::array rows{someVector(random, 1), x, y};
        EXPECT_EQ(KpMat3f(rows), KpMat3f(rows[0], rows[1], rows[2]).transpose());
    }
}

TEST(KpMat3f, decomposesByTheFirstPivotThatIsNotZero)
{
    const std::tuple<KpMat3f, bool, std::array<int, 3>, float> cases[] = {
        {{0.5F, 2, 3, 4, 5, 6, 7, 8, 9}, true, {0, 1, 2}, 0}, {{0, 2, 3, 0, 4, 5, 6, 7, 8}, true, {2, 1, 0}, 1},
        {{1, 2, 3, 2, 4, 5, 0, 7, 8}, true, {0, 2, 1}, 1},    {{0, 0, 3, 2, 1, 1, 2, 2, 2}, true, {1, 2, 0}, 0},
        {{0, 2, 3, 0, 4, 5, 0, 7, 8}, false, {0, 1, 2}, 0},   {{1, 0, 0, 0, 1, 0, 0, 0, 0}, true, {0, 1, 2}, 0},
    };
    for (const auto& [matrix, succeeds, expected, sign] : cases) {
        SCOPED_TRACE(matrix.dump());
        KpMat3f lu = matrix;
        int index[3];
        float parity;
        EXPECT_EQ(lu.LUDecomposition(index, parity), succeeds);
        EXPECT_EQ(std::tuple(std::to_array(index), parity), std::tuple(expected, sign));
        const KpMat3f l(1, 0, 0, lu[1][0], 1, 0, lu[2][0], lu[2][1], 1);
        const KpMat3f rebuilt = l * KpMat3f(lu[0][0], lu[0][1], lu[0][2], 0, lu[1][1], lu[1][2], 0, 0, lu[2][2]);
        for (int i = 0; succeeds && i < 9; ++i)
            EXPECT_NEAR(rebuilt[i / 3][i % 3], matrix[index[i / 3]][i % 3], 1e-5F);
    }
}

TEST(KpMat4f, multipliesAsAPlainLoopDoes)
{
    std::mt19937 random(2);
    for (int i = 0; i < 1000; ++i) {
        const auto a = some<KpMat4f>(random, i % 2), b = some<KpMat4f>(random, i % 2);
        const auto v = some<KpVec3f>(random, i % 2);
        EXPECT_EQ(bits(a * b), bits(product(a, b)));
        KpMat4f row;
        row.setTranslate(v);
        const KpMat4f column = product(a, row.transpose());
        row = product(row, a);
        const float w = 1 / row[3][3], h = 1 / column[3][3];
        EXPECT_EQ(bits(a.multVecMatrix(KpVec4f(v, 1))), bits(KpVec4f(row[3][0], row[3][1], row[3][2], row[3][3])));
        EXPECT_EQ(bits(a.multVecMatrix(v)), bits(KpVec3f(row[3][0] * w, row[3][1] * w, row[3][2] * w)));
        EXPECT_EQ(bits(a.multMatrixVec(v)), bits(KpVec3f(column[0][3] * h, column[1][3] * h, column[2][3] * h)));
        KpMat3f upper;
        upper.setValue(a);
        EXPECT_EQ(bits(a.multDirMatrix(v)), bits(upper.multVecMatrix(v)));
    }
    KpMat4f odd = KpMat4f::identity();
    odd[2][1] = NaN;
    EXPECT_FALSE(odd.isNumber()) << "NaN is no difference";
    EXPECT_TRUE(odd.equals(KpMat4f::identity(), 0)) << "NaN is no difference";
}

TEST(KpMat4f, transformsManyPointsAsItDoesOne)
{
    std::mt19937 random(4);
    for (const KpMat4f& matrix : {someAffine(random), some<KpMat4f>(random), some<KpMat4f>(random, true)}) {
        for (const std::size_t n : {0, 1, 7, 8, 9, 15, 16, 17, 31, 47, 100}) {
            std::vector<KpVec3f> points(n), results(n);
            std::generate(points.begin(), points.end(), [&] { return some<KpVec3f>(random, true); });
            const auto expectResults = [&](const std::vector<KpVec3f>& actual) {
                for (std::size_t i = 0; i < n; ++i)
                    ASSERT_EQ(bits(actual[i]), bits(matrix.multVecMatrix(points[i]))) << i << " of " << n;
            };
            for (const auto& path : transformPaths()) {
                SCOPED_TRACE(path.name);
                if (!path.usable || n == 0)
                    continue;
                results.assign(n, untouched);
                path.run(matrix.data(), points[0].data(), results[0].data(), static_cast<long>(n));
                expectResults(results);
            }
            results = points;
            matrix.multVecMatrix(results, results.data());
            expectResults(results);
        }
    }
}

TEST(KpMat4f, invertsAffineMatricesInAnyWay)
{
    std::mt19937 random(6);
    for (int i = 0; i < 2000; ++i) {
        const KpMat4f m = someAffine(random, i % 2);
        KpMat4f plain = m;
        const bool succeeds = affineInversePaths()[0].run(m.data(), plain[0]);
        for (const auto& path : affineInversePaths()) {
            KpMat4f inverse = m;
            EXPECT_TRUE(!path.usable || path.run(inverse.data(), inverse[0]) == succeeds) << path.name;
            EXPECT_TRUE(!path.usable || bits(inverse) == bits(plain)) << path.name << m.dump();
        }
        if (i % 2 == 0) {
            EXPECT_LE(residue(m, KpMat4fCache(m).getInvMatrix()), 8) << m.dump();
        }
    }
}

TEST(KpMat4f, leavesWhatIsNotAffineToDecomposition)
{
    KpMat4f kept = KpMat4f::identity(), twice = kept, nothing;
    twice[3][3] = 2;
    EXPECT_FALSE(KpMat4f::affine_inverse(twice, kept));
    EXPECT_EQ(twice.inverse()[3][3], 0.5F);
    const KpMat4f rank3(2, 0, 0, 0, 0, 2, 0, 0, 0, 0, 2, 2, 0, 0, 2, 2);
    EXPECT_TRUE(rank3.inverse().isNumber());
    EXPECT_GT(std::abs(rank3.inverse()[2][2]), 1e19F);
    nothing.setScale(0);
    nothing[3][3] = 0;
    EXPECT_TRUE(nothing.inverse().isNumber());
    EXPECT_EQ(nothing.inverse()[0][0], 1 / 1e-6F);

    std::mt19937 random(8);
    for (int i = 0; i < 500; ++i) {
        KpMat4f m = someAffine(random);
        for (int j = 0; j < 3; ++j) {
            m[0][j] = std::round(m[0][j] * 0x1p20F);
            m[1][j] = std::round(m[1][j] * 0x1p20F);
            m[2][j] = m[0][j] + m[1][j];  // exactly, so that the determinant is nothing but what rounding leaves of it
        }
        EXPECT_FALSE(KpMat4f::affine_inverse(m, kept));

        m = some<KpMat4f>(random);
        for (int k = 0; k < 4; ++k)
            m[k][k] += k % 2 ? 8.0F : -8.0F;
        std::swap_ranges(m[0], m[0] + 4, m[i % 4]);
        EXPECT_LE(residue(m, m.inverse()), 64) << m.dump();
        KpMat4f lu = m;
        int index[4];
        float sign;
        EXPECT_TRUE(lu.LUDecomposition(index, sign));
        EXPECT_NEAR(sign * lu[0][0] * lu[1][1] * lu[2][2] * lu[3][3] / m.det4(), 1, 1e-4F);
    }
    EXPECT_EQ(kept, KpMat4f::identity());
}

TEST(KpMat4f, measuresPivotsByTheirRowsAndPrefersTheLater)
{
    KpMat4f m(1, 2, 0, 0, 5, 10, 1, 0, 2, 1, 4, 0, 0, 0, 0, 0);  // each begins with half of its largest
    int index[4];
    float sign;
    m.LUDecomposition(index, sign);
    EXPECT_EQ(index[0], 2);
    EXPECT_EQ(m[3][3], 1e-6F);
    const float rows[4][4] = {{0, 1, 100, 0}, {0, 0.5F, 0, 1}, {1, 0, 0, 0}, {0, 0, 0, 1}};
    m = rows;  // the first row keeps its measure as it moves
    m.LUDecomposition(index, sign);
    EXPECT_EQ(std::tuple(index[0], index[1]), std::tuple(2, 1));
}

// The eigenvectors are the columns of `v`: A v = v diag(evalues), and v is orthogonal.
void expectEigen(const KpMat3f& a, const float (&evalues)[3], const KpMat3f& v)
{
    const KpMat3f scaled = v * KpMat3f(evalues[0], 0, 0, 0, evalues[1], 0, 0, 0, evalues[2]);
    const float size = std::max({std::abs(evalues[0]), std::abs(evalues[1]), std::abs(evalues[2])});
    EXPECT_TRUE((a * v).equals(scaled, 16 * eps * size)) << a.dump();
    EXPECT_TRUE((v.transpose() * v).equals(KpMat3f::identity(), 16 * eps));
}

TEST(Jacobi, findsEigenvectorsOfSymmetricMatrices)
{
    std::mt19937 random(9);
    float evalues[3], columns[3][3];
    KpVec3f evectors[3];
    int rotations;
    for (int i = 0; i < 500; ++i) {
        const auto half = some<KpMat3f>(random);
        KpMat3f a = i % 2 ? half + half.transpose() : half * half.transpose();
        if (i % 5 == 0)
            a = a + 1e4F * KpMat3f::identity();  // eigenvalues that are nearly equal
        a.jacobi(evalues, evectors, rotations);
        expectEigen(a, evalues, KpMat3f(evectors[0], evectors[1], evectors[2]));
        KpMat4f(a).jacobi3(evalues, columns, rotations);
        expectEigen(a, evalues, KpMat3f(columns));
    }
    const KpMat3f quarter(2, 1, 0, 1, 2, 0, 0, 0, 5), bad = quarter * NaN;
    quarter.jacobi(evalues, evectors, rotations);
    EXPECT_EQ(rotations, 1);
    EXPECT_EQ(std::to_array(evalues), (std::array{1.F, 3.F, 5.F}));
    KpMat4f(quarter).jacobi3(evalues, columns, rotations);
    EXPECT_EQ(rotations, 3);

    const LogCapture log;
    evectors[0] = untouched;
    bad.jacobi(evalues, evectors, rotations);
    EXPECT_EQ(evectors[0], untouched);
    KpMat4f(bad).jacobi3(evalues, columns, rotations);
    EXPECT_EQ(rotations, 150);
    EXPECT_EQ(log.lines(), Lines{"W [] Too many iterations in routine jacobi\n"});
}

TEST(KpMat4f, factorRebuildsItsInput)
{
    std::mt19937 random(10);
    KpMat4f m, r, u, proj, scale, move;
    KpVec3f s, t;
    for (int i = 0; i < 200; ++i) {
        m = someAffine(random);
        if (std::abs(m.det3()) < 0.1F)
            continue;
        ASSERT_TRUE(m.factor(r, s, u, t, proj));
        scale.setScale(s);
        move.setTranslate(t);
        EXPECT_TRUE((r * scale * r.transpose() * u * move).equals(m, 2e-4F)) << m.dump();
        EXPECT_TRUE((u * u.transpose()).equals(KpMat4f::identity(), 2e-3F));
        EXPECT_EQ(s[0] < 0, m.det3() < 0);
        EXPECT_GT(u.det3(), 0);
        EXPECT_TRUE(proj.isIdentity());
    }
    m.setScale(-1);
    EXPECT_TRUE(m.factor(r, s, u, t, proj));
    EXPECT_EQ(s, -ones);
    EXPECT_TRUE(u.isIdentity());
    m.setValue(origin, y, z, untouched);
    EXPECT_FALSE(m.factor(r, s, u, t, proj));
    EXPECT_EQ(std::tuple(t, u.isIdentity(), s), std::tuple(untouched, true, -ones));
}

TEST(KpMat4f, setTransformAppliesItsPartsInOrder)
{
    std::mt19937 random(11);
    KpMat4f m, again;
    KpVec3f t, s;
    KpRotation r, so;
    for (int i = 0; i < 200; ++i) {
        const KpVec3f translation = someVector(random, 2), corner(i % 6 == 2, i % 8 == 2, i % 10 == 2);
        const KpVec3f center = i % 2 ? someVector(random, 2) : corner;
        const KpVec3f scale = i % 3 ? KpVec3f(0.5F, 2, 3) : ones, v = someVector(random, 2);
        const KpRotation rotation(someVector(random, 2), 1), orientation(someVector(random, 2), 2);
        m.setTransform(translation, rotation, scale, orientation, center);
        const KpVec3f scaled = orientation * (scale * (orientation.inverse() * (v - center)));
        expectNear(m.multVecMatrix(v), rotation * scaled + center + translation, 2e-5F);
        m.getTransform(t, r, s, so, center);
        EXPECT_TRUE(r.equals(rotation, 1e-4F));
        expectNear(t, translation, 1e-4F);
        again.setTransform(t, r, s, so, center);
        EXPECT_TRUE(again.equals(m, 1e-4F));
    }
    m.setTransform(untouched, KpRotation::identity(), ones, KpRotation(ones, 1));
    again.setTranslate(untouched);
    EXPECT_EQ(m, again) << "what changes nothing rounds nothing";
    m.setScale(0);
    s = untouched;
    m.getTransform(t, r, s, so);
    EXPECT_EQ(std::tuple(r, so, s), std::tuple(KpRotation::identity(), KpRotation::identity(), untouched))
        << "singular";
}

TEST(KpMat4f, printsRowsInTwoLines)
{
    char text[200] = {};
    std::FILE* file = fmemopen(text, sizeof text, "w");
    KpMat4f m = KpMat4f::identity();
    m[0][2] = -0.333333F;
    m.print(file);
    m.print(nullptr);
    std::fclose(file);
    const std::string printed(text);
    EXPECT_TRUE(printed.starts_with("         1\t         0\t  -0.33333\n         0\n"));
    EXPECT_EQ(std::count(printed.begin(), printed.end(), '\n'), 8);
    EXPECT_TRUE(m.dump().starts_with(R"({"m00":"1.000000","m01":"0.000000","m02":"-0.333333",)"));
}

}  // namespace
