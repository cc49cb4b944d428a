#include <kplib/geometry/numerics/KpDMatrix.h>

#include <kplib/geometry/numerics/detail/LinearSolver.h>
#include <support/FailingMalloc.h>
#include <support/LogCapture.h>

#include <Eigen/Dense>
#include <gtest/gtest.h>

#include <random>
#include <vector>

using kplib::test::FailingMalloc, kplib::test::Lines, kplib::test::LogCapture;

namespace {

using Matrix = Eigen::Matrix<float, Eigen::Dynamic, Eigen::Dynamic, Eigen::RowMajor>;

Matrix noise(int rows, int cols, unsigned seed = 1)
{
    std::mt19937 random(seed);
    std::uniform_real_distribution<float> number(-1, 1);
    return Matrix::NullaryExpr(rows, cols, [&] { return number(random); });
}

KpDMatrix<float> toKp(const Matrix& matrix)
{
    KpDMatrix<float> result(static_cast<int>(matrix.rows()), static_cast<int>(matrix.cols()));
    std::copy_n(matrix.data(), matrix.size(), result.data());
    return result;
}

Matrix toEigen(const KpDMatrix<float>& matrix)
{
    return Eigen::Map<const Matrix>(matrix.data(), matrix.rows(), matrix.cols());
}

Matrix from(int rows, int cols, std::initializer_list<float> elements)
{
    return Eigen::Map<const Matrix>(elements.begin(), rows, cols);
}

const std::pair<const char*, Matrix> decomposed[] = {
    {"empty", Matrix(0, 0)},
    {"no rows", Matrix(0, 2)},
    {"nothing", Matrix::Zero(3, 3)},
    {"one element", from(1, 1, {5})},
    {"rank one", from(3, 1, {1, 2, 3}) * from(1, 3, {3, -1, 2})},
    {"only a superdiagonal", from(3, 3, {0, 1, 0, 0, 0, 2, 0, 0, 0})},
    {"a zero before the last value", from(3, 2, {0.75F, -1, 0, 0, 0, 1})},
    {"a zero in the diagonal", from(3, 3, {1, 2, 0, 0, 0, 3, 0, 0, 4})},
    {"small", noise(3, 3)},
    {"large numbers", noise(3, 3) * 1e18F},
    {"small numbers", noise(3, 3) * 1e-15F},
    {"tall", noise(100, 3)},
    {"wide", noise(3, 7)},
    {"two equal columns", noise(8, 3) * from(3, 4, {1, 0, 1, 0, 0, 1, 0, 0, 0, 0, 0, 1})},
};

TEST(KpDMatrixSvd, makesUpTheMatrixFromOrthonormalColumns)
{
    for (const auto& [what, matrix] : decomposed) {
        SCOPED_TRACE(what);
        const KpDMatrix<float> a = toKp(matrix), signedZeros = toKp((matrix.array() == 0).select(-0.0F, matrix));
        KpDMatrix<float> kpU, kpV, sameU;
        Eigen::VectorXf w = Eigen::VectorXf::Constant(matrix.cols(), -1), sameW = w;
        ASSERT_TRUE(a.SVD(kpU, w.data(), kpV, 30));
        EXPECT_EQ(toEigen(a), matrix);
        const Matrix u = toEigen(kpU), v = toEigen(kpV);
        const Matrix square = u.rows() < u.cols() ? Matrix(u * u.transpose()) : Matrix(u.transpose() * u);
        ASSERT_TRUE(signedZeros.SVD(sameU, sameW.data(), kpV, 30));
        EXPECT_EQ(toEigen(sameU), u);
        EXPECT_EQ(toEigen(kpV), v);
        if (matrix.size() == 0)
            continue;
        const float scale = std::max(matrix.norm(), 1e-30F), bound = 3e-6F * static_cast<float>(matrix.cols());
        EXPECT_LE((u * w.asDiagonal() * v.transpose() - matrix).norm(), bound * scale);
        EXPECT_LE((v.transpose() * v - Matrix::Identity(v.cols(), v.cols())).norm(), bound);
        EXPECT_LE((square - Matrix::Identity(square.rows(), square.cols())).norm(), bound);
        EXPECT_NEAR(w.norm(), matrix.norm(), bound * scale);
        EXPECT_GE(w.minCoeff(), 0);
    }
}

TEST(KpDMatrixSvd, tellsWhatDoesNotConverge)
{
    const Matrix withNaN = Matrix::Constant(2, 2, std::numeric_limits<float>::quiet_NaN());
    const std::tuple<Matrix, int, bool> cases[] = {
        {noise(3, 3), 1, false}, {noise(3, 3), 0, false}, {Matrix::Identity(3, 3), 1, true}, {withNaN, 30, false}};
    for (const auto& [matrix, maxIterations, isFine] : cases) {
        const LogCapture log;
        KpDMatrix<float> u, v;
        float w[3];
        EXPECT_EQ(toKp(matrix).SVD(u, w, v, maxIterations), isFine);
        const std::string line = "W [] no convergence in " + std::to_string(maxIterations) + " svd iterations \n";
        EXPECT_EQ(log.lines(), isFine ? Lines{} : Lines{line});
    }
    const LogCapture quiet;
    int fast = 0;
    for (int i = 0; i < 1000; ++i) {
        KpDMatrix<float> u, v;
        float w[3];
        fast += toKp(noise(3, 3)).SVD(u, w, v, 4);
    }
    EXPECT_GT(fast, 850) << "with any other shift all converge too, but later";
}

TEST(KpDMatrix, multipliesAndTransposesAnyShape)
{
    const Matrix a = noise(5, 3), b = noise(3, 4, 2);
    KpDMatrix<float> product = toKp(a);
    product *= toKp(b);
    product.transpose();
    const LogCapture log;
    product *= product;
    EXPECT_TRUE(toEigen(product).isApprox((a * b).transpose(), 1e-6F));
    EXPECT_EQ(log.lines(), Lines{"E [] KpDMatrix:operator*: Can not multiply 4x5 matrix by 4x5 matrix.\n"});
}

TEST(KpDMatrix, ownsItsBlock)
{
    KpDMatrix<float> a = toKp(from(2, 3, {1, 2, 3, 4, 5, 6})), copy = a;
    copy[1][2] = 7;
    a.resize(3, 2);  // the elements keep their places in memory
    EXPECT_EQ(toEigen(a), from(3, 2, {1, 2, 3, 4, 5, 6}));
    copy.resize(0, 0);
    EXPECT_EQ(copy.data(), nullptr);
    const FailingMalloc failing(0);
    EXPECT_ANY_THROW(copy.resize(10, 10));
    EXPECT_EQ(copy.rows(), 0);
}

TEST(KpDMatrixSolve, leavesASmallResidual)
{
    for (const int n : {0, 1, 2, 3, 4, 5, 8, 9, 50, 101}) {
        SCOPED_TRACE(n);
        const Matrix matrix = noise(n, n), sides = noise(3, n, 2);
        const KpDMatrix<float> a = toKp(matrix);
        KpDMatrix<float> x = toKp(sides);
        float* rhs[] = {x[0], x[1], x[2]};
        ASSERT_EQ(a.solveLRdecomp(rhs, 3), 0);
        EXPECT_EQ(toEigen(a), matrix);
        if (n == 0)
            continue;
        EXPECT_LE((matrix * toEigen(x).transpose() - sides.transpose()).norm(), 2e-5F * sides.norm());
    }
}

TEST(KpDMatrixSolve, takesTheLastOfEqualPivots)
{
    const KpDMatrix<float> a = toKp(from(3, 3, {1, 2, 3, -1, 0, 1, 1, 5, 0}));
    KpDMatrix<float> lr(3, 3);
    float sign = 0;
    float* rows[] = {lr[0], lr[1], lr[2]};
    EXPECT_EQ(a.solveLRdecomp(rows, nullptr, 0, sign), 0);
    EXPECT_EQ(toEigen(lr), from(3, 3, {1, 5, 0, -1, 5, 1, 1, -0.6F, 3.6F}));
    EXPECT_EQ(sign, -1);
}

TEST(KpDMatrixSolve, tellsBadSolutionsButNotTheZeroOne)
{
    constexpr int n = 10;  // a Hilbert matrix: all digits of a float are lost
    KpDMatrix<float> a(n, n);
    for (int i = 0; i < n * n; ++i)
        a.data()[i] = 1 / static_cast<float>(i / n + i % n + 1);
    float zeros[n] = {}, side[n] = {1, -1};
    float* rhs[] = {zeros, side};
    const LogCapture log;
    EXPECT_EQ(a.solveLRdecomp(rhs, 2), 0);
    EXPECT_EQ(std::count(zeros, zeros + n, 0.0F), n);
    ASSERT_EQ(log.lines().size(), 1U);
    float ratio = 0;
    EXPECT_EQ(std::sscanf(log.lines()[0].c_str(), "W [] norm(residuum) / norm(rhs) = %g \n", &ratio), 1);
    EXPECT_GT(ratio, 1e-4F);
}

TEST(KpDMatrixSolve, leavesTheSidesWhereItFails)
{
    const std::string text = " [] KpDMatrix::solveLRdecomp: ", noMemory = "E" + text + "Not Enough Memory";
    const Matrix dependent = from(2, 2, {1, 2, 2, 4}), regular = Matrix::Identity(2, 2);
    const std::tuple<Matrix, long, Lines> cases[] = {
        {Matrix::Zero(2, 2), -1, {"E" + text + "Singular Matrix-2\n", "E [] i, n: 0 2\n"}},
        {dependent, -1, {"E" + text + "Singular Matrix-2\n", "E [] i, n: 1 2\n"}},
        {Matrix::Zero(2, 3), -1, {"W" + text + "must be a square matrix.\n"}},
        {regular, 0, {noMemory + ".\n"}},
        {regular, 1, {noMemory + " (0).\n"}},
        {regular, 2, {noMemory + " (1).\n"}},
        {regular, 3, {noMemory + ".\n"}},
        {regular, 4, {noMemory + ".\n"}},
    };
    for (const auto& [matrix, failsAt, lines] : cases) {
        SCOPED_TRACE(lines[0]);
        const KpDMatrix<float> a = toKp(matrix);
        float side[] = {5, 6};
        float* rhs[] = {side};
        const LogCapture log;
        {
            const FailingMalloc failing(failsAt, 1);
            EXPECT_EQ(a.solveLRdecomp(rhs, 1), 1);
        }
        EXPECT_EQ(log.lines(), lines);
        EXPECT_EQ(side[1], 6);
        const FailingMalloc failing(failsAt);
        if (failsAt >= 0) {
            EXPECT_ANY_THROW(a.solveLRdecomp(rhs, 1)) << "no memory for the line either";
        }
    }
}

TEST(Eliminate, everyPathEqualsThePlainOne)
{
    for (const auto& path : kplib::detail::eliminatePaths()) {
        for (int n = 1; path.usable && n < 40; ++n) {
            KpDMatrix<float> matrices[2];
            matrices[0] = matrices[1] = toKp(noise(n, n));
            for (KpDMatrix<float>& matrix : matrices) {
                std::vector<float*> rows;
                for (int i = 0; i < n; ++i)
                    rows.push_back(matrix[i]);
                (&matrix == matrices ? kplib::detail::eliminatePaths()[0] : path).run(rows.data(), n / 4, n);
            }
            EXPECT_EQ(toEigen(matrices[1]), toEigen(matrices[0])) << path.name << ' ' << n;
        }
    }
}

TEST(KpDMatrix, pythagDoesNotOverflow)
{
    const float cases[][3] = {{3, -4, 5}, {-3e30F, 4e30F, 5e30F}, {3e-30F, 4e-30F, 5e-30F}, {0, 0, 0}, {0, -2, 2}};
    for (const auto& [a, b, expected] : cases)
        EXPECT_FLOAT_EQ(KpDMatrix<float>::pythag(a, b), expected);
    for (const auto& [a, b] : {std::pair(0.0F, NAN), {1.0F, NAN}, {NAN, 0.0F}, {NAN, 1.0F}})
        EXPECT_TRUE(std::isnan(KpDMatrix<float>::pythag(a, b)));
}

}  // namespace
