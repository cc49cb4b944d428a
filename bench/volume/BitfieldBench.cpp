#include <kplib/volume/KpBitfield.h>
#include <kplib/volume/detail/BitfieldKernels.h>
#include <rawdata/Volumes.h>

#include <span>

// The masks of a volume of 512 x 512 x 256: questions against a sum over the same words, which are read again and again
// as here; logic against a copy of as many bytes; labels against a copy of the labels.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

constexpr unsigned long nVoxels = 512UL * 512 * 256;
constexpr double maskBytes = nVoxels / 8.0;

/// With nothing to find before its end.
KpBitfield sparse()
{
    return KpBitfield(nVoxels, KpBitfield::INIT_UNSET);
}

void addBaselines()
{
    for (int fields : {1, 2}) {
        add("xor of masks/" + std::to_string(fields), [=](benchmark::State& state) {
            const KpBitfield mask(nVoxels * static_cast<unsigned long>(fields), KpBitfield::INIT_SET);
            auto* words = reinterpret_cast<const std::uint64_t*>(mask.data());
            for (auto _ : state) {
                std::uint64_t sums[8] = {};
                for (unsigned long i = 0; i < mask.nBits() / 64; i += 8)
                    for (unsigned long k = 0; k < 8; ++k)
                        sums[k] ^= words[i + k];
                benchmark::DoNotOptimize(sums);
            }
            report(state, static_cast<double>(mask.nBits()), maskBytes * fields);
        });
    }
    add("copy of 1.5 masks", [](benchmark::State& state) {
        const std::size_t bytes = nVoxels / 8 / 2 * 3;
        const Memory from = touched(bytes), to = touched(bytes);
        for (auto _ : state) {
            std::memcpy(to.get(), from.get(), bytes);
            benchmark::ClobberMemory();
        }
        report(state, nVoxels, 3 * maskBytes);
    });
}

/// `ask(a, b)` of masks that hold it up to the last bit.
template <typename Ask>
void addQuestion(const std::string& name, int fields, KpBitfield::INIT init, unsigned long expected, Ask ask)
{
    add(name, [=](benchmark::State& state) {
        const KpBitfield a(nVoxels, init), b(nVoxels, init);
        unsigned long answer = 0;
        for (auto _ : state)
            benchmark::DoNotOptimize(answer = ask(a, b));
        if (answer != expected)
            state.SkipWithError("wrong answer");
        report(state, nVoxels, maskBytes * fields, "xor of masks/" + std::to_string(fields), 1.2);
    });
}

void addQuestions()
{
    using F = KpBitfield;
    const F::INIT unset = F::INIT_UNSET, set = F::INIT_SET;
    addQuestion("nSetBits", 1, set, nVoxels, [](const F& a, const F&) { return a.nSetBits(); });
    addQuestion("firstSetBit", 1, unset, nVoxels, [](const F& a, const F&) { return a.firstSetBit(); });
    addQuestion("lastSetBit", 1, unset, nVoxels, [](const F& a, const F&) { return a.lastSetBit(); });
    addQuestion("firstUnsetBit", 1, set, nVoxels, [](const F& a, const F&) { return a.firstUnsetBit(); });
    addQuestion("operator==", 2, set, 1, [](const F& a, const F& b) { return a == b; });
    addQuestion("isSuperset", 2, set, 1, [](const F& a, const F& b) { return a.isSuperset(b); });
    addQuestion("hasIntersection", 2, unset, 0, [](const F& a, const F& b) { return a.hasIntersection(b); });
}

template <typename Combine>
void addLogic(const std::string& name, Combine combine)
{
    add(name, [=](benchmark::State& state) {
        KpBitfield a = sparse();
        const KpBitfield b(nVoxels, KpBitfield::INIT_SET);
        for (auto _ : state) {
            combine(a, b);
            benchmark::ClobberMemory();
        }
        report(state, nVoxels, 3 * maskBytes, "copy of 1.5 masks", 1.2);
    });
}

/// Labels of a segmented volume: runs of 0 to 3, which change every few voxels.
Memory someLabels()
{
    Memory labels = touched(nVoxels);
    std::minstd_rand random(1);
    for (unsigned long i = 0, left = 0; i < nVoxels; ++i, --left) {
        left = left == 0 ? 1 + random() % 40 : left;
        labels.get()[i] =
            static_cast<char>(i == 0 || left == 1 ? random() % 4 : static_cast<unsigned>(labels.get()[i - 1]));
    }
    return labels;
}

