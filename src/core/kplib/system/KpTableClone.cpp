#include <kplib/system/KpTable.h>

#include <kplib/system/KpDataBase.h>
#include <kplib/system/detail/TableBytes.h>
#include <kplib/system/detail/TableWalk.h>

#include <algorithm>

using namespace kplib::detail;

namespace {

// Copies the elements into storage of the same capacity.
template <typename T>
void copyWithCapacity(const KpDArray<T>& from, KpDArray<T>& to)
{
    to.remax(from.capacity(), from.size());
    std::copy_n(from.data(), from.size(), to.data());
}

}  // namespace

void KpTable::clone(KpTable& target) const
{
    target.tableId_ = tableId_;
    target.name_ = name_;
    target.columnCount_ = columnCount_;
    std::copy_n(columnType_, maxColumns, target.columnType_);
    std::copy_n(columnSize_, maxColumns, target.columnSize_);
    std::copy_n(columnOffset_, maxColumns, target.columnOffset_);
    std::copy_n(columnTable_, maxColumns, target.columnTable_);
    target.initialRows_ = initialRows_;
    target.rowSize_ = rowSize_;
    std::copy_n(indexById_, maxColumns, target.indexById_);
    std::copy_n(offsetById_, maxColumns, target.offsetById_);
    copyWithCapacity(rows_, target.rows_);
    target.rowData_ = target.rows_.data();
    copyWithCapacity(freeRows_, target.freeRows_);
    for (char*& free : target.freeRows_)
        free = shifted(free, distance(rowData_, target.rowData_));
    for (int offset = 0; offset < maxRelationOffset; ++offset) {
        target.dropPool(offset);
        if (relationPool_[offset])
            clonePool(target, offset);
    }
}

void KpTable::clonePool(KpTable& target, int offset) const
{
    target.addPool(offset);
    Pool& pool = *target.relationPool_[offset];
    copyWithCapacity(*relationPool_[offset], pool);
    std::fill(pool.end(), pool.data() + pool.capacity(), nullptr);
    target.relationPoolData_[offset] = pool.data();
    copyWithCapacity(*relationFree_[offset], *target.relationFree_[offset]);
    target.shiftCells(offset, distance(relationPool_[offset]->data(), pool.data()));
}
