#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

// Alignment of two lists of corresponding points: the matrix M that carries the second list onto the first, so that the
// sum of the squared distances between p2 * M and p1 is least. Points are row vectors and all arithmetic is in single
// precision.
//
// `mode`: 0 a rigid motion, 1 a rigid motion with a uniform scale, 2 any affine map; any other leaves `result`.
// `initial`, if given, is applied after what was found: `result` becomes result * initial at the end in any case. It
// may be the address of `result`, whose value at the call counts. `n`: count of pairs; with none (for lists with
// weights: or fewer), or with weights whose sum is exactly 0, the identity. Mirrored and flat sets give a proper
// rotation; the scale of points that are all one is not a number. Exhausted memory is a KpMemoryException, and `result`
// stays. O(n), in two or three walks over the lists without a copy. Safe from any thread.
//
// Accuracy: sums are pairwise, so that the number of pairs hardly matters; the distance of the points from the origin
// does. 1,000,000 pairs at 2000 units from the origin are aligned to 0.01 of a unit.

/// Pair i is points1[index1[i]] with points2[index2[i]].
KPLIB_API void kpAlignPointSets(KpMat4f& result, const KpVec3f* points1, const KpVec3f* points2, const int* index1,
                                const int* index2, int n, int mode, const KpMat4f* initial = nullptr);

/// The same, with a weight for each point, found by the point's own index in either list. Both centroids are divided by
/// the sum of the weights of list 1. Intentional: the sum of those of list 2 may differ.
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

/// The rigid motion that carries the rows of `a` + `centroidA` onto those of `b` + `centroidB`, with a uniform scale if
/// asked for. `a` and `b` are n by 3, each about its own centroid. A smallest singular value of transpose(a) * b below
/// 1e-5 counts as a flat set. One that doesn't converge is logged, and the result is used. Kabsch, "A solution for the
/// best rotation to relate two sets of vectors", Acta Crystallographica A32, 1976; the scale is that of Umeyama,
/// "Least-squares estimation of transformation parameters between two point patterns", IEEE PAMI 13(4), 1991.
KPLIB_API void kpCompRigidTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                                    const KpVec3f& centroidB, KpMat4f& result, bool withScale);

/// The affine map that does so, by the normal equations. Rows of `a` that lie in a plane make them singular: that is
/// logged, and the upper left is transpose(a) * b then.
KPLIB_API void kpCompAffineTransform(const KpDMatrix<float>& a, const KpDMatrix<float>& b, const KpVec3f& centroidA,
                                     const KpVec3f& centroidB, KpMat4f& result);
