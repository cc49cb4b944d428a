#pragma once

#include <kplib/system/KpTable.h>
#include <kplib/system/detail/TableBytes.h>

// Calls `work` with a reference to each pointer to a row that a column holds, null or not: in the cells of its pool,
// or in each row.
template <typename Work>
void KpTable::forEachRowPointer(int column, Work work)
{
    const int offset = columnOffset_[column];
    if (columnType_[column] == Relation) {
        Pool& pool = *relationPool_[offset];
        for (long i = 0; i < pool.size(); i += 2)
            work(pool[i]);
    } else if (columnType_[column] == RowPointer) {
        for (long i = 0; i < rowsInBlock(); ++i) {
            char* target = pointer(row(i), offset);
            work(target);
            pointerSet(row(i), offset, target);
        }
    }
}
