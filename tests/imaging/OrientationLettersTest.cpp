#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
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
    const struct {
        const char* what;
        KpMat4f matrix;
        std::string edges;  // right, top, left, bottom
    } cases[] = {
        {"axial", KpMat4f::identity(), "L/A/R/P"},
        {"coronal", rows({1, 0, 0}, {0, 0, -1}), "L/H/R/F"},
        {"NaN", rows({0, std::nanf("0"), -1}, {1, 0, 0}), "L/A/R/P"},
        {"tie goes to x, and y can't have it", rows({1, 1, 0}, {-1, 1, 0}), "L/A/R/P"},
        {"tie of y and z goes to y", rows({0, -2, -2}, {3, 3, 1}), "A/R/P/L"},
        {"negative zero is positive", rows({-0.0F, -0.0F, -0.0F}, {0, 0, -1}), "L/H/R/F"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(Letters(c.matrix).join('/'), c.edges) << c.what;
    // inverse(second * third) * first, none of which commute: x goes to -y, y to x. Here y is upward.
    const KpMat4f first(KpMat3f(1, 0, 0, 0, 0, 1, 0, -1, 0)), second(KpMat3f(0, 1, 0, -1, 0, 0, 0, 0, 1));
    const KpMat4f third(KpMat3f(0, 0, -1, 0, 1, 0, 1, 0, 0));
    EXPECT_EQ(Letters(first, second, third).join('/'), "A/L/P/R");
    const KpMat4f nan = rows({0, std::nanf("0"), -1}, {1, 0, 0});
    EXPECT_EQ(Letters(nan, KpMat4f::identity(), KpMat4f::identity()).join('/'), "L/P/R/A");
}

TEST(KpOrientationLetters, readsStrings)
{
    const struct {
        const char *right, *bottom, *edges;
        bool isValid;
        const char* slices;  // axial, coronal, sagittal
    } cases[] = {{"L", "P", "L/A/R/P", true, "a"},       {"L", "F", "L/H/R/F", true, "c"},
                 {"A", "F", "A/H/P/F", true, "s"},       {"LPH", "FA", "LPH/HP/RAF/FA", true, ""},
                 {"L", "R", "L/L/R/R", false, "ac"},     {"LP", "LP", "LP/RA/RA/LP", false, "a"},
                 {"LP", "AR", "LP/PL/RA/AR", true, "a"}, {"l", "P", "///", false, "acs"},
                 {"L", "", "///", false, "acs"}};
    for (const auto& c : cases) {
        const Letters letters(c.right, c.bottom);
        EXPECT_EQ(letters.join('/'), c.edges);
        EXPECT_EQ(letters.isValid(), c.isValid) << c.edges;
        std::string slices = letters.isAxial() ? "a" : "";
        slices += letters.isCoronal() ? "c" : "";
        slices += letters.isSagittal() ? "s" : "";
        EXPECT_EQ(slices, c.slices) << c.edges;
    }
}

TEST(KpOrientationLetters, givesViewAndUp)
{
    const float half = std::sqrt(0.5F);
    const float sine = 0.38268343F, cosine = 0.92387953F;  // of 22.5 degrees
    KpMat4f quarter;
    quarter.setRotate(KpRotation(KpVec3f(1, 0, 0), 1.5707964F));  // y to z
    const KpMat4f one = KpMat4f::identity(), zero = rows({0, 0, 0}, {0, 0, 0}, {0, 0, 0});
    const struct {
        const char *right, *bottom;
        KpMat4f matrix;
        KpVec3f view, up, snappedView, snappedUp;
    } cases[] = {
        {"L", "P", one, {0, 0, 1}, {0, -1, 0}, {0, 0, 1}, {0, -1, 0}},
        {"L", "P", quarter, {0, -1, 0}, {0, 0, -1}, {0, -1, 0}, {0, 0, -1}},
        {"LP", "A", one, {0, 0, -half}, {0, 1, 0}, {0, 0, -1}, {0, 1, 0}},
        {"LP", "AL", one, {0, 0, -1}, {-half, half, 0}, {0, 0, -1}, {0, 1, 0}},
        {"L", "PH", one, {0, -half, half}, {0, -half, -half}, {0, 0, 1}, {0, -1, 0}},  // a tie goes to the last
        {"F", "LPL", one, {sine, -cosine, 0}, {-cosine, -sine, 0}, {0, -1, 0}, {-1, 0, 0}},
        {"L", "P", zero, {0, 0, 0}, {0, 0, 0}, {0, 0, -1}, {0, -1, 0}},  // nothing is negative
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string(c.right) + '/' + c.bottom);
        KpVec3f view, up;
        EXPECT_TRUE(Letters(c.right, c.bottom).getViewDirection(view, up, c.matrix, false));
        EXPECT_LT((view - c.view).length() + (up - c.up).length(), 1e-6F) << view << up;
        EXPECT_TRUE(Letters(c.right, c.bottom).getViewDirection(view, up, c.matrix, true));
        EXPECT_TRUE(view == c.snappedView && up == c.snappedUp) << view << up;
    }
    KpVec3f view(1, 2, 3), up = view;
    EXPECT_FALSE(Letters("L", "R").getViewDirection(view, up, KpMat4f::identity(), true));
    EXPECT_TRUE(view == KpVec3f(1, 2, 3) && up == view);
}
