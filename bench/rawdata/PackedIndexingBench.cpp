#include "Volumes.h"

#include <kplib/rawdata/KpPackedIndexing.h>
#include <kplib/rawdata/KpSuperPackedIndexing.h>
#include <kplib/volume/KpBitfield.h>

// Numbers for the flagged positions of a volume, which are noise (short runs, the worst) or lie in runs as in a mask,
// against a loop that counts position by position, as one writes it.

using namespace kplib::bench;

namespace {

constexpr int nPositions = 1 << 24;

/// Runs of `length` positions on average; a byte each, 0 or 5.
Memory flagsInRuns(unsigned length)
{
    Memory flags = touched(nPositions);
    std::minstd_rand random(1);
    char value = 0;
    for (long i = 0; i < nPositions; ++i) {
        if (random() % length == 0)
            value = static_cast<char>(5 - value);
        flags.get()[i] = value;
    }
    return flags;
}

template <typename Work>
void addOn(const std::string& name, unsigned length, double limit, Work work)
{
    add(name + "/runs of " + std::to_string(length), [=](benchmark::State& state) {
        const Memory flags = flagsInRuns(length);
        auto* bytes = reinterpret_cast<unsigned char*>(flags.get());
        const long expected = nPositions - std::count(bytes, bytes + nPositions, 0);
        long count = 0;
        work(state, bytes, count);
        if (count != expected)
            state.SkipWithError("wrong count");
        report(state, nPositions, nPositions, limit > 0 ? "one by one/runs of " + std::to_string(length) : "", limit);
    });
}

[[maybe_unused]] const bool isRegistered = [] {
    for (unsigned length : {2, 40}) {
        addOn("one by one", length, 0, [](benchmark::State& state, unsigned char* flags, long& count) {
            const Memory offsets = touched(nPositions), bases = touched(nPositions / 64);
            for (auto _ : state) {
                count = 0;
                for (int i = 0; i < nPositions; ++i) {
                    auto& base = reinterpret_cast<int*>(bases.get())[i / 256];
                    if (i % 256 == 0)
                        base = static_cast<int>(count);
                    offsets.get()[i] = flags[i] != 0 ? static_cast<char>(count++ - base) : 0;
                }
                benchmark::ClobberMemory();
            }
        });
        addOn("packed from flags", length, 1, [](benchmark::State& state, unsigned char* flags, long& count) {
            for (auto _ : state)
                count = KpPackedIndexing(flags, nPositions).count();
        });
        addOn("packed from bits", length, 1, [](benchmark::State& state, unsigned char* flags, long& count) {
            KpBitfield bits;
            bits.fromLabels(nPositions, flags, 5);
            for (auto _ : state)
                count = KpPackedIndexing(bits).count();
        });
        addOn("appendIndexSpace", length, 1, [](benchmark::State& state, unsigned char* flags, long& count) {
            for (auto _ : state) {
                KpSuperPackedIndexing indexing;
                indexing.appendIndexSpace(flags, nPositions);
                count = indexing.nFlagged();
            }
        });
    }
    return true;
}();

}  // namespace
