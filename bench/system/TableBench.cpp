#include "support/Bench.h"

#include <kplib/system/KpDataBase.h>
#include <kplib/system/KpTable.h>

#include <cstring>
#include <list>
#include <vector>

using namespace kplib;

namespace {

constexpr long rows = 1000000;
const char* const baseline = "million_rows_of_lists";

/// A million rows, each listing four others; walks all lists; removes every row.
template <bool IsReserved>
void millionRows(benchmark::State& state)
{
    for (auto _ : state) {
        KpDataBase database;
        KpTable& table = *database.table(database.createTable());
        table.columnAdd(1, KpTable::Plain, 12, nullptr);
        table.columnAdd(2, KpTable::Relation, 0, &table);
        const int offset = table.columnOffset(2);
        if (IsReserved) {  // no move of rows or cells: what is left out is their share
            table.rowReserve(rows);
            table.relationReserve(4 * rows, offset);
        }
        for (long i = 0; i < rows; ++i) {
            char* const row = table.rowAdd();
            std::memcpy(row + 8, &i, sizeof i);
            for (int k = 0; k < 4; ++k)
                table.relationAdd(row, offset, row);
        }
        long sum = 0;
        for (char* row = table.rowNext(nullptr); row; row = table.rowNext(row)) {
            for (char** cell = KpTable::relationFirst(row, offset); cell; cell = KpTable::relationNext(cell)) {
                long value = 0;
                std::memcpy(&value, KpTable::relationTarget(cell) + 8, sizeof value);
                sum += value;
            }
        }
        if (sum != 4 * (rows * (rows - 1) / 2))
            state.SkipWithError("wrong sum");
        for (char* row = table.rowNext(nullptr); row; row = table.rowNext(row))
            table.rowDel(row);
    }
    bench::report(state, rows, rows * 100.0, baseline);
}

/// The same with objects of the standard library, which never move.
void listsOfRows(benchmark::State& state)
{
    struct Row {
        long value;
        std::list<const Row*> others;
    };
    for (auto _ : state) {
        std::list<Row> table;
        for (long i = 0; i < rows; ++i) {
            Row& row = table.emplace_back(Row{i, {}});
            for (int k = 0; k < 4; ++k)
                row.others.push_back(&row);
        }
        long sum = 0;
        for (const Row& row : table) {
            for (const Row* other : row.others)
                sum += other->value;
        }
        benchmark::DoNotOptimize(sum);
    }
    bench::report(state, rows, rows * 100.0);
}

BENCHMARK(listsOfRows)->Name(baseline)->Unit(benchmark::kMillisecond);
BENCHMARK(millionRows<false>)->Name("KpTable/million_rows")->Unit(benchmark::kMillisecond);
BENCHMARK(millionRows<true>)->Name("KpTable/million_rows_without_moves")->Unit(benchmark::kMillisecond);

}  // namespace
