#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <string>

class KpMat4f;

/// The letters at the four edges of a view, each the patient direction that lies there: L is +x, R -x, P +y, A -y,
/// H +z, F -z of the DICOM patient frame. An oblique edge has several letters.
///
/// A plain value. Bad input gives four empty strings, which are not isValid(); nothing raises an error.
class KPLIB_API KpOrientationLetters {
public:
    /// Four empty strings.
    KpOrientationLetters() = default;
    /// Sets the two given edges, and the two other edges to their opposites. All stay empty unless
    /// both strings are isValidOrientationString().
    KpOrientationLetters(const std::string& rightLetters, const std::string& bottomLetters);
    /// One letter an edge, from the matrix of an image whose rows grow downward: image x points right, y to the bottom.
    /// A matrix that holds a NaN counts as the identity.
    explicit KpOrientationLetters(const KpMat4f& matrix);
    /// One letter an edge, from inverse(second * third) * first, where a `first` that holds a NaN counts as the
    /// identity. Other than with one matrix, y points to the top.
    KpOrientationLetters(const KpMat4f& first, const KpMat4f& second, const KpMat4f& third);

    /// @{
    /// The letters at that edge.
    const std::string& right() const { return right_; }
    const std::string& top() const { return top_; }
    const std::string& left() const { return left_; }
    const std::string& bottom() const { return bottom_; }
    /// @}

    /// Whether all four strings are valid and the right and the bottom edge do not name the same
    /// axis as a whole: L and R do, LP and A do not.
    bool isValid() const;
    /// Whether `letter` is neither at the right nor at the bottom.
    bool unusedLabel(char letter) const;
    // Whether the view shows one kind of slice. Without letters it shows every kind.
    /// @{
    /// Whether the letters allow that kind of slice.
    bool isAxial() const { return unusedLabel('F') && unusedLabel('H'); }
    bool isCoronal() const { return unusedLabel('A') && unusedLabel('P'); }
    bool isSagittal() const { return unusedLabel('R') && unusedLabel('L'); }
    /// @}

    /// Right, top, left and bottom, with `separator` between them.
    std::string join(char separator) const;

    /// The directions of view and of up, transformed by `matrix` as directions are; with `snap` the signed unit axes
    /// nearest to them, different ones for the two. Of several letters at an edge the later weigh more. False, and
    /// nothing written, if this is not isValid().
    bool getViewDirection(KpVec3f& view, KpVec3f& up, const KpMat4f& matrix, bool snap) const;

    /// Whether all four strings are equal.
    friend bool operator==(const KpOrientationLetters& a, const KpOrientationLetters& b) = default;

    /// The direction of a letter, or zero for any other character. Lower case is not accepted.
    static KpVec3f letterToDirection(char letter);
    /// Whether the text is one or more letters of the alphabet and nothing else.
    static bool isValidOrientationString(const std::string& letters);
    /// The opposite of each letter. Other characters stay unchanged.
    static std::string oppositeString(const std::string& letters);
    /// The letters nearest to where `matrix` takes the x axis and the y axis, never of one patient axis unless the
    /// matrix is singular.
    static std::string computeOrientationLettersXY(const KpMat4f& matrix);

private:
    std::string right_, top_, left_, bottom_;
};
