#include <kplib/system/KpDataBase.h>
#include <kplib/system/KpTable.h>

#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

#include <climits>
#include <malloc.h>
#include <map>
#include <memory>
#include <random>
#include <vector>

namespace {

constexpr int valueAt = 12, pointerAt = 20, listAt = 28, lateAt = 44;  // in a row; the late column comes last
constexpr int lateColumn = 4;

/// What a row should hold; `row` is followed by the table when rows move.
struct ModelRow {
    std::unique_ptr<char*> row;
    long value;
    long partner = -1;       // a key of the other table
    std::vector<long> list;  // keys of the row's own table
};
using Model = std::map<long, ModelRow>;

long valueOf(const char* row, int at = valueAt)
{
    long value = 0;
    std::memcpy(&value, row + at, sizeof value);
    return value;
}

/// Two tables whose rows point to each other and list rows of their own, beside a model of them.
class Pair {
public:
    Pair()
    {
        mallopt(M_PERTURB, 0xA5);  // memory that is not set to zero is not zero
        for (KpTable*& table : tables)
            table = database.table(database.createTable());
        for (int t = 0; t < 2; ++t) {
            tables[t]->columnAdd(1, KpTable::Plain, 16, nullptr);  // its first four bytes are the table's
            tables[t]->columnAdd(2, KpTable::RowPointer, 0, tables[1 - t]);
            tables[t]->columnAdd(3, KpTable::Relation, 0, tables[t]);
        }
    }

    ~Pair() { mallopt(M_PERTURB, 0); }

    void step()
    {
        const int t = random() % 2;
        if (models[0].empty() || models[1].empty())
            return add(models[0].empty() ? 0 : 1);
        const long key = any(models[t]), other = any(models[1 - t]);
        const bool isShrinking = steps++ % 1000 >= 900;  // leaves rows and cells that are free
        const unsigned int what = random() % 16;
        if (what == 0 || (what > 8 && isShrinking))
            remove(t, key);
        else if (what == 1)
            link(t, key, other);
        else if (what < 6)
            for (int i = 0; i < 3; ++i)
                relate(t, key, any(models[t]));
        else if (what == 6 && !models[t].at(key).list.empty())
            unrelate(t, key, models[t].at(key).list[random() % models[t].at(key).list.size()]);
        else if (what == 7 && random() % 20 == 0)
            tables[t]->expand(static_cast<int>(tables[t]->rowCount() + random() % 700), 0);
        else if (what == 8 && random() % 20 == 0)
            tables[t]->relationReserve(reserved += 200, listAt);
        else if (what > 8)
            add(t);
    }

    void clear()
    {
        for (int t = 0; t < 2; ++t) {
            tables[t]->clear();
            tables[t]->externalRowPointers().clear();
            models[t].clear();
        }
    }

    /// A copy of the value, after the existing columns.
    void addLateColumns()
    {
        for (int t = 0; t < 2; ++t) {
            tables[t]->columnAdd(lateColumn, KpTable::Plain, 8, nullptr);
            for (const auto& [key, model] : models[t]) {
                EXPECT_EQ(valueOf(*model.row, lateAt), 0);
                std::memcpy(*model.row + lateAt, &model.value, 8);
            }
        }
    }

    void expectHolds(const KpDataBase& held, bool isClone = false) const
    {
        ASSERT_TRUE(held.check());
        for (int t = 0; t < 2; ++t) {
            const KpTable& table = *held.table(400 + t);
            ASSERT_EQ(table.rowCount(), static_cast<long>(models[t].size()));
            for (const auto& [key, model] : models[t]) {
                char* const row = isClone ? table.rowFind(lateColumn, *model.row + lateAt) : *model.row;
                ASSERT_TRUE(row);
                ASSERT_TRUE(table.checkRowPointer(row));
                const char* const partner = KpTable::pointer(row, pointerAt);
                ASSERT_TRUE(held.table(401 - t)->checkRowPointer(partner));
                std::vector<long> found{valueOf(row), valueOf(row, lateAt), partner ? valueOf(partner) : -1};
                for (char** cell = KpTable::relationFirst(row, listAt); cell; cell = KpTable::relationNext(cell))
                    found.push_back(valueOf(KpTable::relationTarget(cell)));
                std::vector<long> expected{model.value, model.value,
                                           model.partner < 0 ? -1 : models[1 - t].at(model.partner).value};
                for (const long listed : model.list)
                    expected.push_back(models[t].at(listed).value);
                ASSERT_EQ(found, expected);
            }
        }
    }

