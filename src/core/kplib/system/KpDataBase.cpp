#include <kplib/system/KpDataBase.h>

#include <kplib/system/KpTable.h>
#include <kplib/system/detail/TableBytes.h>
#include <kplib/system/detail/TableWalk.h>

#include <algorithm>
#include <cstdint>

using namespace kplib::detail;

KpDataBase::~KpDataBase()
{
    for (long i = tables_.size() - 1; i >= 0; --i)
        delete tables_[i];
}

int KpDataBase::createTable()
{
    tables_.reserveOne();
    tables_.append(new KpTable(nextTableId_, this));
    return nextTableId_++;
}

KpTable* KpDataBase::table(int tableId) const
{
    const auto isIt = [&](const KpTable* candidate) { return candidate->tableId() == tableId; };
    const auto found = std::find_if(tables_.begin(), tables_.end(), isIt);
    return found == tables_.end() ? nullptr : *found;
}

bool KpDataBase::check() const
{
    if (isCheckSkipped())
        return true;
    for (long i = tables_.size() - 1; i >= 0; --i) {
        if (!tables_[i]->check())
            return false;
    }
    return true;
}

void KpDataBase::clone(KpDataBase& target) const
{
    target.skipCheck();
    target.nextTableId_ = nextTableId_;
    for (const KpTable* source : tables_) {
        target.tables_.reserveOne();
        auto* const copy = new KpTable(source->tableId(), &target);
        target.tables_.append(copy);
        copy->skipCheck();
        source->clone(*copy);
    }
    for (long i = target.tables_.size() - 1; i >= 0; --i)
        target.tables_[i]->adoptTargets(*this);
    for (KpTable* copy : target.tables_)
        copy->unskipCheck();
    target.unskipCheck();
}

// Replaces the targets and the row pointers of the columns, for a table cloned from `source`, by
// those of this table's own database.
void KpTable::adoptTargets(const KpDataBase& source)
{
    for (int column = columnCount_ - 1; column >= 0; --column) {
        if (!columnTable_[column])
            continue;
        const KpTable* const from = source.table(columnTable_[column]->tableId_);
        KpTable* const to = database_->table(columnTable_[column]->tableId_);
        if (!from || !to)
            continue;
        columnTable_[column] = to;
        const std::intptr_t moved = distance(from->rowData_, to->rowData_);
        forEachRowPointer(column, [moved](char*& target) { target = shifted(target, moved); });
    }
}
