#include <kplib/net/TmMsg.h>

#include <kplib/cpu/ByteCount.h>
#include <kplib/rawdata/TmDataAccess.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <memory>

using namespace kplib::detail;

namespace {

// Appends uninitialised bytes, and returns where they begin.
unsigned char* append(TmMsg& msg, long bytes)
{
    const auto at = static_cast<long>(msg.size());
    msg.resize(bytes > LONG_MAX - at ? LONG_MAX : at + bytes);
    return msg.dataPtr() + at;
}

void writeVoxels(TmMsg& msg, const TmDataAccess& object)
{
    const long bytes = object.size();
    if (bytes <= 0)
        return;
    const auto at = static_cast<long>(msg.size());
    unsigned char* const voxels = append(msg, bytes);
    if (!object.hasData()) {
        std::memset(voxels, 0, static_cast<unsigned long>(bytes));
        return;
    }
    msg.resize(at);  // the storage stays, so that no run allocates more
    object.eachVoxelRun([&](const void* run, unsigned long n) { msg.writeRawBytes(n, run); });
}

// The bytes of so many voxels; -1 if there can be no such volume.
long voxelBytes(const KpVec3l& dims, int nDataVar, KpPrimType type)
{
    const bool isNegative = std::min({dims[0], dims[1], dims[2], std::int64_t{nDataVar}}) < 0;
    return isNegative ? -1 : byteCount({dims[0], dims[1], dims[2], nDataVar, type.size()});
}

}  // namespace

TmMsg& operator<<(TmMsg& msg, TmDataAccess const* const& object)
{
    msg << (object == nullptr);
    if (object) {
        msg << object->dims() << object->nDataVar() << object->primType();
        writeVoxels(msg, *object);
    }
    return msg;
}

TmMsg& operator>>(TmMsg& msg, TmDataAccess*& object)
{
    object = nullptr;
    bool isNull = false;
    msg >> isNull;
    KpVec3l dims;
    int nDataVar = 0;
    KpPrimType type;
    if (isNull)
        return msg;
    msg >> dims >> nDataVar >> type;
    const long bytes = voxelBytes(dims, nDataVar, type);
    void* voxels = nullptr;
    if (bytes >= 0)
        msg.readRawBytes(static_cast<unsigned long>(bytes), voxels);
    if (!voxels)  // nor has a message that ended in the sizes
        return msg;
    auto result = std::make_unique<TmDataAccess>(dims, type, nDataVar, KpAllocator::AllocatorMalloc);
    if (result->hasData() && bytes > 0)
        std::memcpy(result->dataPtr(0), voxels, static_cast<unsigned long>(bytes));
    object = result.release();
    return msg;
}
