#include <kplib/system/KpTable.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpDataBase.h>
#include <kplib/system/detail/TableBytes.h>
#include <kplib/system/detail/TableCheckSkipped.h>

#include <algorithm>
#include <climits>

using namespace kplib::detail;

// Plan
//
// The rows of a table lie in one block, the cells of each relation column in a pool:
//
//     rows_    | state | table id | client bytes | row pointer | first, last | ...   row 0
//              | ...                                    |          |     |           row 1
//                                                       |          |     '------------.
//                  a row of columnTable_[i] <-----------'          v                  v
//     relationPool_[offset of the column]                  | target, next | free | target, next |
//                                                               |     |               ^
//                  a row of columnTable_[i] <-------------------'     '---------------'
//
// freeRows_ lists the rows to reuse, relationFree_[offset] the cells to reuse. Of a free row all
// bytes after the head are 0, and a free cell holds two null pointers: so repairs visit all rows
// and cells without asking which are in use.
//
// All pointers are addresses, so a move repairs them:
//
//  - Rows: expand() copies each row and writes its new address over the first bytes of its old
//    place. Each pointer to an old row is then replaced by the address found there: in the columns
//    of all tables of the database, in freeRows_ and in the client's externalRowPointers_.
//  - Cells: a pool moves as a whole, so the pointers to its cells change by the same distance.
//
// While rows and pointers disagree, CheckSkipped makes check() return true.

namespace {

constexpr int pointerSize = 8, relationSize = 16, idColumnSize = 4;

int sizeOf(KpTable::ColumnType type, int size)
{
    return type == KpTable::Plain ? size : type == KpTable::RowPointer ? pointerSize : relationSize;
}

}  // namespace

KpTable::KpTable(int id, KpDataBase* database) : database_(database), tableId_(id)
{
    std::fill_n(indexById_, maxColumns, -1);
    std::fill_n(offsetById_, maxColumns, -1);
    columnAdd(0, Plain, idColumnSize, nullptr);
}

KpTable::~KpTable()
{
    for (int offset = 0; offset < maxRelationOffset; ++offset)
        dropPool(offset);
}

int KpTable::columnAdd(int columnId, ColumnType type, int size, KpTable* target)
{
    const CheckSkipped skipped(*this);
    if (isColumnId(columnId) && indexById_[columnId] != -1)
        return indexById_[columnId];
    if (!canAdd(columnId, type, size, target)) {
        getTheLogInstance().errorf("Table %d has no place for column %d\n", tableId_, columnId);
        return -1;
    }
    const int index = columnCount_;
    const int offset = index == 0 ? 0 : columnOffset_[index - 1] + columnSize_[index - 1];
    const int bytes = sizeOf(type, size);
    try {
        if (type == Relation)
            addPool(offset);
        if (rowSize_ != 0 && rows_.capacity() > 0)
            expand(static_cast<int>(capacityInRows()), bytes);
        else
            rowSize_ += bytes;
    } catch (...) {
        if (type == Relation)
            dropPool(offset);  // without its column it would make clone() shift the bytes of another one
        throw;
    }
    columnType_[index] = type;
    columnSize_[index] = bytes;
    columnOffset_[index] = offset;
    columnTable_[index] = type == Plain ? nullptr : target;
    indexById_[columnId] = index;
    offsetById_[columnId] = offset;
    ++columnCount_;
    return index;
}

bool KpTable::canAdd(int columnId, ColumnType type, int size, const KpTable* target) const
{
    if (!isColumnId(columnId))
        return false;  // the ids also limit the number of columns
    if (columnCount_ == 1 && (type != Plain || size < rowHeadSize - idColumnSize))
        return false;  // the column has to hold the table's id
    if (sizeOf(type, size) > INT_MAX - rowSize_)
        return false;
    if (type == Plain)
        return size > 0;
    return target && (type == RowPointer || (type == Relation && rowSize_ < maxRelationOffset));
}

// Creates the pool of a relation column, with room for initialRows_ cells and none in use.
void KpTable::addPool(int offset)
{
    dropPool(offset);
    relationFree_[offset] = new FreeCells;
    relationPool_[offset] = new Pool;
    Pool& pool = *relationPool_[offset];
    pool.remax(initialRows_ * 2L, 0);
    std::fill_n(pool.data(), pool.capacity(), nullptr);
    relationPoolData_[offset] = pool.data();
}

void KpTable::dropPool(int offset)
{
    delete relationPool_[offset];
    delete relationFree_[offset];
    relationPool_[offset] = nullptr;
    relationPoolData_[offset] = nullptr;
    relationFree_[offset] = nullptr;
}

void KpTable::clear()
{
    rows_.clear();
    freeRows_.clear();
    for (int offset = 0; offset < maxRelationOffset; ++offset) {
        if (Pool* const pool = relationPool_[offset]) {
            std::fill_n(pool->data(), pool->capacity(), nullptr);
            pool->clear();
            relationFree_[offset]->clear();
        }
    }
}

int KpTable::changeRelationLock(int offset, int by)
{
    const auto index = static_cast<int>(std::find(columnOffset_, columnOffset_ + columnCount_, offset) - columnOffset_);
    if (index == columnCount_) {
        ++skipCheck_;  // intentional: for either `by`
        return -1;
    }
    relationLocks_[index] += by;
    return index;
}

bool KpTable::checkRowPointer(const char* row) const
{
    if (!row)
        return true;
    const std::intptr_t at = distance(rowData_, row);
    return rowData_ && at >= 0 && at < rows_.size() && at % rowSize_ == 0;
}

bool KpTable::check() const
{
    if (skipCheck_ > 0 || (database_ && database_->isCheckSkipped()))
        return true;
    if (rowData_ != rows_.data() || rows_.size() % rowSize_ != 0)
        return false;
    for (const char* free : freeRows_) {
        if (!free || distance(rowData_, free) < 0 || distance(rowData_, free) >= rows_.size())
            return false;
    }
    for (long i = 0; i < rowsInBlock(); ++i) {
        if (!isRowSound(row(i)))
            return false;
    }
    return true;
}

bool KpTable::isRowSound(const char* row) const
{
    const auto state = readAt<std::uint32_t>(row);
    if (state == rowFree)
        return true;
    if (state != rowInUse || rowSize_ < rowHeadSize || readAt<int>(row + tableIdOffset) != tableId_)
        return false;
    for (int column = 0; column < columnCount_; ++column) {
        const KpTable* const target = columnTable_[column];
        if (columnType_[column] == Relation && !isRelationSound(row, column))
            return false;
        if (columnType_[column] == RowPointer) {
            const char* const to = pointer(row, columnOffset_[column]);
            if (to && (!target->checkRowPointer(to) || readAt<int>(to + tableIdOffset) != target->tableId_))
                return false;
        }
    }
    return true;
}

bool KpTable::isRelationSound(const char* row, int column) const
{
    const int offset = columnOffset_[column];
    const Pool& pool = *relationPool_[offset];
    long cells = 0;
    for (char** cell = relationFirst(row, offset); cell; cell = relationNext(cell)) {
        const std::intptr_t at = distance(pool.data(), cell);
        const bool isInPool = at >= 0 && at < distance(pool.begin(), pool.end()) && at % relationSize == 0;
        if (!isInPool || ++cells > pool.size() / 2)  // more cells than there are: the list has a cycle
            return false;
        if (!columnTable_[column]->checkRowPointer(relationTarget(cell)))
            return false;
    }
    return true;
}
