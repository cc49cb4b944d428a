#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <cstdint>

class KpDataBase;

/// A table of a KpDataBase: rows are records of one size in one block, to which columns are added at run time.
///
/// A row is a plain `char*`. The block may move whenever rows or columns are added; every pointer to a row that the
/// tables hold, and every client variable in externalRowPointers(), is repaired in place, so that a row is best kept in
/// one of them. Relations - lists of rows of another table - are kept as lists of cells in a pool a column, which moves
/// likewise.
///
/// Row form: columns follow one another without gaps (an offset is the sum of the sizes before it,
/// so fields may lie unaligned: read them by memcpy). Column 0 is the table's own, 4 bytes: 0 in a
/// row in use, 1 in a free one. The 4 bytes after it hold the table's id and belong to the first
/// client column, which has to be a plain one of at least 4 bytes and leaves those to the table.
/// At most 16 columns; a relation has to start within the first 512 bytes of a row.
///
/// Positions, rows and offsets are not checked unless said so. One thread at a time for a whole database.
class KPLIB_API KpTable {
public:
    /// What a column holds.
    enum ColumnType : int {
        Plain = 0,       ///< client data of a given size
        RowPointer = 1,  ///< 8 bytes: a row of the column's table, or null
        Relation = 2,    ///< 16 bytes: the first and the last cell of a list of rows of the column's table
    };
    /// Largest number of columns.
    static constexpr int maxColumns = 16;
    /// Relations start before this byte of a row.
    static constexpr int maxRelationOffset = 512;

    /// No rows, and the first column. KpDataBase::createTable() is the usual way.
    KpTable(int id, KpDataBase* database);
    ~KpTable();
    KpTable(const KpTable&) = delete;
    KpTable& operator=(const KpTable&) = delete;

    /// The id in the database.
    int tableId() const { return tableId_; }
    /// A name for the client, empty at first.
    const KpString& name() const { return name_; }
    /// Sets the name.
    void setName(const KpString& name) { name_ = name; }

    /// Adds a column to all rows, its bytes zero there, unless there is one of this id (0 to 15).
    /// `size` is that of a plain column, `target` the table that the others point to. The index of
    /// the column, or -1, with a line in the log, for one that does not fit into the row form.
    /// Moves the rows.
    int columnAdd(int columnId, ColumnType type, int size, KpTable* target);
    /// Number of columns, the table's own included.
    int columnCount() const { return columnCount_; }
    /// Byte offset of a column in a row, -1 for an id that isn't used.
    int columnOffset(int columnId) const { return isColumnId(columnId) ? offsetById_[columnId] : -1; }
    /// Bytes in a row.
    int rowSize() const { return rowSize_; }

    /// A new row, its client bytes zero, in constant time on average; may move the rows. Null, with a line in the log,
    /// while there is no client column.
    char* rowAdd();
    /// Empties the row's relations and frees the row for rowAdd(). The caller clears all pointers
    /// to it first. False if `row` is not a row in use.
    bool rowDel(char* row);
    /// The rows in use.
    long rowCount() const { return rowsInBlock() - freeRows_.size(); }
    /// The rows in use in the order of the block: rowNext(null) is the first, null ends it.
    char* rowNext(char* row) const;
    /// The first row in use after `row` (null: of all) whose column of this id holds the bytes at
    /// `value`; null for none.
    char* rowFind(int columnId, const void* value, char* row = nullptr) const;
    /// Makes room, so that `rows` more can be added without a move. Gives by how many bytes the rows moved.
    long rowReserve(int rows);
    /// Moves to a block of `rows` rows (or as many as there are), each longer by `extraRowBytes` zero bytes at its end,
    /// and repairs all pointers to rows. Gives by how many bytes the rows moved.
    long expand(int rows, int extraRowBytes);
    /// Client variables that hold rows of this table and are repaired on a move; each may be null meanwhile.
    KpDArray<char**>& externalRowPointers() { return externalRowPointers_; }

    /// The row that a row-pointer column at `offset` holds.
    static char* pointer(const char* row, int offset);
    /// Sets that row.
    static void pointerSet(char* row, int offset, char* target);

    // Relations: `offset` is that of a relation column. A cell is two pointers: its target and the next cell.

