#include <kplib/system/KpMD5List.h>

#include <kplib/system/KpCoder.h>

namespace KpLib {

void MD5List::insert(const MD5& digest)
{
    cachedHash_ = MD5();
    if (sorted_)
        items_.insertSorted(digest, MD5::compare);
    else
        items_.append(digest);
}

MD5 MD5List::hash() const
{
    if (cachedHash_.isNull()) {
        KpCoder coder;
        for (long i = items_.size() - 1; i >= 0; --i)
            coder.crcMD5Update(items_[i].data(), sizeof(MD5));
        coder.crcMD5Final();
        coder.crcMD5Query(cachedHash_.data());
    }
    return cachedHash_;
}

}  // namespace KpLib
