#include <kplib/rawdata/TmDataAccess.h>

#include <kplib/cpu/ByteCount.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/system/KpMD5Coder.h>
#include <kplib/threads/KpThread.h>

#include <algorithm>
#include <cstring>

using namespace kplib::detail;

TmDataAccess::TmDataAccess(const KpVec3l& dims, KpPrimType type, int nDataVar, KpAllocator allocator) :
    dims_(dims), primType_(type), nDataVar_(nDataVar), allocator_(allocator)
{
    dataPtrs_.append(nullptr);  // its place first, so that nothing can fail once the block is there
    dataPtrs_[0] = allocator_.allocate(static_cast<unsigned long>(size()));
    if (!dataPtrs_[0])
        dataPtrs_.clear();
    fixStrides();
}

TmDataAccess::TmDataAccess(const KpVec3l& dims, const KpVec3l& strides, void* data, KpPrimType type, int nDataVar,
                           KpAllocator allocator) :
    dims_(dims),
    primType_(type), nDataVar_(nDataVar), allocator_(allocator), strides_(strides)
{
    if (data)
        dataPtrs_.append(data);
    fixStrides();
}

TmDataAccess::TmDataAccess(const KpVec3l& dims, const KpVec3l& strides, void* const* data, KpPrimType type,
                           int nDataVar, KpAllocator allocator) :
    dims_(dims),
    primType_(type), nDataVar_(nDataVar), allocator_(allocator), strides_(strides)
{
    if (data)
        dataPtrs_.insert(0, dims[2], data);
    fixStrides();
}

TmDataAccess::~TmDataAccess()
{
    if (deleteCallback_)
        deleteCallback_(this, deleteCallbackData_);
    dataRelease();
}

void TmDataAccess::dataRelease()
{
    for (void* const block : dataPtrs_)
        allocator_.deallocate(block);
    dataPtrs_.clear();
}

void TmDataAccess::setDeleteCallback(DeleteCallback callback, void* data)
{
    deleteCallback_ = callback;
    deleteCallbackData_ = data;
}

long TmDataAccess::size() const
{
    return byteCount({dims_[0], dims_[1], dims_[2], nDataVar_, primType_.size()});
}

bool TmDataAccess::isValid() const
{
    return std::min({dims_[0], dims_[1], dims_[2]}) >= 0 && strides_[0] >= byteCount({nDataVar_, primType_.size()}) &&
           strides_[1] >= byteCount({dims_[0], strides_[0]}) &&
           (strides_[2] == 0 || strides_[2] >= byteCount({dims_[1], strides_[1]})) &&
           (dataPtrs_.size() < 2 || strides_[2] < 1);
}

bool TmDataAccess::isContiguous() const
{
    return strides_[0] == byteCount({nDataVar_, primType_.size()}) &&
           strides_[1] == byteCount({strides_[0], dims_[0]}) && strides_[2] == byteCount({strides_[1], dims_[1]});
}

// A stride of 0 is to be worked out.
void TmDataAccess::fixStrides()
{
    if (strides_[0] == 0)
        strides_[0] = byteCount({nDataVar_, primType_.size()});
    if (strides_[1] == 0)
        strides_[1] = byteCount({strides_[0], dims_[0]});
    if (strides_[2] == 0 && dataPtrs_.size() < 2)
        strides_[2] = byteCount({strides_[1], dims_[1]});
}

void TmDataAccess::subBox(KpHandle<TmDataAccess>& out, const KpBox3i& box) const
{
    KpHandle<TmDataAccess> view;
    const KpVec3l min(box.min()), dims = KpVec3l(box.max()) + KpVec3l(1L, 1L, 1L) - min;
    if (hasData() && isLinear()) {
        view = new TmDataAccess(dims, strides_, dataPtr(min[0], min[1], min[2]), primType_, nDataVar_,
                                KpAllocator::AllocatorNone);
    } else if (hasData()) {
        KpDArray<void*> slices;
        for (long z = 0; z < dims[2]; ++z)
            slices.append(dataPtr(min[0], min[1], min[2] + z));
        view = new TmDataAccess(dims, strides_, slices.data(), primType_, nDataVar_, KpAllocator::AllocatorNone);
    }
    out = view;  // at the end: it may hold this object
}

KpResult TmDataAccess::clone(KpHandle<TmDataAccess>& out, KpAllocator /*allocator*/) const
{
    KpHandle<TmDataAccess> copy;
    KpResult result;
    if (!isContiguous()) {
        result = KpResult(KpResult::Failed, __LINE__, __FILE__, "clone() needs contiguous data", nullptr);
    } else {
        copy = new TmDataAccess(dims_, primType_, nDataVar_, KpAllocator::AllocatorMalloc);
        const long bytes = size();
        if (bytes != 0 && !copy->hasData())
            result = KpResult(KpResult::Failed, __LINE__, __FILE__, "no memory for a clone()", nullptr);
        else if (bytes != 0 && hasData())
            std::memcpy(copy->dataPtr(0), dataPtr(0), static_cast<unsigned long>(bytes));
    }
    out = copy;  // at the end: it may hold this object
    return result;
}

Kp128 TmDataAccess::hash() const
{
    KpLib::MD5Coder coder;
    coder << static_cast<int>(primType_) << nDataVar_ << dims_;
    eachVoxelRun([&](const void* bytes, unsigned long n) { coder.append(bytes, n); });
    const KpLib::MD5::Words words = coder.md5().words();
    return {words[0], words[1]};
}

void TmDataAccess::moveToCurrentThread()
{
    setLockerThreadId(tmCurrentThreadId());
}
