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
    for (const auto& c : cases) {
        EXPECT_EQ(Letters(c.matrix).join('/'), c.edges) << c.what;
        // Upward y changes top and bottom; the two others together cancel their inverse here.
        const Letters upward(c.matrix, KpMat4f::identity(), KpMat4f::identity());
        EXPECT_TRUE(upward.right() == c.edges.substr(0, 1) && upward.top() == c.edges.substr(6) &&
                    upward.left() == c.edges.substr(4, 1) && upward.bottom() == c.edges.substr(2, 1))
            << c.what << ' ' << upward.join('/');
    }
    // inverse(second * third) * first, none of which commute: x goes to -y, y to x
    const KpMat4f first(KpMat3f(1, 0, 0, 0, 0, 1, 0, -1, 0)), second(KpMat3f(0, 1, 0, -1, 0, 0, 0, 0, 1));
    const KpMat4f third(KpMat3f(0, 0, -1, 0, 1, 0, 1, 0, 0));
    EXPECT_EQ(Letters(first, second, third).join('/'), "A/L/P/R");
}

TEST(KpOrientationLetters, readsStrings)
{
    const struct {
        const char *right, *bottom, *edges;
        bool isValid;
        const char* slice;
    } cases[] = {
        {"L", "P", "L/A/R/P", true, "axial"},
        {"L", "F", "L/H/R/F", true, "coronal"},
        {"A", "F", "A/H/P/F", true, "sagittal"},
        {"LPH", "FA", "LPH/HP/RAF/FA", true, ""},
        {"L", "R", "L/L/R/R", false, "axial coronal"},
        {"LP", "LP", "LP/RA/RA/LP", false, "axial"},
        {"LP", "AR", "LP/PL/RA/AR", true, "axial"},
        {"l", "P", "///", false, "axial coronal sagittal"},
        {"L", "", "///", false, "axial coronal sagittal"},
    };
    for (const auto& c : cases) {
        const Letters letters(c.right, c.bottom);
        const std::string slice = c.slice;
        EXPECT_EQ(letters.join('/'), c.edges);
        EXPECT_EQ(letters.isValid(), c.isValid) << c.edges;
        EXPECT_EQ(letters == Letters(), letters.right().empty());
        EXPECT_EQ(letters.isAxial(), slice.find("axial") != std::string::npos) << c.edges;
        EXPECT_EQ(letters.isCoronal(), slice.find("coronal") != std::string::npos) << c.edges;
        EXPECT_EQ(letters.isSagittal(), slice.find("sagittal") != std::string::npos) << c.edges;
    }
}

TEST(KpOrientationLetters, givesViewAndUp)
{
    const float half = std::sqrt(0.5F);
    const float sine = 0.38268343F, cosine = 0.92387953F;  // of 22.5 degrees
    KpMat4f quarter;
    quarter.setRotate(KpRotation(KpVec3f(1, 0, 0), 1.5707964F));  // y to z
    const struct {
        const char *what, *right, *bottom;
        KpMat4f matrix;
        KpVec3f view, up, snappedView, snappedUp;
    } cases[] = {
        {"axial", "L", "P", KpMat4f::identity(), {0, 0, 1}, {0, -1, 0}, {0, 0, 1}, {0, -1, 0}},
        {"turned", "L", "P", quarter, {0, -1, 0}, {0, 0, -1}, {0, -1, 0}, {0, 0, -1}},
        {"oblique right", "LP", "A", KpMat4f::identity(), {0, 0, -half}, {0, 1, 0}, {0, 0, -1}, {0, 1, 0}},
        {"oblique bottom", "LP", "AL", KpMat4f::identity(), {0, 0, -1}, {-half, half, 0}, {0, 0, -1}, {0, 1, 0}},
        {"tie in the view", "L", "PH", KpMat4f::identity(), {0, -half, half}, {0, -half, -half}, {0, 0, 1}, {0, -1, 0}},
        {"later letters weigh more",
         "F",
         "LPL",
         KpMat4f::identity(),
         {sine, -cosine, 0},
         {-cosine, -sine, 0},
         {0, -1, 0},
         {-1, 0, 0}},
        {"nothing left is negative",
         "L",
         "P",
         rows({0, 0, 0}, {0, 0, 0}, {0, 0, 0}),
         {0, 0, 0},
         {0, 0, 0},
         {0, 0, -1},
         {0, -1, 0}},
    };
    for (const auto& c : cases) {
        KpVec3f view, up;
        ASSERT_TRUE(Letters(c.right, c.bottom).getViewDirection(view, up, c.matrix, false)) << c.what;
        EXPECT_LT((view - c.view).length() + (up - c.up).length(), 1e-6F) << c.what << view << up;
        ASSERT_TRUE(Letters(c.right, c.bottom).getViewDirection(view, up, c.matrix, true)) << c.what;
        EXPECT_TRUE(view == c.snappedView && up == c.snappedUp) << c.what << view << up;
    }
    KpVec3f view(1, 2, 3), up = view;
    EXPECT_FALSE(Letters("L", "R").getViewDirection(view, up, KpMat4f::identity(), true));
    EXPECT_TRUE(view == KpVec3f(1, 2, 3) && up == view);
}
