#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

class KpTable;

/// A small relational store in memory: tables whose rows point to each other. The pointers are
/// updated when rows move. See KpTable. One thread at a time.
class KPLIB_API KpDataBase {
public:
    KpDataBase() = default;
    /// Deletes the tables.
    ~KpDataBase();
    KpDataBase(const KpDataBase&) = delete;
    KpDataBase& operator=(const KpDataBase&) = delete;

    /// Creates a table and returns its id: 400, 401 ...
    int createTable();
    /// The table of an id, owned by the database; null if there is none.
    KpTable* table(int tableId) const;
    /// All tables in the order of creation.
    const KpDArray<KpTable*>& tables() const { return tables_; }

    /// Whether all tables are consistent; true while skipCheck() is in effect.
    bool check() const;
    /// Makes check() return true; may be nested.
    void skipCheck() { ++skipCheck_; }
    /// Ends one skipCheck().
    void unskipCheck() { --skipCheck_; }
    /// Whether a skipCheck() is not ended yet.
    bool isCheckSkipped() const { return skipCheck_ > 0; }

    /// Copies all tables into an empty database, with their ids; rows and relations there point to
    /// the copies. Client variables that follow the rows stay with this database.
    void clone(KpDataBase& target) const;

private:
    KpDArray<KpTable*> tables_;  // owned
    int nextTableId_ = 400;
    int skipCheck_ = 0;
};
