#include <kplib/volume/KpConnectedComponents.h>

#include <kplib/cpu/ElementConvert.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/volume/detail/ComponentTable.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <initializer_list>
#include <limits>
#include <type_traits>

using kplib::detail::ComponentTable;

int KpConnectedComponents::dbg_add;
int KpConnectedComponents::dbg_merge;
int KpConnectedComponents::dbg_clean;

namespace {

// The order of merging decides which counts are lost and how sums are rounded; do not sort these
// tables. Tables of fewer neighbours are the ends of longer ones.
constexpr int neighbours26[13][3] = {{-1, -1, -1}, {1, -1, -1}, {-1, 1, -1}, {1, 1, -1},  {0, -1, -1},
                                     {-1, 0, -1},  {1, 0, -1},  {0, 1, -1},  {-1, -1, 0}, {1, -1, 0},
                                     {0, 0, -1},   {0, -1, 0},  {-1, 0, 0}};
constexpr int neighbours8[4][3] = {{-1, -1, 0}, {1, -1, 0}, {0, -1, 0}, {-1, 0, 0}};

struct Neighbours {
    const int (*first)[3];
    int n;
};

Neighbours previousNeighbours(int neighbours)
{
    switch (neighbours) {
    case 4:
        return {neighbours26 + 11, 2};
    case 6:
        return {neighbours26 + 10, 3};
    case 8:
        return {neighbours8, 4};
    case 10:
        return {neighbours26 + 8, 5};
    case 18:
        return {neighbours26 + 4, 9};
    case 26:
        return {neighbours26, 13};
    default:
        return {neighbours26, 0};
    }
}

// Threads that label at once share the counters: no access may be a data race, but diagnostics are not worth the bus
// lock of an exact count.
void countUp(int& counter)
{
    // std::atomic_ref is missing from libc++ 14.
    __atomic_store_n(&counter, __atomic_load_n(&counter, __ATOMIC_RELAXED) + 1, __ATOMIC_RELAXED);
}

// Rounded half up, cut to 32 bits as the processor does (any value out of range is the smallest
// int), then to the type.
template <typename T>
T threshold(double value)
{
    if constexpr (std::is_floating_point_v<T>) {
        return static_cast<T>(value);
    } else {
        const double rounded = std::floor(value + 0.5);
        return static_cast<T>(kplib::detail::truncatedToInt(rounded >= -2147483648.0 ? rounded : -2147483648.0));
    }
}

// Labels in 32 bytes.
template <typename L>
constexpr long blockOf = 32 / sizeof(L);

template <typename L>
bool isOneLabel(const L* block)
{
    using Bits = std::make_unsigned_t<L>;
    const std::uint64_t first = ~std::uint64_t{0} / std::numeric_limits<Bits>::max() * static_cast<Bits>(block[0]);
    std::uint64_t words[4], differences = 0;
    std::memcpy(words, block, sizeof words);
    for (std::uint64_t word : words)
        differences |= word ^ first;
    return differences == 0;
}

template <typename L>
void renumberEach(L* labels, long n, const int* numbers)
{
    std::transform(labels, labels + n, labels, [=](L label) { return static_cast<L>(numbers[label]); });
}

// Replaces each label by its new number. Labels occur in runs, and most stay: blocks of one label
// are looked up once, and not written if nothing changes.
template <typename L>
void renumber(L* labels, long n, const int* numbers)
{
    long i = 0;
    for (; i + blockOf<L> <= n; i += blockOf<L>) {
        L* const block = labels + i;
        if (!isOneLabel(block))
            renumberEach(block, blockOf<L>, numbers);
        else if (numbers[block[0]] != block[0])
            std::fill_n(block, blockOf<L>, static_cast<L>(numbers[block[0]]));
    }
    renumberEach(labels + i, n - i, numbers);
}

bool isTooSmall(unsigned count, int minimum)
{
    return minimum > 0 && count < static_cast<unsigned>(minimum);
}

}  // namespace

void KpConnectedComponents::Component::addAlias(Component& other, int labelMode)
{
    nVoxels += other.nVoxels;
    if (labelMode == 0)
        nSeeds += other.nSeeds;
    for (int axis = 0; axis < 3; ++axis)
        sum[axis] += other.sum[axis];
    other = Component{id, 0, 0, {0, 0, 0}};
}

int KpConnectedComponents::compareComponents(const Component& a, const Component& b)
{
    return a.nVoxels < b.nVoxels ? -1 : a.nVoxels > b.nVoxels ? 1 : 0;
}

void KpConnectedComponents::mknbtableprev(int neighbours, const int* dims, int& n, int* offsets, int (*deltas)[3])
{
    const Neighbours table = previousNeighbours(neighbours);
    n = table.n;
    for (int i = 0; i < n; ++i) {
        std::memcpy(deltas[i], table.first[i], sizeof deltas[i]);
        const auto& [dx, dy, dz] = deltas[i];
        offsets[i] = static_cast<int>(dx + static_cast<long>(dims[0]) * (dy + static_cast<long>(dims[1]) * dz));
    }
}

