#include <kplib/system/KpTable.h>

#include <kplib/system/detail/TableBytes.h>
#include <kplib/system/detail/TableWalk.h>

#include <algorithm>
#include <cstdint>

using namespace kplib::detail;

namespace {

// The first and the last cell of a list, as a relation column holds them.
struct Ends {
    char** first;
    char** last;
};

Ends endsOf(const char* row, int offset)
{
    return readAt<Ends>(row + offset);
}

void setEnds(char* row, int offset, Ends ends)
{
    writeAt(row + offset, ends);
}

void link(char** cell, char** next)
{
    cell[1] = reinterpret_cast<char*>(next);
}

}  // namespace

char** KpTable::relationFirst(const char* row, int offset)
{
    return endsOf(row, offset).first;
}

void KpTable::relationAdd(char* row, int offset, char* target)
{
    char** const cell = takeCell(offset);  // may move the pool and change the ends, so before they are read
    Ends ends = endsOf(row, offset);
    cell[0] = target;
    link(cell, nullptr);
    if (ends.last)
        link(ends.last, cell);
    else
        ends.first = cell;
    ends.last = cell;
    setEnds(row, offset, ends);
}

char** KpTable::takeCell(int offset)
{
    FreeCells& freeCells = *relationFree_[offset];
    if (freeCells.size() > 0) {
        char** const cell = freeCells[freeCells.size() - 1];
        freeCells.resize(freeCells.size() - 1);
        return cell;
    }
    Pool& pool = *relationPool_[offset];
    if (pool.capacity() - pool.size() < 2)
        relationExpand(std::max(1L, pool.capacity()), offset, pool);
    pool.resize(pool.size() + 2);
    return pool.end() - 2;
}

void KpTable::relationDel(char* row, int offset, char* target)
{
    Ends ends = endsOf(row, offset);
    char** before = nullptr;
    char** cell = ends.first;
    while (cell && cell[0] != target) {
        before = cell;
        cell = relationNext(cell);
    }
    if (!cell)
        return;
    relationFree_[offset]->reserveOne();
    if (before)
        link(before, relationNext(cell));
    else
        ends.first = relationNext(cell);
    if (cell == ends.last)
        ends.last = before;
    setEnds(row, offset, ends);
    freeCell(cell, offset);
}

void KpTable::relationRemoveAll(char* row, int offset)
{
    FreeCells& freeCells = *relationFree_[offset];
    const long before = freeCells.size();
    freeCells.resize(before + relationGetCount(row, offset));
    freeCells.resize(before);
    for (char** cell = endsOf(row, offset).first; cell;) {
        char** const next = relationNext(cell);
        freeCell(cell, offset);
        cell = next;
    }
    setEnds(row, offset, {nullptr, nullptr});
}

// Clears a cell and adds it to the list of free cells, which has room for it.
void KpTable::freeCell(char** cell, int offset)
{
    cell[0] = cell[1] = nullptr;
    relationFree_[offset]->append(cell);
}

int KpTable::relationGetCount(const char* row, int offset)
{
    int count = 0;
    for (char** cell = relationFirst(row, offset); cell; cell = relationNext(cell))
        ++count;
    return count;
}

void KpTable::relationReserve(int cells, int offset)
{
    Pool& pool = *relationPool_[offset];
    const long free = (pool.capacity() - pool.size()) / 2 + relationFree_[offset]->size();
    if (cells <= free)
        return;
    const long present = pool.capacity() / 2;
    long wanted = std::max(1L, present);
    while (wanted - present < cells - free)
        wanted *= 2;
    relationExpand(wanted, offset, pool);
}

// Gives the pool room for `size` cells, and corrects all pointers to cells if the pool moves.
void KpTable::relationExpand(long size, int offset, Pool& pool)
{
    if (pool.capacity() >= size * 2)
        return;
    const long oldCapacity = pool.capacity();
    const std::intptr_t oldPlace = reinterpret_cast<std::intptr_t>(pool.data());
    pool.remax(size * 2);
    std::fill(pool.data() + oldCapacity, pool.data() + pool.capacity(), nullptr);
    relationPoolData_[offset] = pool.data();
    const std::intptr_t moved = reinterpret_cast<std::intptr_t>(pool.data()) - oldPlace;
    if (moved != 0)
        shiftCells(offset, moved);
}

// Corrects the pointers to the cells of a pool that has moved by `bytes`.
void KpTable::shiftCells(int offset, std::intptr_t bytes)
{
    Pool& pool = *relationPool_[offset];
    for (long i = 1; i < pool.size(); i += 2)
        pool[i] = shifted(pool[i], bytes);
    for (char**& cell : *relationFree_[offset])
        cell = shifted(cell, bytes);
    for (long i = 0; i < rowsInBlock(); ++i) {
        const Ends ends = endsOf(row(i), offset);
        setEnds(row(i), offset, {shifted(ends.first, bytes), shifted(ends.last, bytes)});
    }
}
