#include <kplib/volume/KpMorphology.h>

#include <kplib/cpu/ByteCount.h>
#include <kplib/volume/detail/MorphologyKernels.h>

#include <algorithm>
#include <cstdlib>
#include <initializer_list>
#include <memory>
#include <span>

using namespace kplib::detail;

namespace {

struct Operation {
    MorphologyReach reach;
    bool erodes;
    bool fast = true;
};

// At most LONG_MAX, for which no memory suffices.
unsigned long voxels(const KpVec3i& dims)
{
    if (*std::min_element(dims.begin(), dims.end()) <= 0)
        return 0;
    return static_cast<unsigned long>(byteCount({dims[0], dims[1], dims[2]}));
}

void byVoxel(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, long passes, const Operation& operation)
{
    KpBitfield other(passes > 1 ? dst.nBits() : 0, KpBitfield::INIT_UNSET);
    const KpBitfield* from = &src;
    for (long left = passes; left > 0;
         --left) {  // alternates so that the last pass writes dst, which keeps its spare bits
        KpBitfield& to = left % 2 != 0 ? dst : other;
        morphologyByVoxel(*from, to, dims, operation.reach, operation.erodes);
        from = &to;
    }
}

// False, and nothing is done, if there is no memory for the work area.
bool byWords(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, long passes, const Operation& operation)
{
    MorphologyJob job{src.data(), dst.data(), dims[0], dims[1], dims[2], passes, operation.reach, operation.erodes};
    job.passes = morphologyPassesAtOnce(job);
    const std::unique_ptr<void, KpFree> area(std::malloc(morphologyAreaBytes(job)));
    if (!area)
        return false;
    static MorphologyLoop* const run = best(morphologyPaths());
    for (long left = passes; left > 0; left -= job.passes, job.src = job.dst) {
        job.passes = std::min(job.passes, left);
        run(job, area.get());
    }
    return true;
}

// Resizes dst if necessary. Returns whether there are voxels.
bool prepare(KpBitfield& dst, unsigned long nBits)
{
    if (dst.nBits() != nBits)
        dst.resize(nBits, KpBitfield::INIT_UNSET);
    return nBits != 0;
}

// `alignedNeedsArea`: whether rows that begin at words need a work area too.
void morph(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, long passes, const Operation& operation,
           bool alignedNeedsArea)
{
    // After this number of passes one voxel has reached all others.
    passes = std::min(passes, 1L * dims[0] + dims[1] + dims[2]);
    if (operation.fast && byWords(src, dst, dims, passes, operation))
        return;
    const bool needsArea = operation.fast && dims[0] >= 32 && (alignedNeedsArea || dims[0] % 32 != 0);
    if (needsArea)
        dst.setAll();
    else
        byVoxel(src, dst, dims, passes, operation);
}

void in3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, long passes, const Operation& operation)
{
    if (!prepare(dst, voxels(dims)))
        return;
    if (passes < 1)
        dst = src;
    else
        morph(src, dst, dims, passes, operation, operation.reach != MorphologyReach::Faces);
}

void in2D(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims, const Operation& operation)
{
    const KpVec3i slice(dims[0], dims[1], 1);
    if (prepare(dst, voxels(slice)))
        morph(src, dst, slice, 1, operation, false);
}

}  // namespace

void KpMorphology::dilation3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                              bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Faces, false, fast});
}

void KpMorphology::dilation3D_18(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                                 bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Edges, false, fast});
}

void KpMorphology::dilation3D_26(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                                 bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Corners, false, fast});
}

void KpMorphology::erosion3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Faces, true, fast});
}

void KpMorphology::erosion3D_18(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Edges, true, fast});
}

void KpMorphology::erosion3D_26(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast)
{
    in3D(src, dst, dims, iterations, {MorphologyReach::Corners, true, fast});
}

void KpMorphology::dilation2D_4(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims)
{
    in2D(src, dst, dims, {MorphologyReach::Faces, false});
}

void KpMorphology::erosion2D_4(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims)
{
    in2D(src, dst, dims, {MorphologyReach::Faces, true});
}

void KpMorphology::dilation2D_8(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims)
{
    in2D(src, dst, dims, {MorphologyReach::Corners, false});
}

void KpMorphology::erosion2D_8(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims)
{
    in2D(src, dst, dims, {MorphologyReach::Corners, true});
}

bool KpMorphology::unitTest2D()
{
    struct Case {
        void (*run)(const KpBitfield&, KpBitfield&, const KpVec2i&);
        Operation operation;
    };
    static constexpr Case cases[] = {{dilation2D_4, {MorphologyReach::Faces, false}},
                                     {erosion2D_4, {MorphologyReach::Faces, true}},
                                     {dilation2D_8, {MorphologyReach::Corners, false}},
                                     {erosion2D_8, {MorphologyReach::Corners, true}}};
    bool isEqual = true;
    for (const int width : {32, 33, 63, 64, 70, 128, 181})
        for (const unsigned long period : {1UL, 2UL, 3UL, 31UL, 65UL, 1000UL}) {  // between the pixels that are set
            const KpVec2i dims(width, 11);
            const KpVec3i slice(width, 11, 1);
            KpBitfield src(voxels(slice), KpBitfield::INIT_UNSET), inverse, fast, plain(src);
            for (unsigned long i = period / 2; i < src.nBits(); i += period)
                src.set(i);
            inverse = src;
            inverse.toggleAll();
            for (const Case& one : cases)
                for (const KpBitfield* pattern : {&src, &inverse}) {
                    one.run(*pattern, fast, dims);
                    byVoxel(*pattern, plain, slice, 1, one.operation);
                    isEqual = isEqual && fast == plain;
                }
        }
    return isEqual;
}
