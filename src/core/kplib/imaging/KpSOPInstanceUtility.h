#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <string>
#include <vector>

class HxParamBundle;

/// The list of SOP Instance UIDs (DICOM PS3.3) that a derived object was made from, as a bundle, mostly the sub-bundle
/// SOPInstanceUIDs of the object's parameters.
///
/// The bundle holds `NumInputImages`, the MD5 of all UIDs as `MD5Hash`, what all UIDs begin with as `Prefix` if that
/// isn't empty, and the rest of each as `Image00001`, `Image00002` ... in the order of the list. That order counts: it
/// survives a sorting by names up to 99,999 entries. Two objects have the same sources if their hashes are equal.
/// Failure is false or empty. Threads as with HxParamBundle.
class KPLIB_API KpSOPInstanceUtility {
public:
    /// An instance, or one frame of it, counted from 0; -1 is the instance as a whole.
    struct SopUIDAndFrame {
        std::string uid;  ///< SOP Instance UID
        int frame = -1;   ///< frame from 0, -1 for the instance

        /// Whether both are equal.
        bool operator==(const SopUIDAndFrame&) const = default;
    };

    KpSOPInstanceUtility() = delete;

    /// Replaces all that `bundle` holds by the list; an empty list leaves it empty. O(n).
    static void setSopUIDList(HxParamBundle* bundle, const KpDArray<KpString>& list);
    /// @{
    /// As above.
    static void setSopUIDList(HxParamBundle* bundle, const KpDArray<std::string>& list);
    /// @}

    /// Reads the list. False if there is none, if an image is out of its place, or if there are more or fewer than
    /// `NumInputImages`. The form with std::string appends to `list`, which has to be empty, and on failure leaves
    /// there what it has read; the other one changes `list` on success only. O(n).
    static bool sopUIDList(const HxParamBundle* bundle, KpDArray<std::string>& list);
    /// @{
    /// As above.
    static bool sopUIDList(const HxParamBundle* bundle, KpDArray<KpString>& list);
    /// @}

    /// The MD5 of all UIDs in their order, nothing between them, as 32 upper-case hexadecimal digits.
    static KpString sopUIDHash(const KpDArray<KpString>& list);
    /// @{
    /// As above.
    static KpString sopUIDHash(const KpDArray<std::string>& list);
    /// @}

    /// The hash that is stored, whether or not it fits the list; without one, that of the list. O(1) if stored.
    static KpString sopUIDHash(const HxParamBundle* bundle);
    /// Whether a hash is stored.
    static bool hasSopUIDHash(const HxParamBundle* bundle);

    /// Whether `hash` is the hash of the bundle.
    static bool checkSOPInstanceUID(const HxParamBundle* bundle, const char* hash);
    /// Whether the texts of the images are those of `list`. They are compared as they are stored,
    /// so the result is false for each list that has a prefix.
    static bool checkSOPInstanceUID(const HxParamBundle* bundle, const KpDArray<std::string>& list);

    /// The instances that `object` refers to in its SOPInstanceUIDs. If the object has frames (two
    /// or more), each entry stands for all of them with `expandFrames`; without, the number after
    /// its last point is its frame, and entries without one are left out. `ok`, if given, is set
    /// to whether there was a list. The order of the bundle counts. More than 2^20 entries are
    /// expanded only if (5200,9230) has an item for each frame: otherwise the number is taken for
    /// damaged, with an error in the log, an empty result and false in `ok`.
    static std::vector<SopUIDAndFrame> getReferencedSOPUIDsAndFrameNumbers(const HxParamBundle& object,
                                                                           bool expandFrames, bool* ok);
};
