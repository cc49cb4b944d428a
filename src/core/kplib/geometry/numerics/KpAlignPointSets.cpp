#include <kplib/geometry/numerics/KpAlignPointSets.h>

#include <kplib/foundation/KpMemoryException.h>
#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/numerics/KpDMatrix.h>
#include <kplib/geometry/numerics/detail/CentredRows.h>
#include <kplib/geometry/numerics/detail/LinearSolver.h>

#include <algorithm>

namespace {

using kplib::detail::CentredRows, kplib::detail::PointList, kplib::detail::Row4;

constexpr int svdIterations = 30;
constexpr double flat = 1e-5;  // a singular value below it: the points lie in a plane or on a line

enum Mode : int { Rigid = 0, RigidWithScale = 1, Affine = 2 };

// How the weights of the two lists are used: one array for both, whose sum in list 1 divides both centroids and which
// weights the rows of list 2 alone, or an array for each.
enum class Weights { None, Shared, Own };

KpMat4f between(const KpVec3f& centroidA, const KpMat3f& matrix, const KpVec3f& centroidB)
{
    KpMat4f toOrigin, back;
    toOrigin.setTranslate(-centroidA);
    back.setTranslate(centroidB);
    return toOrigin * KpMat4f(matrix) * back;
}

KpVec3f column(const KpDMatrix<float>& m, int j)
{
    return {m[0][j], m[1][j], m[2][j]};
}

void setColumn(KpDMatrix<float>& m, int j, const KpVec3f& v)
{
    for (int i = 0; i < 3; ++i)
        m[i][j] = v[i];
}

KpMat3f timesTransposed(const KpDMatrix<float>& u, const KpDMatrix<float>& v)
{
    KpMat3f left, right;
    std::copy_n(u.data(), 9, left[0]);
    std::copy_n(v.data(), 9, right[0]);
    return left * right.transpose();
}

// The places of the smallest, the middle and the largest singular value; 0, 1, 2 if they are all equal.
struct Order {
    explicit Order(const float (&w)[3])
    {
        smallest = static_cast<int>(std::min_element(w, w + 3) - w);
        largest = static_cast<int>(std::max_element(w, w + 3) - w);
        if (smallest == largest)
            largest = 2;
        middle = 3 - smallest - largest;
    }
    int smallest, middle, largest;
};

// The rotation R that makes the sum of the squares of A R - B least, for H = transpose(A) * B.
KpMat3f rotationFor(const KpMat3f& h)
{
    KpDMatrix<float> correlation(3, 3), u, v;
    std::copy_n(h.data(), 9, correlation.data());
    float w[3];
    correlation.SVD(u, w, v, svdIterations);
    const KpMat3f rotation = timesTransposed(u, v);
    const Order order(w);
    const bool isFlat = static_cast<double>(w[order.smallest]) < flat;
    if (isFlat) {
        for (KpDMatrix<float>* vectors : {&u, &v})
            setColumn(*vectors, order.smallest, column(*vectors, order.largest).cross(column(*vectors, order.middle)));
    } else if (rotation.det3() < 0) {
        setColumn(u, order.smallest, -column(u, order.smallest));
    } else {
        return rotation;
    }
    return timesTransposed(u, v);
}

struct ScaleSums {
    float products, squares;

    ScaleSums& operator+=(const ScaleSums& other)
    {
        products += other.products;
        squares += other.squares;
        return *this;
    }
};

template <typename Rows>
float scaleFor(const Rows& rows, const KpMat3f& rotation)
{
    Row4 r[3];
    for (int i = 0; i < 3; ++i)
        r[i] = Row4{rotation[i][0], rotation[i][1], rotation[i][2], 0};
    const auto sums = rows.template sum<ScaleSums>([&](ScaleSums& s, Row4 a, Row4 b) {
        const Row4 t = a[0] * r[0] + a[1] * r[1] + a[2] * r[2], product = b * t, square = t * t;
        s.products += product[0] + product[1] + product[2];
        s.squares += square[0] + square[1] + square[2];
    });
    return sums.products / sums.squares;
}

// The points of the two lists, of which the rows hold the differences from their centroids.
struct Centroids {
    KpVec3f list1, list2;
};

template <typename Rows>
KpMat4f fitRigid(const Rows& rows, const Centroids& centroids, bool withScale)
{
    KpMat3f matrix = rotationFor(sumOfProducts(rows, [](Row4, Row4 b) { return b; }));
    if (withScale)
        matrix *= scaleFor(rows, matrix);
    return between(centroids.list2, matrix, centroids.list1);
}

template <typename Rows>
KpMat4f fitAffine(const Rows& rows, const Centroids& centroids)
{
    const KpMat3f normal = sumOfProducts(rows, [](Row4 a, Row4) { return a; });
    KpMat3f sides = sumOfProducts(rows, [](Row4, Row4 b) { return b; }).transpose(), factors = normal;
    float* lr[] = {factors[0], factors[1], factors[2]};
    kplib::detail::LinearSolver solver(normal.data(), 3, lr);
    if (!solver.isComplete())
        throw KpMemoryException();  // otherwise the right-hand sides would be taken for the solution
    float sign = 1;
    if (solver.decompose(sign)) {
        for (int i = 0; i < 3; ++i)
            solver.solve(sides[i]);
    }
    return between(centroids.list2, sides.transpose(), centroids.list1);
}

struct CentroidSums {
    Row4 points1, points2;  // times their weights
    float weights1, weights2;

