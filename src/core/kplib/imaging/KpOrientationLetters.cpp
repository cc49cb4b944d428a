#include <kplib/imaging/KpOrientationLetters.h>

#include <kplib/geometry/KpMat4f.h>

#include <cmath>
#include <initializer_list>
#include <string_view>

namespace {

// Opposite letters have the same index; those of patient axis i are at 2 i and 2 i + 1, the
// positive one first.
constexpr std::string_view sAlphabet = "LRPAHF";
constexpr std::string_view sAlphabetInv = "RLAPFH";

KpVec3f absolute(const KpVec3f& v)
{
    return {std::abs(v.x()), std::abs(v.y()), std::abs(v.z())};
}

// Of equal ones the first.
int largestComponent(const KpVec3f& v)
{
    int largest = 0;
    for (int i = 1; i < 3; ++i) {
        if (v[i] > v[largest])
            largest = i;
    }
    return largest;
}

// Intentional: of equal ones the last, unlike above.
int lastLargestComponent(const KpVec3f& v)
{
    if (v.x() > v.y())
        return v.x() > v.z() ? 0 : 2;
    return v.y() > v.z() ? 1 : 2;
}

KpVec3f signedAxis(int axis, const KpVec3f& v)
{
    KpVec3f unit(0, 0, 0);
    unit[axis] = v[axis] > 0 ? 1.0F : -1.0F;
    return unit;
}

// Normalised after each letter but the first, so that later letters weigh more.
KpVec3f direction(const std::string& letters)
{
    KpVec3f sum = KpOrientationLetters::letterToDirection(letters[0]);
    for (std::size_t i = 1; i < letters.size(); ++i) {
        sum += KpOrientationLetters::letterToDirection(letters[i]);
        sum.normalize();
    }
    return sum;
}

KpMat4f numberOrIdentity(const KpMat4f& matrix)
{
    return matrix.isNumber() ? matrix : KpMat4f::identity();
}

}  // namespace

KpOrientationLetters::KpOrientationLetters(const std::string& rightLetters, const std::string& bottomLetters)
{
    if (!isValidOrientationString(rightLetters) || !isValidOrientationString(bottomLetters))
        return;
    right_ = rightLetters;
    bottom_ = bottomLetters;
    left_ = oppositeString(right_);
    top_ = oppositeString(bottom_);
}

KpOrientationLetters::KpOrientationLetters(const KpMat4f& matrix)
{
    const std::string xy = computeOrientationLettersXY(numberOrIdentity(matrix));
    *this = KpOrientationLetters(xy.substr(0, 1), xy.substr(1));
}

KpOrientationLetters::KpOrientationLetters(const KpMat4f& first, const KpMat4f& second, const KpMat4f& third)
{
    const std::string xy = computeOrientationLettersXY((second * third).inverse() * numberOrIdentity(first));
    *this = KpOrientationLetters(xy.substr(0, 1), oppositeString(xy.substr(1)));
}

bool KpOrientationLetters::isValid() const
{
    for (const std::string* edge : {&right_, &top_, &left_, &bottom_}) {
        if (!isValidOrientationString(*edge))
            return false;
    }
    return right_ != bottom_ && right_ != oppositeString(bottom_);
}

bool KpOrientationLetters::unusedLabel(char letter) const
{
    return right_.find(letter) == std::string::npos && bottom_.find(letter) == std::string::npos;
}

std::string KpOrientationLetters::join(char separator) const
{
    return right_ + separator + top_ + separator + left_ + separator + bottom_;
}

bool KpOrientationLetters::getViewDirection(KpVec3f& view, KpVec3f& up, const KpMat4f& matrix, bool snap) const
{
    if (!isValid())
        return false;
    const KpVec3f toBottom = direction(bottom_);
    view = matrix.multDirMatrix(direction(right_).cross(toBottom));
    up = matrix.multDirMatrix(-toBottom);
    if (snap) {
        const int viewAxis = lastLargestComponent(absolute(view));
        KpVec3f others = absolute(up);
        others[viewAxis] = -1;
        view = signedAxis(viewAxis, view);
        up = signedAxis(lastLargestComponent(others), up);
    }
    return true;
}

KpVec3f KpOrientationLetters::letterToDirection(char letter)
{
    KpVec3f direction(0, 0, 0);
    const std::size_t place = sAlphabet.find(letter);
    if (place != std::string_view::npos)
        direction[static_cast<int>(place / 2)] = place % 2 == 0 ? 1.0F : -1.0F;
    return direction;
}

bool KpOrientationLetters::isValidOrientationString(const std::string& letters)
{
    return !letters.empty() && letters.find_first_not_of(sAlphabet) == std::string::npos;
}

std::string KpOrientationLetters::oppositeString(const std::string& letters)
{
    std::string opposite = letters;
    for (char& letter : opposite) {
        const std::size_t place = sAlphabet.find(letter);
        if (place != std::string_view::npos)
            letter = sAlphabetInv[place];
    }
    return opposite;
}

std::string KpOrientationLetters::computeOrientationLettersXY(const KpMat4f& matrix)
{
    std::string letters;
    int taken = -1;
    for (const KpVec3f& axis : {KpVec3f(1, 0, 0), KpVec3f(0, 1, 0)}) {
        const KpVec3f image = matrix.multDirMatrix(axis);
        KpVec3f sizes = absolute(image);
        if (taken >= 0)
            sizes[taken] = 0;
        taken = largestComponent(sizes);
        const int letter = 2 * taken + (image[taken] < 0);
        letters += sAlphabet[static_cast<std::size_t>(letter)];
    }
    return letters;
}
