// One of each value that gdb shows in a way of its own; see gdb in this folder.
#include <kplib/kplib.h>

int main()
{
    const KpString text("caf\xc3\xa9");
    const KpFilename path("/tmp/a.log");
    const KpDArray<KpVec3f> points{KpVec3f(1, 2, 3), KpVec3f(0.5f, 0, -1)};
    short voxels[] = {1, 2};
    const KpTypedPointer typed{voxels, KpPrimType::Short};
    const KpHandle<TmDataAccess> volume(
        new TmDataAccess({2, 1, 1}, {0, 0, 0}, voxels, KpPrimType::Short, 1, KpAllocator::AllocatorNone));
    HxParamBundle tree("Brain");
    const float spacing[] = {0.5f, 0.75f};
    tree.set("Spacing", 2, spacing);
    tree.bundle("Inner", 1)->set("Name", "left");
    tree.setFlag(HxParamBase::FlagHidden, 1);
    KpBitfield field(5, KpBitfield::INIT_UNSET);
    field.set(1);
    KpDMatrix<float> matrix(1, 2);
    matrix[0][0] = 7;
    matrix[0][1] = 8;
    const KpMat4f identity = KpMat4f::identity();
    TmMsg message;
    message << 258;
    const KpResult good, bad(KpResult::OutOfRange, 12, "x.cpp", "too far", "42");
    const KpTransferID transfer(11), none;
    const KpUUID uuid;
    const KpRotation rotation(0, 0, 0, 1);
    const KpDArray<KpString> names{"a"};
    return static_cast<int>(text.length() + path.length() + points.size() + names.size()) * 0;  // a breakpoint is here
}