    KpDataBase database;
    KpTable* tables[2];
    Model models[2];

private:
    long any(const Model& model)
    {
        const auto hit = model.lower_bound(static_cast<long>(random() % static_cast<unsigned>(nextKey)));
        return hit == model.end() ? model.rbegin()->first : hit->first;
    }
    void add(int t)
    {
        ModelRow model{std::make_unique<char*>(tables[t]->rowAdd()), static_cast<long>(random()), -1, {}};
        for (const int at : {valueAt, lateAt}) {
            if (at < tables[t]->rowSize())
                std::memcpy(*model.row + at, &model.value, 8);
        }
        tables[t]->externalRowPointers().append(model.row.get());
        models[t].emplace(nextKey++, std::move(model));
    }
    void link(int t, long key, long other)
    {
        models[t].at(key).partner = other;
        KpTable::pointerSet(*models[t].at(key).row, pointerAt, other < 0 ? nullptr : *models[1 - t].at(other).row);
    }
    void relate(int t, long key, long target)
    {
        models[t].at(key).list.push_back(target);
        tables[t]->relationAdd(*models[t].at(key).row, listAt, *models[t].at(target).row);
    }
    void unrelate(int t, long key, long target)
    {
        std::vector<long>& list = models[t].at(key).list;
        list.erase(std::find(list.begin(), list.end(), target));
        tables[t]->relationDel(*models[t].at(key).row, listAt, *models[t].at(target).row);
    }
    void remove(int t, long key)
    {
        for (const auto& [k, model] : models[1 - t]) {
            if (model.partner == key)
                link(1 - t, k, -1);
        }
        for (const auto& [k, model] : models[t]) {
            while (std::count(model.list.begin(), model.list.end(), key) > 0)
                unrelate(t, k, key);
        }
        const ModelRow& model = models[t].at(key);
        EXPECT_TRUE(tables[t]->rowDel(*model.row));
        EXPECT_FALSE(tables[t]->rowDel(*model.row));
        KpDArray<char**>& external = tables[t]->externalRowPointers();
        external.remove(std::find(external.begin(), external.end(), model.row.get()) - external.begin());
        models[t].erase(key);
    }

    std::mt19937 random{7};
    long nextKey = 0, steps = 0;
    int reserved = 0;
};

}  // namespace

TEST(KpTable, agreesWithAMapThroughMovesOfRowsAndCells)
{
    Pair pair;
    pair.addLateColumns();
    for (int i = 0; i < 9000; ++i) {
        pair.step();
        ASSERT_TRUE(pair.database.check()) << i;
        if (i == 2970)  // while there are free rows and cells
            pair.clear();
        if (i % 1000 == 999) {
            ASSERT_NO_FATAL_FAILURE(pair.expectHolds(pair.database)) << i;
        }
    }
    ASSERT_GT(pair.models[0].size(), 600U);  // beyond the first block
}

TEST(KpTable, clonesAreEqualAndIndependent)
{
    Pair pair;
    for (int i = 0; i < 2950; ++i)
        pair.step();
    pair.addLateColumns();  // a column for existing rows; its values identify the rows of the clone
    pair.tables[1]->setName("second");
    KpDataBase copy;
    pair.database.clone(copy);
    ASSERT_NO_FATAL_FAILURE(pair.expectHolds(copy, true));
    EXPECT_STREQ(copy.table(401)->name(), "second");
    EXPECT_EQ(copy.createTable(), 402);
    for (int t = 0; t < 2; ++t) {
        KpTable& table = *copy.table(400 + t);
        for (long i = table.rowCount(); i > 0; --i) {  // in what was free, and beyond
            char* const row = table.rowAdd();
            table.relationAdd(row, listAt, row);
        }
        ASSERT_EQ(table.rowCount(), 2 * static_cast<long>(pair.models[t].size()));
        table.expand(5000, 24);
        ASSERT_TRUE(copy.check());
    }
    EXPECT_NO_FATAL_FAILURE(pair.expectHolds(pair.database));
    std::memset(copy.table(400)->rowNext(nullptr) + 4, 0, 4);
    EXPECT_FALSE(copy.check());
}

TEST(KpTable, aRelationWithoutMemoryLeavesNothingThatAClonePutsRight)
{
    for (long n = 0;; ++n) {
        KpDataBase database, copies;
        KpTable& table = *database.table(database.createTable());
        table.columnAdd(1, KpTable::Plain, 16, nullptr);
        table.rowAdd();
        try {
            const kplib::test::FailingMalloc failing(n, 1);
            table.columnAdd(2, KpTable::Relation, 0, &table);
            break;
        } catch (...) {
        }
        table.columnAdd(3, KpTable::Plain, 16, nullptr);
        char* const row = table.rowNext(nullptr);
        std::memset(row + table.columnOffset(3), 1, 16);
        database.clone(copies);
        const char* const copy = copies.table(table.tableId())->rowNext(nullptr);
        EXPECT_EQ(std::memcmp(row, copy, static_cast<std::size_t>(table.rowSize())), 0) << n;
    }
}

