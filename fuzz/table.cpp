// Tables under any sequence of operations: they hold together, and a clone does too.

#include "Fuzz.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpDataBase.h>
#include <kplib/system/KpTable.h>

#include <vector>

namespace {

constexpr int listAt = 28;

class Store {
public:
    Store()
    {
        for (KpTable*& table : tables_) {
            table = database_.table(database_.createTable());
            table->columnAdd(1, KpTable::Plain, 16, nullptr);
        }
        for (int t = 0; t < 2; ++t) {
            tables_[t]->columnAdd(2, KpTable::RowPointer, 0, tables_[1 - t]);
            tables_[t]->columnAdd(3, KpTable::Relation, 0, tables_[t]);
        }
    }

    void step(Input& input)
    {
        const auto what = input.number<std::uint8_t>();
        KpTable& table = *tables_[what & 1];
        char *const row = rowOf(table, input.number<std::uint8_t>()), *const other =
                                                                          rowOf(table, input.number<std::uint8_t>());
        switch (what >> 1 & 7) {
        case 0:
        case 1:
            table.rowAdd();
            break;
        case 2:
            if (row && other)
                table.relationAdd(row, listAt, other);
            break;
        case 3:
            if (row && other)
                table.relationDel(row, listAt, other);
            break;
        case 4:
            if (row)
                table.relationRemoveAll(row, listAt);
            break;
        case 5:
            table.rowReserve(input.number<std::uint8_t>());
            break;
        case 6:
            table.columnAdd(input.number<std::int8_t>(), KpTable::Plain, input.number<std::int16_t>(), nullptr);
            break;
        default:
            table.relationReserve(input.number<std::uint8_t>(), listAt);
        }
    }

    void checkAll() const
    {
        check(database_.check());
        KpDataBase copy;
        database_.clone(copy);
        check(copy.check());
    }

private:
    static char* rowOf(const KpTable& table, int index)
    {
        char* row = table.rowNext(nullptr);
        while (row && index-- > 0)
            row = table.rowNext(row);
        return row;
    }

    KpDataBase database_;
    KpTable* tables_[2];
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    Input input(data, size);
    Store store;
    for (int i = 0; i < 200 && input.size() > 0; ++i)
        store.step(input);
    store.checkAll();
    return 0;
}
