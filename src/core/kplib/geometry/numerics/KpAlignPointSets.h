#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

// Alignment of two lists of corresponding points: computes the matrix M that minimises the sum of
// the squared distances between p2 * M and p1, for points p1 of the first and p2 of the second
// list. Points are row vectors. All arithmetic is in single precision.
//
// `mode`: 0 is a rigid motion, 1 a rigid motion with a uniform scale, 2 an affine map. Any other
// mode computes no matrix: `result` keeps its value.
//
// `initial`: if not null, `result` is multiplied by it from the right at the end, in every mode.
// It may be the address of `result`; its value before the call is used.
//
// `n`: the number of pairs. The matrix is the identity if `n` is 0, if the weights of a list have
// the sum 0 exactly, or, for lists with weights, if `n` is negative.
//
// The rotation is proper for mirrored and flat sets too. If all points coincide, the scale is NaN.
//
// Errors: exhausted memory throws KpMemoryException and leaves `result` unchanged.
//
// Threads: safe from any thread.  Complexity: O(n), two or three passes over the lists, without a
// copy.
//
// Accuracy: sums are pairwise, so the number of pairs hardly affects the accuracy, but the
// distance of the points from the origin does. 1,000,000 pairs at 2000 units from the origin are
// aligned to 0.01 of a unit.

/// Pair i is points1[index1[i]] with points2[index2[i]].
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                                const int* index2, int n, int mode, const KpMat4f* initial = nullptr);

/// The same, with a weight for each point: element i of `weights` belongs to point i of either
/// list. Both centroids are divided by the sum of the weights of list 1. Intentional: the weights
/// of list 2 may have another sum.
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                                const int* index2, const float* weights, int n, int mode,
                                const KpMat4f* initial = nullptr);

/// The same, with weights of its own for each list; a pair counts with the product of its two.
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                                const int* index2, const float* weights1, const float* weights2, int n, int mode,
                                const KpMat4f* initial = nullptr);

/// Pair i is points1[i] with points2[i].
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, int n, int mode,
                                const KpMat4f* initial = nullptr);

/// The same, with weights[i] for pair i.
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const float* weights,
                                int n, int mode, const KpMat4f* initial = nullptr);

/// The same, with weights of its own for each list; a pair counts with the product of its two.
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const float* weights1,
                                const float* weights2, int n, int mode, const KpMat4f* initial = nullptr);

/// Sets `result` to the rigid motion that maps the rows of `a` + `centroidA` to those of `b` +
/// `centroidB`, with a uniform scale if requested. `a` and `b` are n by 3 matrices, each relative
/// to its own centroid. If the smallest singular value of transpose(a) * b is below 1e-5, the set
/// counts as flat. If the decomposition does not converge, that is logged and its values are used.
/// Kabsch, "A solution for the best rotation to relate two sets of vectors", Acta
/// Crystallographica A32, 1976; the scale is that of Umeyama, "Least-squares estimation of
/// transformation parameters between two point patterns", IEEE PAMI 13(4), 1991.
KPLIB_API void kpCompRigidTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                                    const KpVec3f& centroidB, KpMat4f& result, bool withScale);

/// Sets `result` to the affine map that does the same, by the normal equations. If the rows of `a`
/// lie in a plane, the equations are singular: that is logged, and the upper left of `result` is
/// transpose(a) * b.
KPLIB_API void kpCompAffineTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                                     const KpVec3f& centroidB, KpMat4f& result);
