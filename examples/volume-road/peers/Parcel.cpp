#include "Parcel.h"

#include <kplib/foundation/KpHandle.h>
#include <kplib/param/HxParameter.h>
#include <kplib/rawdata/TmDataAccess.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <iterator>
#include <memory>
#include <vector>

namespace {

constexpr int mark = 0x32'50'4b'56;  // "VKP2" in the message
constexpr int deepestTree = 64;

TmMsg& operator<<(TmMsg& msg, const KpVec3d& v)
{
    return msg << v[0] << v[1] << v[2];
}

TmMsg& operator>>(TmMsg& msg, KpVec3d& v)
{
    return msg >> v[0] >> v[1] >> v[2];
}

/// The volume as the library's descriptor of voxels in memory, a view.
KpHandle<TmDataAccess> accessTo(Volume& volume)
{
    const KpVec3l dims(volume.dims[0], volume.dims[1], volume.dims[2]);
    return new TmDataAccess(dims, KpVec3l(0L, 0L, 0L), static_cast<void*>(volume.bytes.data()), volume.type,
                            volume.components, KpAllocator::AllocatorNone);
}

void writeParameter(TmMsg& msg, const HxParameter& parameter)
{
    msg << parameter.primType() << parameter.dimension();
    if (parameter.primType() == KpPrimType::String) {
        msg << static_cast<const char*>(parameter.value());
    } else {
        const auto bytes =
            static_cast<unsigned long>(parameter.dimension()) * static_cast<unsigned long>(parameter.primType().size());
        msg.writeRawBytes(bytes, parameter.value());
    }
}

std::unique_ptr<HxParameter> readParameter(TmMsg& msg, const char* name)
{
    KpPrimType type;
    int count = 0;
    msg >> type >> count;
    if (!type.isValid() || count < 0)
        return nullptr;
    if (type == KpPrimType::String) {
        char* text = nullptr;
        msg >> text;
        return std::make_unique<HxParameter>(name, 1, type, text);
    }
    void* values = nullptr;
    msg.readRawBytes(static_cast<unsigned long>(count) * static_cast<unsigned long>(type.size()), values);
    return values ? std::make_unique<HxParameter>(name, count, type, values) : nullptr;
}

bool readChildren(TmMsg& msg, HxParamBundle& bundle, int depth)
{
    int count = 0;
    msg >> count;
    for (int i = 0; i < count; ++i) {
        bool isBundle = false;
        KpString name;
        if (!msg.holds(1))
            return false;
        msg >> isBundle >> name;
        if (isBundle) {
            auto child = std::make_unique<HxParamBundle>(name.c_str());
            if (depth == 0 || !readChildren(msg, *child, depth - 1))
                return false;
            bundle.insert(child.release(), 0);
        } else {
            auto child = readParameter(msg, name);
            if (!child)
                return false;
            bundle.insert(child.release(), 0);
        }
    }
    return count >= 0;
}

/// Whether the library works on such elements.
bool isVoxelType(KpPrimType type)
{
    constexpr KpPrimType::Type types[] = {KpPrimType::Byte, KpPrimType::Short, KpPrimType::UShort,
                                          KpPrimType::Int,  KpPrimType::Float, KpPrimType::Double};
    return std::find(std::begin(types), std::end(types), type) != std::end(types);
}

/// Whether a described volume can be one.
bool isSound(const Volume& volume)
{
    const auto& [x, y, step] = volume.axes;
    for (size_t z = 0; z < volume.heights.size(); ++z) {
        const double gap = z == 0 ? 0 : volume.heights[z] - volume.heights[z - 1];
        if (z == 0 ? volume.heights[0] != 0 : !isLength(gap))
            return false;
    }
    const bool isColour = volume.components == 3 && volume.type == KpPrimType::Byte;
    return isPlace(volume.origin, x, y) && step.dot(x.cross(y)) > 1e-3 && std::abs(step.length() - 1) < 0.1 &&
           std::isfinite(volume.slope) && volume.slope != 0 && std::isfinite(volume.intercept) &&
           isVoxelType(volume.type) && (volume.components == 1 || isColour);
}

void writeWindow(TmMsg& msg, const Window& window)
{
    msg << window.center << window.width << static_cast<int>(window.function) << window.isInverted;
}

bool readWindow(TmMsg& msg, Window& window)
{
    int function = 0;
    msg >> window.center >> window.width >> function >> window.isInverted;
    window.function = static_cast<Window::Function>(function);
    window.origin = "from the peer";
    return function >= Window::Linear && function <= Window::Sigmoid;
}

void writeRegion(TmMsg& msg, const Region& region)
{
    msg << region.threshold << region.isThresholdGiven << region.components
        << static_cast<unsigned long long>(region.voxels) << region.millilitres << region.center << region.box
        << region.outline;
}

void readRegion(TmMsg& msg, Region& region)
{
    unsigned long long voxels = 0;
    msg >> region.threshold >> region.isThresholdGiven >> region.components >> voxels >> region.millilitres >>
        region.center >> region.box >> region.outline;
    region.voxels = voxels;
}

/// The voxels into the volume that readGeometry() has described.
bool readVoxels(TmMsg& msg, Volume& volume)
{
    TmDataAccess* received = nullptr;
    msg >> received;
    const KpHandle<TmDataAccess> voxels(received);
    const KpVec3l dims(volume.dims[0], volume.dims[1], volume.dims[2]);
    if (!voxels || !voxels->hasData() || !(voxels->dims() == dims) || voxels->primType() != volume.type ||
        voxels->nDataVar() != volume.components)
        return false;
    volume.allocate();
    std::memcpy(volume.bytes.data(), voxels->dataPtr(0), static_cast<size_t>(voxels->size()));
    return true;
}

}  // namespace

