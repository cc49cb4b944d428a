#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

class KpTable;

/// A small relational store in memory: tables whose rows point at each other, and stay right when rows move. See
/// KpTable. One thread at a time.
class KPLIB_API KpDataBase {
public:
    KpDataBase() = default;
    /// Deletes the tables.
    ~KpDataBase();
    KpDataBase(const KpDataBase&) = delete;
    KpDataBase& operator=(const KpDataBase&) = delete;

    /// Makes a table and gives its id: 400, 401 ...
    int createTable();
    /// The table of an id, owned by the database; null if there is none.
    KpTable* table(int tableId) const;
    const KpDArray<KpTable*>& tables() const { return tables_; }

    /// Whether all tables hold together; true while skipCheck() is raised.
    bool check() const;
    void skipCheck() { ++skipCheck_; }
    void unskipCheck() { --skipCheck_; }
    bool isCheckSkipped() const { return skipCheck_ > 0; }

    /// Copies all tables into an empty database, with their ids, where rows and relations lead to the copies. Client
    /// variables that follow the rows stay with this one.
    void clone(KpDataBase& target) const;

private:
    KpDArray<KpTable*> tables_;  // owned
    int nextTableId_ = 400;
    int skipCheck_ = 0;
};
