#pragma once

#include <kplib/system/KpDataBase.h>
#include <kplib/system/KpTable.h>

// Makes check() of a table and its database return true while rows and pointers disagree.
class KpTable::CheckSkipped {
public:
    explicit CheckSkipped(KpTable& table) : table_(table)
    {
        table_.skipCheck();
        if (table_.database_)
            table_.database_->skipCheck();
    }
    ~CheckSkipped()
    {
        if (table_.database_)
            table_.database_->unskipCheck();
        table_.unskipCheck();
    }
    CheckSkipped(const CheckSkipped&) = delete;
    CheckSkipped& operator=(const CheckSkipped&) = delete;

private:
    KpTable& table_;
};