    /// Appends `target` to the list, in constant time on average; may move the column's pool.
    void relationAdd(char* row, int offset, char* target);
    /// Takes the first cell that points to `target` out of the list, if there is one. O(length).
    void relationDel(char* row, int offset, char* target);
    /// Empties the list.
    void relationRemoveAll(char* row, int offset);
    /// Length of the list. O(length).
    static int relationGetCount(const char* row, int offset);
    /// Makes room, so that `cells` more can be added without a move.
    void relationReserve(int cells, int offset);
    /// Walks a list: the first cell, the one after a cell, and the row a cell points to; null ends
    /// it.
    static char** relationFirst(const char* row, int offset);
    /// @{
    /// As above.
    static char** relationNext(char** cell) { return reinterpret_cast<char**>(cell[1]); }
    static char* relationTarget(char** cell) { return cell[0]; }
    /// @}

    /// Drops all rows and relations; the columns stay.
    void clear();

    /// Whether the table is consistent; true while skipCheck() of it or of its database is in
    /// effect. O(rows and cells).
    bool check() const;
    /// Whether `row` is null or a row of the block, in use or not.
    bool checkRowPointer(const char* row) const;
    /// Makes check() return true; may be nested.
    void skipCheck() { ++skipCheck_; }
    /// Ends one skipCheck().
    void unskipCheck() { --skipCheck_; }

    // Counters for clients that agree among themselves not to change locked data; the table itself
    // ignores them.

    /// Raises the counter of the rows.
    void lockRows() { ++rowLocks_; }
    /// Lowers it.
    void unlockRows() { --rowLocks_; }
    /// The counter of the rows.
    int rowLocks() const { return rowLocks_; }
    /// Raises or lowers the counter of the column at `offset` and gives the column's index. An
    /// unknown offset gives -1 and raises the counter of skipCheck() in its place, with either
    /// function.
    int lockRelation(int offset) { return changeRelationLock(offset, 1); }
    /// As above.
    int unlockRelation(int offset) { return changeRelationLock(offset, -1); }

    /// Copies rows, columns and relations into an empty table, whose pointers to rows still point
    /// to the old ones: KpDataBase::clone() corrects them.
    void clone(KpTable& target) const;

private:
    friend class KpDataBase;
    using Pool = KpDArray<char*>;
    using FreeCells = KpDArray<char**>;
    class CheckSkipped;

    static bool isColumnId(int columnId) { return columnId >= 0 && columnId < maxColumns; }
    bool canAdd(int columnId, ColumnType type, int size, const KpTable* target) const;
    void addPool(int offset);
    void dropPool(int offset);
    long rowsInBlock() const { return rows_.size() / rowSize_; }
    long capacityInRows() const { return rows_.capacity() / rowSize_; }
    char* row(long index) const { return rowData_ + index * rowSize_; }
    void relationsRepair();
    void repairColumns(const KpTable& moved);
    template <typename Work>
    void forEachRowPointer(int column, Work work);
    char** takeCell(int offset);
    void freeCell(char** cell, int offset);
    void relationExpand(long size, int offset, Pool& pool);
    void shiftCells(int offset, std::intptr_t bytes);
    int changeRelationLock(int offset, int by);
    bool isRowSound(const char* row) const;
    bool isRelationSound(const char* row, int column) const;
    void clonePool(KpTable& target, int offset) const;
    void adoptTargets(const KpDataBase& source);

    KpDataBase* database_;  // not owned
    int tableId_;
    KpString name_;
    int columnCount_ = 0;
    int columnType_[maxColumns] = {};
    int columnSize_[maxColumns] = {};
    int columnOffset_[maxColumns] = {};
    KpTable* columnTable_[maxColumns] = {};
    int initialRows_ = 512;
    int rowSize_ = 0;
    int indexById_[maxColumns];
    int offsetById_[maxColumns];
    Pool* relationPool_[maxRelationOffset] = {};       // by byte offset of the column, as the next two
    char** relationPoolData_[maxRelationOffset] = {};  // where the pool was when the cells' pointers were last right
    FreeCells* relationFree_[maxRelationOffset] = {};
    KpDArray<char> rows_;
    char* rowData_ = nullptr;
    KpDArray<char*> freeRows_;
    KpDArray<char**> externalRowPointers_;
    int skipCheck_ = 0;
    int relationLocks_[maxColumns] = {};
    int rowLocks_ = 0;
};