TEST(KpTable, movesOnlyWhenThereIsNoRoomLeft)
{
    KpDataBase database;
    KpTable& table = *database.table(database.createTable());
    table.columnAdd(1, KpTable::Plain, 4, nullptr);
    table.columnAdd(2, KpTable::Relation, 0, &table);
    const int list = table.columnOffset(2);
    char* row = table.rowAdd();
    table.externalRowPointers().append(&row);
    char* const place = row;
    while (table.rowCount() < 512)
        table.rowAdd();
    for (int i = 0; i < 3; ++i)
        table.rowDel(table.rowNext(row));
    EXPECT_EQ(table.rowReserve(3), 0);
    EXPECT_EQ(table.expand(512, 0), 0);
    EXPECT_EQ(row, place);
    const long moved = table.rowReserve(4);
    EXPECT_EQ(row, place + moved);
    EXPECT_EQ(table.rowReserve(3 + 512), 0);
    EXPECT_NE(table.rowReserve(3 + 513), 0);

    const auto addWithoutMove = [&](int cells) {
        table.relationAdd(row, list, row);
        char** const first = KpTable::relationFirst(row, list);
        table.relationReserve(cells, list);
        for (int i = 0; i < cells; ++i)
            table.relationAdd(row, list, row);
        EXPECT_EQ(KpTable::relationFirst(row, list), first) << cells;
    };
    addWithoutMove(511);
    table.relationReserve(513, list);
    addWithoutMove(512);
    table.relationRemoveAll(row, list);
    KpDataBase copies;
    database.clone(copies);
    {
        const kplib::test::FailingMalloc failing(0);
        EXPECT_NO_THROW(copies.table(table.tableId())->relationReserve(2048, list)) << "free cells are cloned";
    }
    addWithoutMove(1024);
}

TEST(KpTable, refusesColumnsThatTheRowFormHasNoPlaceFor)
{
    KpDataBase database;
    KpTable& table = *database.table(database.createTable());
    EXPECT_EQ(table.rowAdd(), nullptr);
    EXPECT_EQ(table.columnAdd(1, KpTable::Relation, 0, &table), -1);  // the table's id has to stand there
    EXPECT_EQ(table.columnAdd(1, KpTable::Plain, 2, nullptr), -1);
    EXPECT_EQ(table.columnAdd(16, KpTable::Plain, 8, nullptr), -1);
    EXPECT_EQ(table.columnAdd(1, KpTable::Plain, INT_MAX, nullptr), -1);  // 4 bytes more than an int counts
    EXPECT_EQ(table.columnAdd(5, KpTable::Plain, 508, nullptr), 1);
    EXPECT_EQ(table.columnAdd(5, KpTable::Plain, 8, nullptr), 1);     // is there: nothing is done
    EXPECT_EQ(table.columnAdd(6, KpTable::Relation, 0, &table), -1);  // would start at 512
    EXPECT_EQ(table.columnAdd(6, KpTable::RowPointer, 0, &table), 2);
    EXPECT_EQ(table.columnOffset(6), 512);
}

TEST(KpTable, checkFindsWhatDoesNotHoldUnlessItIsSkipped)
{
    KpDataBase database;
    KpTable& table = *database.table(database.createTable());
    table.columnAdd(1, KpTable::Plain, 4, nullptr);
    table.columnAdd(2, KpTable::RowPointer, 0, &table);
    table.columnAdd(3, KpTable::Relation, 0, &table);
    const int to = table.columnOffset(2), list = table.columnOffset(3);
    char* const row = table.rowAdd();
    char* const freed = table.rowAdd();
    table.relationAdd(row, list, row);
    char** const cell = KpTable::relationFirst(row, list);
    table.rowDel(freed);
    KpTable::pointerSet(row, to, freed);
    ASSERT_TRUE(database.check());

    char outside[8];
    std::memcpy(outside, row, 8);  // as good as a row, but for its place
    char* cellOutside[2] = {row, nullptr};
    const auto bytes = [](const void* pointer) { return std::string(reinterpret_cast<char*>(&pointer), 8); };
    const std::tuple<const char*, void*, std::string> faults[] = {
        {"state", row, std::string("\2\0\0\0", 4)},
        {"table", row + 4, std::string(4, '\0')},
        {"table of a free row that is pointed to", freed + 4, std::string(4, '\0')},
        {"row outside", row + to, bytes(outside)},
        {"cell outside", row + list, bytes(cellOutside)},
        {"target between rows", cell, bytes(row + 1)},
        {"list without end", cell + 1, bytes(cell)}};
    for (const auto& [what, place, wrong] : faults) {
        const std::string saved(static_cast<char*>(place), wrong.size());
        std::memcpy(place, wrong.data(), wrong.size());
        EXPECT_FALSE(database.check()) << what;
        EXPECT_EQ(table.unlockRelation(9999), -1);  // which skips the check instead
        EXPECT_TRUE(table.check());
        table.unskipCheck();
        database.skipCheck();
        EXPECT_TRUE(table.check());
        database.unskipCheck();
        std::memcpy(place, saved.data(), saved.size());
    }
    EXPECT_EQ(table.lockRelation(list), 3);
    EXPECT_TRUE(database.check());
}
