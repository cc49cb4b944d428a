// Window presets, orientation letters and identifiers from any text.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/imaging/KpOrientationLetters.h>
#include <kplib/imaging/KpWindowLevel.h>

namespace {

void presets(Input& input)
{
    KpWindowLevelTagGroup group;
    group.center = input.line();
    group.width = input.line();
    group.explanation = input.line();
    const auto list = KpWindowLevel::createFromTags(group);
    const auto again = KpWindowLevel::createFromTags(KpWindowLevel::toTags(list));
    check(again.size() == list.size());
    for (std::size_t i = 0; i < list.size(); ++i)
        check(again[i].centerString() == list[i].centerString() && again[i].widthString() == list[i].widthString());
    check(KpWindowLevel::merge(list, list).size() <= 2 * list.size());
}

void letters(Input& input)
{
    const std::string right = input.line(), bottom = input.line();
    const KpOrientationLetters given(right, bottom);
    KpVec3f view, up;
    const bool isSeen = given.getViewDirection(view, up, KpMat4f::identity(), true);
    check(isSeen == given.isValid());
    check(KpOrientationLetters::oppositeString(KpOrientationLetters::oppositeString(right)) == right);
    KpMat4f matrix;
    for (int i = 0; i < 16; ++i)
        matrix[i / 4][i % 4] = input.number<float>();
    const KpOrientationLetters made(matrix);
    check(made.right().size() == 1 && made.join('/').size() == 7);
    made.getViewDirection(view, up, matrix, false);
}

void identifiers(const std::string& root)
{
    KpCreateUIDs uids;
    check(uids.setRootUID(root.c_str()) == (root.c_str()[0] != '\0'));
    KpString a, b;
    check(uids.createUID(KpCreateUIDs::UIDtype1, a) && uids.createUID(KpCreateUIDs::UIDtype1, b) && !(a == b));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    Input input(data, size);
    presets(input);
    identifiers(input.line());
    letters(input);
    return 0;
}