void writeGeometry(TmMsg& msg, const Volume& volume)
{
    msg << KpVec3l(volume.dims[0], volume.dims[1], volume.dims[2]) << volume.components << volume.type << volume.spacing
        << volume.origin;
    for (const KpVec3d& axis : volume.axes)
        msg << axis;
    msg << static_cast<int>(volume.heights.size());
    for (const double height : volume.heights)
        msg << height;
    msg << volume.isPlaced << volume.isPlaneScaled << volume.isScaled << volume.slope << volume.intercept
        << volume.padding.low << volume.padding.high;
}

bool readGeometry(TmMsg& msg, Volume& volume)
{
    KpVec3l dims;
    int heights = 0;
    msg >> dims >> volume.components >> volume.type >> volume.spacing >> volume.origin;
    for (KpVec3d& axis : volume.axes)
        msg >> axis;
    msg >> heights;
    constexpr long longest = 1L << 16;
    for (int i = 0; i < 3; ++i) {
        volume.dims[static_cast<size_t>(i)] = dims[i];
        if (dims[i] < 1 || dims[i] > longest || !isLength(volume.spacing[i]))
            return false;
    }
    if (heights != 0 && heights != dims[2])
        return false;
    volume.heights.resize(static_cast<size_t>(heights));
    for (double& height : volume.heights)
        msg >> height;
    msg >> volume.isPlaced >> volume.isPlaneScaled >> volume.isScaled >> volume.slope >> volume.intercept >>
        volume.padding.low >> volume.padding.high;
    return isSound(volume);
}

void writeTree(TmMsg& msg, const HxParamBundle& bundle)
{
    msg << static_cast<int>(bundle.size());
    for (const HxParamBase* child : bundle) {
        msg << child->isBundle() << KpString(child->name());
        if (child->isBundle())
            writeTree(msg, *static_cast<const HxParamBundle*>(child));
        else
            writeParameter(msg, *static_cast<const HxParameter*>(child));
    }
}

bool readTree(TmMsg& msg, HxParamBundle& bundle)
{
    return readChildren(msg, bundle, deepestTree);
}

Kp128 contentHash(Volume& volume)
{
    return accessTo(volume)->hash();
}

std::string hexadecimal(const Kp128& hash)
{
    const KpString text(0, "%016lx%016lx", __builtin_bswap64(hash.first), __builtin_bswap64(hash.second));
    return text.c_str();
}

void writeParcel(TmMsg& msg, Parcel& parcel)
{
    const KpHandle<TmDataAccess> voxels = accessTo(parcel.volume);
    const Kp128 hash = voxels->hash();
    msg << mark << parcel.frameUid;
    writeTree(msg, parcel.root);
    writeGeometry(msg, parcel.volume);
    writeWindow(msg, parcel.window);
    writeRegion(msg, parcel.region);
    msg << static_cast<unsigned long long>(hash.first) << static_cast<unsigned long long>(hash.second)
        << static_cast<const TmDataAccess*>(voxels.get());
}

KpResult readParcel(TmMsg& msg, Parcel& parcel)
{
    int found = 0;
    msg >> found;
    if (found != mark)
        return badInput("what the peer sends is no volume");
    msg >> parcel.frameUid;
    bool isWhole = readTree(msg, parcel.root) && readGeometry(msg, parcel.volume);
    isWhole = readWindow(msg, parcel.window) && isWhole;
    unsigned long long first = 0, second = 0;
    if (isWhole) {
        readRegion(msg, parcel.region);
        msg >> first >> second;
        isWhole = readVoxels(msg, parcel.volume) && msg.readOffset() == msg.size() &&
                  parcel.region.outline.nBits() == static_cast<unsigned long>(parcel.volume.count());
    }
    if (!isWhole)
        return badInput("the peer's message is cut off or damaged");
    if (contentHash(parcel.volume) != Kp128{first, second})
        return badInput("the voxels aren't those that were sent: their digests differ");
    return KpResult();
}