    CentroidSums& operator+=(const CentroidSums& other)
    {
        points1 += other.points1;
        points2 += other.points2;
        weights1 += other.weights1;
        weights2 += other.weights2;
        return *this;
    }
};

template <bool isIndexed, Weights kind>
class Alignment {
public:
    using List = PointList<isIndexed, kind != Weights::None>;
    using Rows = CentredRows<List, List, kind == Weights::Own>;

    Alignment(const List& list1, const List& list2, int n) : rows_{list1, list2, {}, {}, n} {}

    void run(KpMat4f& result, int mode, const KpMat4f* initial)
    {
        const KpMat4f last = initial ? *initial : KpMat4f();  // a copy, as it may be `result`
        if (!computeCentroids())
            result.makeIdentity();
        else if (mode == Affine)
            result = fitAffine(rows_, centroids());
        else if (mode == Rigid || mode == RigidWithScale)
            result = fitRigid(rows_, centroids(), mode == RigidWithScale);
        if (initial)
            result *= last;
    }

private:
    Centroids centroids() const { return {rows_.centre1, rows_.centre2}; }

    // False if there is nothing to divide by.
    bool computeCentroids()
    {
        const auto sums = kplib::detail::sumOfPairs<CentroidSums>(
            rows_.list1, rows_.list2, rows_.n, [this](CentroidSums& s, long i, Row4 p1, Row4 p2) {
                const float weight1 = rows_.list1.weight(i), weight2 = rows_.list2.weight(i);
                s.points1 += weight1 * p1;
                s.points2 += weight2 * p2;
                s.weights1 += weight1;
                s.weights2 += weight2;
            });
        const float sum1 = kind == Weights::None ? static_cast<float>(rows_.n) : sums.weights1;
        const float sum2 = kind == Weights::Own ? sums.weights2 : sum1;
        rows_.centre1 = kplib::detail::toVector(sums.points1 / sum1);
        rows_.centre2 = kplib::detail::toVector(sums.points2 / sum2);
        return sum1 != 0 && sum2 != 0;
    }

    Rows rows_;
};

const float* numbers(const KpVec3f* points)
{
    return reinterpret_cast<const float*>(points);  // a vector is its three floats; without pairs the lists may be null
}

// Null for index lists or weights that there are none of.
template <bool isIndexed, Weights kind>
void align(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1, const int* index2,
           const float* weights1, const float* weights2, int n, int mode, const KpMat4f* initial)
{
    Alignment<isIndexed, kind> alignment({numbers(points1), index1, weights1}, {numbers(points2), index2, weights2}, n);
    alignment.run(result, mode, initial);
}

// Rows that exist already.
auto rowsOf(const KpDMatrix<float>& a, const KpDMatrix<float>& b)
{
    using List = PointList<false, false>;
    const KpVec3f origin(0, 0, 0);
    return CentredRows<List, List, false>{
        {b.data(), nullptr, nullptr}, {a.data(), nullptr, nullptr}, origin, origin, a.rows()};
}

}  // namespace

void kpCompRigidTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                          const KpVec3f& centroidB, KpMat4f& result, bool withScale)
{
    result = fitRigid(rowsOf(a, b), {centroidB, centroidA}, withScale);
}

void kpCompAffineTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                           const KpVec3f& centroidB, KpMat4f& result)
{
    result = fitAffine(rowsOf(a, b), {centroidB, centroidA});
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                      const int* index2, int n, int mode, const KpMat4f* initial)
{
    align<true, Weights::None>(result, points1, points2, index1, index2, nullptr, nullptr, n, mode, initial);
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                      const int* index2, const float* weights, int n, int mode, const KpMat4f* initial)
{
    align<true, Weights::Shared>(result, points1, points2, index1, index2, weights, weights, n, mode, initial);
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                      const int* index2, const float* weights1, const float* weights2, int n, int mode,
                      const KpMat4f* initial)
{
    align<true, Weights::Own>(result, points1, points2, index1, index2, weights1, weights2, n, mode, initial);
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, int n, int mode,
                      const KpMat4f* initial)
{
    align<false, Weights::None>(result, points1, points2, nullptr, nullptr, nullptr, nullptr, n, mode, initial);
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const float* weights, int n,
                      int mode, const KpMat4f* initial)
{
    align<false, Weights::Shared>(result, points1, points2, nullptr, nullptr, weights, weights, n, mode, initial);
}

void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const float* weights1,
                      const float* weights2, int n, int mode, const KpMat4f* initial)
{
    align<false, Weights::Own>(result, points1, points2, nullptr, nullptr, weights1, weights2, n, mode, initial);
}
