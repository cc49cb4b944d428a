#include <kplib/system/KpTable.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpDataBase.h>
#include <kplib/system/detail/TableBytes.h>
#include <kplib/system/detail/TableCheckSkipped.h>
#include <kplib/system/detail/TableWalk.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

using namespace kplib::detail;

namespace {

// The new address of a moved row, which expand() writes into the first bytes of its old place.
char* movedTo(const char* oldRow)
{
    return readAt<char*>(oldRow);
}

void follow(char*& row)
{
    if (row)
        row = movedTo(row);
}

}  // namespace

char* KpTable::pointer(const char* row, int offset)
{
    return readAt<char*>(row + offset);
}

void KpTable::pointerSet(char* row, int offset, char* target)
{
    writeAt(row + offset, target);
}

char* KpTable::rowAdd()
{
    if (rowSize_ < rowHeadSize) {
        getTheLogInstance().errorf("Table %d has no column for rows\n", tableId_);
        return nullptr;
    }
    rowReserve(1);
    char* added = nullptr;
    if (freeRows_.size() > 0) {
        added = freeRows_[freeRows_.size() - 1];
        freeRows_.resize(freeRows_.size() - 1);
    } else {
        added = rowData_ + rows_.size();
        rows_.resize(rows_.size() + rowSize_);
    }
    std::memset(added, 0, static_cast<std::size_t>(rowSize_));
    writeAt(added, rowInUse);
    writeAt(added + tableIdOffset, tableId_);
    return added;
}

bool KpTable::rowDel(char* row)
{
    if (!row || !checkRowPointer(row) || readAt<std::uint32_t>(row) != rowInUse)
        return false;
    freeRows_.reserveOne();
    for (int column = 0; column < columnCount_; ++column) {
        if (columnType_[column] == Relation)
            relationRemoveAll(row, columnOffset_[column]);
    }
    std::memset(row + rowHeadSize, 0, static_cast<std::size_t>(rowSize_ - rowHeadSize));
    writeAt(row, rowFree);
    freeRows_.append(row);
    return true;
}

char* KpTable::rowNext(char* row) const
{
    char* const end = rowData_ + rows_.size();
    for (char* next = row ? row + rowSize_ : rowData_; next != end; next += rowSize_) {
        if (readAt<std::uint32_t>(next) == rowInUse)
            return next;
    }
    return nullptr;
}

char* KpTable::rowFind(int columnId, const void* value, char* row) const
{
    if (!isColumnId(columnId) || indexById_[columnId] == -1)
        return nullptr;
    const auto size = static_cast<std::size_t>(columnSize_[indexById_[columnId]]);
    const int offset = offsetById_[columnId];
    do {
        row = rowNext(row);
    } while (row && std::memcmp(row + offset, value, size) != 0);
    return row;
}

long KpTable::rowReserve(int rows)
{
    const long room = (rows_.capacity() - rows_.size()) / rowSize_;
    const long missing = rows - freeRows_.size() - room;
    if (missing <= 0)
        return 0;
    const long present = capacityInRows();
    long wanted = present == 0 ? initialRows_ : present;
    while (wanted < present + missing)
        wanted *= 2;
    return expand(static_cast<int>(std::min<long>(wanted, INT_MAX)), 0);
}

long KpTable::expand(int rows, int extraRowBytes)
{
    if (extraRowBytes == 0 && capacityInRows() == rows)
        return 0;
    const CheckSkipped skipped(*this);
    const long used = rowsInBlock();
    const int newSize = rowSize_ + extraRowBytes;
    KpDArray<char> block;
    block.remax(std::max<long>(rows, used) * newSize, used * newSize);
    for (long i = 0; i < used; ++i) {
        char* const from = row(i);
        char* const to = block.data() + i * newSize;
        std::memcpy(to, from, static_cast<std::size_t>(rowSize_));
        std::memset(to + rowSize_, 0, static_cast<std::size_t>(extraRowBytes));
        writeAt(from, to);
    }
    rows_.swap(block);
    rowData_ = rows_.data();
    rowSize_ = newSize;
    relationsRepair();
    for (char*& free : freeRows_)
        follow(free);
    for (char** variable : externalRowPointers_)
        follow(*variable);
    return distance(block.data(), rowData_);
}

void KpTable::relationsRepair()
{
    if (!database_) {
        repairColumns(*this);
        return;
    }
    for (long i = database_->tables().size() - 1; i >= 0; --i)
        database_->tables()[i]->repairColumns(*this);
}

// Replaces all pointers of this table to rows of `moved` by the new addresses.
void KpTable::repairColumns(const KpTable& moved)
{
    for (int column = columnCount_ - 1; column >= 0; --column) {
        if (columnTable_[column] == &moved)
            forEachRowPointer(column, follow);
    }
}
