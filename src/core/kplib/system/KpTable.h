#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <cstdint>

class KpDataBase;

/// A table of a KpDataBase: rows are records of one size in one block, to which columns are added at run time.
///
/// A row is a plain `char*`. The block may move whenever rows or columns are added. Every pointer
/// to a row in the tables, and every client variable in externalRowPointers(), is then updated;
/// keep pointers to rows in one of these. Relations, which are lists of rows of another table, are
/// stored as lists of cells in one pool for each column, which may move too.
///
/// Row layout: columns follow one another without gaps. The offset of a column is the sum of the
/// sizes before it, so fields may be unaligned: read them by memcpy. Column 0 is internal and has
/// 4 bytes: 0 in a row in use, 1 in a free row. The next 4 bytes contain the id of the table and
/// belong to the first client column, which must be a plain column of at least 4 bytes; clients
/// must not change them. A table has at most 16 columns. A relation must start within the first
/// 512 bytes of a row.
///
/// Positions, rows and offsets are not checked unless stated. One thread at a time for a whole
/// database.
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

    /// Adds a column to all rows, filled with zeros, unless a column with this id (0 to 15)
    /// exists. `size` is the size of a plain column, `target` the table that the other types point
    /// to. Returns the index of the column, or -1 with a line in the log if it does not fit into
    /// the row layout. Moves the rows.
    int columnAdd(int columnId, ColumnType type, int size, KpTable* target);
    /// Number of columns, the table's own included.
    int columnCount() const { return columnCount_; }
    /// Byte offset of a column in a row, -1 for an id that isn't used.
    int columnOffset(int columnId) const { return isColumnId(columnId) ? offsetById_[columnId] : -1; }
    /// Bytes in a row.
    int rowSize() const { return rowSize_; }

    /// Returns a new row with all client bytes zero, in constant time on average. May move the
    /// rows. Returns null, with a line in the log, if there is no client column.
    char* rowAdd();
    /// Empties the relations of the row and frees it for rowAdd(). Clear all pointers to the row
    /// first. Returns false if `row` is not a row in use.
    bool rowDel(char* row);
    /// The rows in use.
    long rowCount() const { return rowsInBlock() - freeRows_.size(); }
    /// The next row in use after `row` in the order of the block: rowNext(null) is the first, null
    /// marks the end.
    char* rowNext(char* row) const;
    /// The first row in use after `row` (null: of all) whose column of this id holds the bytes at
    /// `value`; null for none.
    char* rowFind(int columnId, const void* value, char* row = nullptr) const;
    /// Ensures that `rows` more rows can be added without a move. Returns by how many bytes the
    /// rows moved.
    long rowReserve(int rows);
    /// Moves the rows to a block of `rows` rows, or of the present number if that is larger, each
    /// extended by `extraRowBytes` zero bytes at its end, and updates all pointers to rows.
    /// Returns by how many bytes the rows moved.
    long expand(int rows, int extraRowBytes);
    /// Client variables that point to rows of this table and are updated when rows move. Each may
    /// be null.
    KpDArray<char**>& externalRowPointers() { return externalRowPointers_; }

    /// The row that a row-pointer column at `offset` holds.
    static char* pointer(const char* row, int offset);
    /// Sets that row.
    static void pointerSet(char* row, int offset, char* target);

    // Relations: `offset` is that of a relation column. A cell is two pointers: its target and the next cell.

    /// Appends `target` to the list, in constant time on average; may move the column's pool.
    void relationAdd(char* row, int offset, char* target);
    /// Removes the first cell that points to `target` from the list, if there is one. O(length).
    void relationDel(char* row, int offset, char* target);
    /// Empties the list.
    void relationRemoveAll(char* row, int offset);
    /// Length of the list. O(length).
    static int relationGetCount(const char* row, int offset);
    /// Ensures that `cells` more cells can be added without a move.
    void relationReserve(int cells, int offset);
    /// The first cell of a list, the next cell after a cell, and the row that a cell points to.
    /// Null marks the end.
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

    // Counters for clients, which agree not to change locked data. The table itself ignores them.

    /// Raises the counter of the rows.
    void lockRows() { ++rowLocks_; }
    /// Lowers it.
    void unlockRows() { --rowLocks_; }
    /// The counter of the rows.
    int rowLocks() const { return rowLocks_; }
    /// Increments or decrements the counter of the column at `offset` and returns the index of the
    /// column. For an unknown offset, both functions return -1 and increment the counter of
    /// skipCheck() instead.
    int lockRelation(int offset) { return changeRelationLock(offset, 1); }
    /// As above.
    int unlockRelation(int offset) { return changeRelationLock(offset, -1); }

    /// Copies rows, columns and relations into an empty table. Its pointers to rows still point to
    /// the old rows: KpDataBase::clone() corrects them.
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
