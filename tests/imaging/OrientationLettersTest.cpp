#include <kplib/geometry/KpMat4f.h>
#include <kplib/imaging/KpOrientationLetters.h>

#include <gtest/gtest.h>

#include <cmath>

namespace {

using Letters = KpOrientationLetters;

KpMat4f rows(const KpVec3f& x, const KpVec3f& y, const KpVec3f& z = KpVec3f(0, 0, 1))
{
    KpMat4f matrix;
    matrix.setValue(x, y, z, KpVec3f(5, 6, 7));
    return matrix;
}

}  // namespace

TEST(KpOrientationLetters, readsMatrices)
{
    const std::pair<KpMat4f, std::string> cases[] = {
        // right, top, left, bottom
        {KpMat4f::identity(), "L/A/R/P"},
        {rows({0, std::nanf("0"), -1}, {1, 0, 0}), "L/A/R/P"},
        {rows({1, 1, 0}, {-1, 1, 0}), "L/A/R/P"},   // a tie goes to x, and y can't have it
        {rows({0, -2, -2}, {3, 3, 1}), "A/R/P/L"},  // one of y and z goes to y
        {rows({-0.0F, -0.0F, -0.0F}, {0, 0, -1}), "L/H/R/F"},
    };
    for (const auto& [matrix, edges] : cases)
        EXPECT_EQ(Letters(matrix).join('/'), edges);
    // inverse(second * third) * first, none of which commute: x goes to -y, y to x. Here y is upward.
    const KpMat4f first = rows({1, 0, 0}, {0, 0, 1}, {0, -1, 0}), second = rows({0, 1, 0}, {-1, 0, 0});
    const KpMat4f third = rows({0, 0, -1}, {0, 1, 0}, {1, 0, 0});
    EXPECT_EQ(Letters(first, second, third).join('/'), "A/L/P/R");
    EXPECT_EQ(Letters(cases[1].first, cases[0].first, cases[0].first).join('/'), "L/P/R/A");
}

TEST(KpOrientationLetters, readsStrings)
{
    // Right, bottom, all edges, whether they are valid, and the slices: axial, coronal, sagittal.
    const std::tuple<const char*, const char*, const char*, bool, const char*> cases[] = {
        {"L", "F", "L/H/R/F", true, "c"},         {"A", "F", "A/H/P/F", true, "s"},
        {"LPH", "FA", "LPH/HP/RAF/FA", true, ""}, {"L", "R", "L/L/R/R", false, "ac"},
        {"LP", "LP", "LP/RA/RA/LP", false, "a"},  {"LP", "AR", "LP/PL/RA/AR", true, "a"},
        {"l", "P", "///", false, "acs"},          {"L", "", "///", false, "acs"}};
    for (const auto& [right, bottom, edges, isValid, slices] : cases) {
        const Letters l(right, bottom);
        EXPECT_EQ(std::tuple(l.join('/'), l.isValid()), std::tuple(edges, isValid));
        const std::string found = std::string(l.isAxial(), 'a') + std::string(l.isCoronal(), 'c');
        EXPECT_EQ(found + std::string(l.isSagittal(), 's'), slices) << edges;
    }
}

TEST(KpOrientationLetters, givesViewAndUp)
{
    const float half = std::sqrt(0.5F), sine = 0.38268343F, cosine = 0.92387953F;  // of 22.5 degrees
    const KpMat4f one = KpMat4f::identity(), zero = rows({0, 0, 0}, {0, 0, 0}, {0, 0, 0});
    const KpMat4f quarter = rows({1, 0, 0}, {0, 0, 1}, {0, -1, 0});  // y to z
    const std::tuple<const char*, const char*, KpMat4f, KpVec3f, KpVec3f, KpVec3f, KpVec3f> cases[] = {
        {"L", "P", quarter, {0, -1, 0}, {0, 0, -1}, {0, -1, 0}, {0, 0, -1}},
        {"LP", "AL", one, {0, 0, -1}, {-half, half, 0}, {0, 0, -1}, {0, 1, 0}},
        {"L", "PH", one, {0, -half, half}, {0, -half, -half}, {0, 0, 1}, {0, -1, 0}},  // a tie goes to the last
        {"F", "LPL", one, {sine, -cosine, 0}, {-cosine, -sine, 0}, {0, -1, 0}, {-1, 0, 0}},
        {"L", "P", zero, {0, 0, 0}, {0, 0, 0}, {0, 0, -1}, {0, -1, 0}},  // nothing is negative
    };
    for (const auto& [right, bottom, matrix, viewed, upward, snappedView, snappedUp] : cases) {
        const Letters letters(right, bottom);
        KpVec3f view, up;
        EXPECT_TRUE(letters.getViewDirection(view, up, matrix, false));
        EXPECT_LT((view - viewed).length() + (up - upward).length(), 1e-6F) << letters.join('/') << view << up;
        EXPECT_TRUE(letters.getViewDirection(view, up, matrix, true));
        EXPECT_EQ(std::tuple(view, up), std::tuple(snappedView, snappedUp)) << letters.join('/');
    }
    KpVec3f view(1, 2, 3), up = view;
    EXPECT_FALSE(Letters("L", "R").getViewDirection(view, up, one, true));
    EXPECT_EQ(std::tuple(view, up), std::tuple(KpVec3f(1, 2, 3), KpVec3f(1, 2, 3)));
}
