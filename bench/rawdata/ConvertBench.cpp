#include "PlainConvert.h"
#include "Volumes.h"

#include <kplib/cpu/ElementConvert.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

// Conversions against a copy of the bytes that they read and write, and in cache against the plain loop.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

template <typename T>
KpTypedPointer typed(const Memory& memory)
{
    return reinterpret_cast<T*>(memory.get());
}

template <typename To, typename From>
bool isConverted(const Memory& dst, const Memory& src, long n)
{
    for (long i = 0; i < n; ++i) {
        if (reinterpret_cast<To*>(dst.get())[i] != converted<To>(reinterpret_cast<From*>(src.get())[i]))
            return false;
    }
    return true;
}

/// Measures `run(dst, src)`, which converts `n` elements.
template <typename To, typename From, typename Run>
void convertWith(benchmark::State& state, long n, const std::string& baseline, double limit, Run run)
{
    const Memory src = noise<From>(n), dst = touched(n * static_cast<long>(sizeof(To)));
    for (auto _ : state) {
        run(typed<To>(dst), typed<From>(src));
        benchmark::ClobberMemory();
    }
    if (!isConverted<To, From>(dst, src, n))
        state.SkipWithError("wrong values");
    report(state, static_cast<double>(n), static_cast<double>(n) * (sizeof(To) + sizeof(From)), baseline, limit);
}

template <typename To, typename From>
void addConversion(const std::string& pair)
{
    const std::string copy = copyBaseline(manyVoxels * static_cast<long>(sizeof(To) + sizeof(From)));
    add("memcpy/" + pair + "/64Mi", [=](benchmark::State& state) {
        convertWith<To, From>(state, manyVoxels, copy, 1.3,
                              [](auto dst, auto src) { KpRawData::memcpy(dst, src, manyVoxels); });
    });
    const std::string plain = "plain -O2/" + pair + "/64Ki";
    add(plain, [](benchmark::State& state) {
        convertWith<To, From>(state, fewVoxels, "", 0, [](auto dst, auto src) {
            plainConvert(static_cast<To*>(dst.data), static_cast<const From*>(src.data), fewVoxels);
        });
    });
    for (const auto& path : convertPaths()) {
        if (!path.usable)
            continue;
        add("memcpy/" + pair + "/64Ki/" + path.name, [=](benchmark::State& state) {
            convertWith<To, From>(
                state, fewVoxels, plain, path.run == best(convertPaths()) ? 1.0 / 3 : 0,
                [&](auto dst, auto src) { path.run(dst.type, src.type)(dst.data, src.data, fewVoxels); });
        });
    }
}

template <typename To, typename From>
void addMap(const std::string& pair)
{
    const std::string copy = copyBaseline(manyVoxels * static_cast<long>(sizeof(To) + sizeof(From)));
    const auto addRun = [=](const std::string& name, long n, double limit, auto map) {
        add(name, [=](benchmark::State& state) {
            const Memory src = noise<From>(n), dst = touched(n * static_cast<long>(sizeof(To)));
            for (auto _ : state) {
                map(typed<To>(dst), typed<From>(src));
                benchmark::ClobberMemory();
            }
            for (long i = 0; i < n; ++i) {
                const float mapped = (static_cast<float>(reinterpret_cast<From*>(src.get())[i]) + 20.0f) * 0.75f;
                if (reinterpret_cast<To*>(dst.get())[i] != converted<To>(mapped))
                    return state.SkipWithError("wrong values");
            }
            report(state, static_cast<double>(n), static_cast<double>(n) * (sizeof(To) + sizeof(From)),
                   n == manyVoxels ? copy : "mapLinear/" + pair + "/64Ki/plain", limit);
        });
    };
    addRun("mapLinear/" + pair + "/64Mi", manyVoxels, 1.4,
           [](auto dst, auto src) { KpRawData::mapLinear(dst, src, manyVoxels, 20, 0.75); });
    for (const auto& path : mapPaths()) {
        if (path.usable)
            addRun("mapLinear/" + pair + "/64Ki/" + path.name, fewVoxels, 0,
                   [=](auto dst, auto src) { path.run(dst.type, src.type)(dst.data, src.data, fewVoxels, 20, 0.75); });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    addConversion<std::uint8_t, std::uint16_t>("ushort-byte");
    addConversion<std::int16_t, float>("float-short");
    addConversion<std::uint8_t, double>("double-byte");
    addConversion<float, std::int16_t>("short-float");
    addMap<std::int16_t, std::int16_t>("short-short");
    addMap<std::uint8_t, std::uint16_t>("ushort-byte");
    return true;
}();

}  // namespace
