#pragma once

#include "../volume/Volume.h"

#include <array>
#include <string>
#include <vector>

class DcmFileFormat;

/// What distinguishes images of a series that lie at one place, in the order in which a series is split by it.
enum class Trait : size_t {
    TemporalPosition,
    EchoNumber,
    EchoTime,
    InversionTime,
    BValue,
    Gradient,
    TriggerTime,
    Acquisition,
    ImageType,
    ContrastPhase,
    Dimensions,
    Count
};
const char* nameOf(Trait trait);

/// How a pixel is stored.
struct PixelFormat {
    int samples = 1, bitsAllocated = 0, bitsStored = 0, highBit = 0, isSigned = 0, isPlanar = 0;
    std::string photometric;

    bool isPalette() const { return photometric == "PALETTE COLOR"; }
    bool isColour() const { return samples == 3 || isPalette(); }
    bool operator==(const PixelFormat&) const = default;
};

/// One plane of pixels: a single-frame image, a frame, or a tile of a mosaic; with what its header says of it.
struct Image {
    std::string path;
    bool isMultiFrame = false;
    unsigned long frame = 0;         ///< in the file, from 0
    int tile = -1, tilesAcross = 1;  ///< number of the tile in a mosaic, row by row
    std::string instanceUid, seriesUid, seriesDescription, modality, frameUid, transferSyntax, stack, segment;
    std::array<std::string, static_cast<size_t>(Trait::Count)> traits;
    int rows = 0, columns = 0, number = 0;  ///< of this plane
    PixelFormat format;
    bool hasPlace = false;
    KpVec3d position{0, 0, 0}, rowAxis{1, 0, 0}, columnAxis{0, 1, 0};
    double rowSpacing = 1, columnSpacing = 1, thickness = 0, sliceSpacing = 0;  ///< mm; 0 if unknown
    std::string spacingProblem;  ///< why the spacing in the plane is not that of the patient; empty if it is
    double slope = 1, intercept = 0;
    Padding padding;
    std::string windowCenter, windowWidth, windowExplanation, windowFunction;
    bool hasModalityTable = false, hasWindowTable = false;
    std::string problem;  ///< why the plane cannot be read as part of a volume; empty if it can

    KpVec3d normal() const { return rowAxis.cross(columnAxis); }
    double place() const { return hasPlace ? position.dot(normal()) : number; }
    const std::string& trait(Trait t) const { return traits[static_cast<size_t>(t)]; }
    /// The file, and the frame if the file has several.
    std::string name() const;
};

/// The planes of a file, in its order.
std::vector<Image> describe(const std::string& path, DcmFileFormat& file);
