#include <support/Bench.h>

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpCoder.h>
#include <kplib/system/detail/CoderKernels.h>

#include <cstring>
#include <openssl/evp.h>
#include <random>
#include <vector>

// Digests against those of a crypto library, the checksum and the digits against a copy of the bytes they read or
// write.

using kplib::bench::report;
using namespace kplib::detail;

namespace {

using Bytes = std::vector<unsigned char>;
using Digest = std::array<unsigned char, 16>;

constexpr long large = 64L << 20, small = 1 << 10, megabyte = 1 << 20;

Bytes noise(long size)
{
    std::mt19937_64 random(9);
    Bytes bytes(static_cast<size_t>(size));
    for (size_t i = 0; i < bytes.size(); i += 8) {
        const std::uint64_t word = random();
        std::memcpy(bytes.data() + i, &word, 8);
    }
    return bytes;
}

Digest evpMD5(const Bytes& bytes)
{
    Digest digest;
    EVP_Digest(bytes.data(), bytes.size(), digest.data(), nullptr, EVP_md5(), nullptr);
    return digest;
}

Digest coderMD5(const Bytes& bytes)
{
    Digest digest;
    KpCoder coder;
    coder.crcMD5Update(bytes.data(), static_cast<unsigned int>(bytes.size()));
    coder.crcMD5Final();
    coder.crcMD5Query(digest.data());
    return digest;
}

void md5(benchmark::State& state, Digest (*compute)(const Bytes&), long size, const char* baseline, double limit)
{
    const Bytes bytes = noise(size);
    for (auto _ : state)
        benchmark::DoNotOptimize(compute(bytes));
    if (compute(bytes) != evpMD5(bytes))
        state.SkipWithError("another digest");
    report(state, 1, static_cast<double>(size), baseline, limit);
}
BENCHMARK_CAPTURE(md5, evp_64M, evpMD5, large, "", 0);
BENCHMARK_CAPTURE(md5, coder_64M, coderMD5, large, "md5/evp_64M", 1.05);
BENCHMARK_CAPTURE(md5, evp_1K, evpMD5, small, "", 0);
BENCHMARK_CAPTURE(md5, coder_1K, coderMD5, small, "md5/evp_1K", 1.05);

void copy(benchmark::State& state, long size)
{
    const Bytes bytes = noise(size);
    Bytes to(bytes.size());
    for (auto _ : state) {
        std::memcpy(to.data(), bytes.data(), bytes.size());
        benchmark::ClobberMemory();
    }
    report(state, static_cast<double>(size), static_cast<double>(size));
}

void crcPath(benchmark::State& state, KernelPath<CrcLoop> path, long size, const std::string& baseline)
{
    const Bytes bytes = noise(size);
    for (auto _ : state)
        benchmark::DoNotOptimize(path.run(0, bytes.data(), size));
    if (path.run(0, bytes.data(), size) != crcPaths()[0].run(0, bytes.data(), size))
        state.SkipWithError("another checksum");
    report(state, static_cast<double>(size), static_cast<double>(size), baseline);
}

void hexPath(benchmark::State& state, HexLoop* run, const std::string& baseline)
{
    const Bytes bytes = noise(megabyte);
    std::vector<char> text(2 * megabyte);
    for (auto _ : state) {
        run(bytes.data(), text.data(), megabyte, 'A');
        benchmark::ClobberMemory();
    }
    report(state, megabyte, 2 * megabyte, baseline);
}

void hexString(benchmark::State& state, const char* baseline)
{
    const Bytes bytes = noise(megabyte);
    KpString text;
    for (auto _ : state) {
        KpCoder::dataToHexString(bytes.data(), megabyte, text, true);
        benchmark::ClobberMemory();
    }
    report(state, megabyte, 2 * megabyte, baseline, 1.5);
}
BENCHMARK_CAPTURE(hexString, whole, "copy/2M");

const bool registered = [] {
    for (const auto& [name, size] : {std::pair("64M", large), std::pair("2M", 2 * megabyte), std::pair("1K", small)}) {
        benchmark::RegisterBenchmark((std::string("copy/") + name).c_str(), copy, size);
        for (const auto& path : crcPaths()) {
            if (path.usable)
                benchmark::RegisterBenchmark((std::string("crc/") + path.name + "/" + name).c_str(), crcPath, path,
                                             size, std::string("copy/") + name);
        }
    }
    for (const auto& path : hexPaths()) {
        if (path.usable)
            benchmark::RegisterBenchmark((std::string("hex/") + path.name).c_str(), hexPath, path.run, "copy/2M");
    }
    return true;
}();

}  // namespace