unsigned char* bytesOf(const Memory& labels)
{
    return reinterpret_cast<unsigned char*>(labels.get());
}

void addLabels()
{
    const std::string copy = copyBaseline(2 * nVoxels);
    for (unsigned char label : {0, 2}) {
        add("fromLabels/" + std::to_string(label), [=](benchmark::State& state) {
            const Memory labels = someLabels();
            KpBitfield mask = sparse();
            for (auto _ : state) {
                mask.fromLabels(nVoxels, bytesOf(labels), label);
                benchmark::ClobberMemory();
            }
            report(state, nVoxels, 2.0 * nVoxels, copy, 1.2);
        });
    }
    for (int policy = KpBitfield::INSERT_SET; policy <= KpBitfield::INSERT_OWN; ++policy) {
        add("toLabels/" + std::to_string(policy), [=](benchmark::State& state) {
            const Memory labels = someLabels();
            KpBitfield mask;
            mask.fromLabels(nVoxels, bytesOf(labels), 2);
            for (auto _ : state) {
                mask.toLabels(nVoxels, bytesOf(labels), 3, KpBitfield::InsertPolicy(policy));
                benchmark::ClobberMemory();
            }
            report(state, nVoxels, 2.0 * nVoxels, copy, 1.2);
        });
    }
}

/// Each row of a table on a mask of 64 Ki labels or 1 Mi bits, against its plain one.
template <typename Function, typename Run>
void addRows(const std::string& name, std::span<const KernelPath<Function>> paths, Run run)
{
    for (const auto& path : paths) {
        if (path.usable)
            add(name + "/64Ki/" + path.name, [=](benchmark::State& state) {
                KpBitfield a(32 * fewVoxels, KpBitfield::INIT_UNSET), b = a;
                const Memory labels = touched(fewVoxels);
                for (auto _ : state) {
                    run(path.run, a.data(), b.data(), bytesOf(labels));
                    benchmark::ClobberMemory();
                }
                report(state, fewVoxels, fewVoxels, name + "/64Ki/plain");
            });
    }
}

void addAllRows()
{
    addRows("countBits", countPaths(),
            [](auto* f, auto* a, auto*, auto*) { benchmark::DoNotOptimize(f(a, fewVoxels)); });
    addRows("findFirst", findFirstPaths(),
            [](auto* f, auto* a, auto*, auto*) { benchmark::DoNotOptimize(f(a, fewVoxels, 0)); });
    addRows("findLast", findLastPaths(),
            [](auto* f, auto* a, auto*, auto*) { benchmark::DoNotOptimize(f(a, fewVoxels, 0)); });
    addRows("combine", combinePaths<BitAnd>(), [](auto* f, auto* a, auto* b, auto*) { f(a, b, fewVoxels); });
    addRows("any", anyPaths<BitsMissing>(),
            [](auto* f, auto* a, auto* b, auto*) { benchmark::DoNotOptimize(f(a, b, fewVoxels)); });
    addRows("fromLabels", fromLabelsPaths(), [](auto* f, auto* a, auto*, auto* labels) { f(a, labels, fewVoxels, 1); });
    for (auto policy :
         {KpBitfield::INSERT_SET, KpBitfield::INSERT_INTO_EMPTY, KpBitfield::INSERT_REPLACE, KpBitfield::INSERT_OWN}) {
        addRows("toLabels/" + std::to_string(policy), toLabelsPaths(), [=](auto* f, auto* a, auto*, auto* labels) {
            a[0] = ~0U;
            std::fill_n(a, fewVoxels / 32, 0x0FF0F00F);
            f(policy)(a, labels, fewVoxels, 2);
        });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    addBaselines();
    addQuestions();
    addLogic("operator&=", [](KpBitfield& a, const KpBitfield& b) { a &= b; });
    addLogic("operator|=", [](KpBitfield& a, const KpBitfield& b) { a |= b; });
    addLogic("operator^=", [](KpBitfield& a, const KpBitfield& b) { a ^= b; });
    addLabels();
    addAllRows();
    return true;
}();

}  // namespace