namespace kplib::detail {

void startComponents(ComponentTable& components)
{
    for (auto* counter :
         {&KpConnectedComponents::dbg_add, &KpConnectedComponents::dbg_merge, &KpConnectedComponents::dbg_clean})
        __atomic_store_n(counter, 0, __ATOMIC_RELAXED);
    components.resize(1);
    components[0] = Component{};
}

template <typename L>
int addComponent(ComponentTable& components, L* labels, long nLabelled)
{
    constexpr int limit = KpConnectedComponents::maxComponents<L>;
    countUp(KpConnectedComponents::dbg_add);
    if (components.size() >= limit)
        cleanUpComponents(components, labels, nLabelled, -1, -1);
    if (components.size() >= limit) {
        getTheLogInstance().errorf("ERROR: too many components");
        return -1;
    }
    const int index = static_cast<int>(components.size());
    components.append(Component{index, 0, 0, {0, 0, 0}});
    return index;
}

template <typename L>
int cleanUpComponents(ComponentTable& components, L* labels, long nLabelled, int minVoxels, int minSeeds)
{
    countUp(KpConnectedComponents::dbg_clean);
    const int oldSize = static_cast<int>(components.size());
    KpDArray<int> numbers;
    numbers.resize(oldSize);
    int newSize = 0;
    for (int i = 0; i < oldSize; ++i) {
        const Component component = components[i];
        if (i > 0 && component.id != i) {
            numbers[i] = numbers[component.id];  // always a lower index
        } else if (i > 0 && (isTooSmall(component.nVoxels, minVoxels) || isTooSmall(component.nSeeds, minSeeds))) {
            numbers[i] = 0;
        } else {
            components[newSize] = component;
            components[newSize].id = newSize;
            numbers[i] = newSize++;
        }
    }
    if (newSize == oldSize)
        return oldSize;
    components.resize(newSize);
    renumber(labels, nLabelled, numbers.data());
    return newSize;
}

template int cleanUpComponents(ComponentTable&, unsigned short*, long, int, int);
template int cleanUpComponents(ComponentTable&, int*, long, int, int);
template int addComponent(ComponentTable&, unsigned short*, long);
template int addComponent(ComponentTable&, int*, long);

}  // namespace kplib::detail

template <typename L>
int KpConnectedComponents::addNewComponent(KpDArray<Component>& components, L* labels, int nLabelled)
{
    return kplib::detail::addComponent(components, labels, nLabelled);
}

template <typename L>
int KpConnectedComponents::cleanup_components(KpDArray<Component>& components, L* labels, int nLabelled, int minVoxels,
                                              int minSeeds)
{
    return kplib::detail::cleanUpComponents(components, labels, nLabelled, minVoxels, minSeeds);
}

template int KpConnectedComponents::addNewComponent(ComponentTable&, unsigned short*, int);
template int KpConnectedComponents::addNewComponent(ComponentTable&, int*, int);
template int KpConnectedComponents::cleanup_components(ComponentTable&, unsigned short*, int, int, int);
template int KpConnectedComponents::cleanup_components(ComponentTable&, int*, int, int, int);

int KpConnectedComponents::labelCC(KpTypedPointer data, const int* dims, int neighbours, unsigned short*& labels, int,
                                   double low, double high, int, int, KpDArray<Component>* components)
{
    if (labels == nullptr)
        labels = static_cast<unsigned short*>(
            kpmalloc(static_cast<unsigned long>(kplib::detail::nVoxelsOf(dims)) * sizeof(unsigned short)));
    ComponentTable local;
    ComponentTable& table = components != nullptr ? *components : local;
    int result = -1;
    const bool isNumber = kpVisitNumberType(data.type, [&]<typename T>(KpElementTag<T>) {
        result = do_label(static_cast<T*>(data.data), labels, table, threshold<T>(low), threshold<T>(high), dims,
                          neighbours, 0);
    });
    if (!isNumber)
        getTheLogInstance().errorf("Unsupported data type %s in KpRawData()\n", data.type.name());
    return result;
}

int KpConnectedComponents::labelLabels(unsigned char* data, const int* dims, int neighbours, unsigned short* labels,
                                       int, int, KpDArray<Component>& components)
{
    return do_label<unsigned char>(data, labels, components, 0, 0, dims, neighbours, 1);
}

int KpConnectedComponents::labelLabelsHuge(unsigned char* data, const int* dims, int neighbours, int* labels, int, int,
                                           KpDArray<Component>& components)
{
    return do_label<unsigned char>(data, labels, components, 0, 0, dims, neighbours, 1);
}
