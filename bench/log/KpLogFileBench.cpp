#include <support/Bench.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/log/detail/KpLogFilePrivate.h>

#include <fcntl.h>
#include <unistd.h>

#include <memory>

// A line of some 60 bytes goes to a file of a memory file system, and is flushed. The baseline is the one system call
// that this can't do without.

namespace {

const char path[] = "/dev/shm/kplib-log-bench";
const char text[] = "volume 17: 512 x 512 x 300 voxels";
const std::string line = "14:03:59.120: W [Dicom] " + std::string(text) + "\n";

// Files stay small, so that both sides write into memory that is there.
constexpr long linesPerFile = 10000;

template <typename Rewind>
void rewindNowAndThen(long& lines, Rewind rewind)
{
    if (++lines % linesPerFile == 0)
        rewind();
}

void writeCall(benchmark::State& state)
{
    const int file = open(path, O_WRONLY | O_CREAT | O_TRUNC, 0600);
    long lines = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(write(file, line.data(), line.size()));
        rewindNowAndThen(lines, [&] { lseek(file, 0, SEEK_SET); });
    }
    close(file);
    unlink(path);
    kplib::bench::report(state, 1, static_cast<double>(line.size()));
}

template <typename Write>
void logLine(benchmark::State& state, Write writeTo)
{
    const std::unique_ptr<KpLogFile> log(KpLogFile::createInstance());
    KpLogFilePrivate& record = kplib::detail::logRecord(*log);
    record.file = std::fopen(path, "w");
    long lines = 0;
    for (auto _ : state) {
        writeTo(*log);
        rewindNowAndThen(lines, [&] { std::rewind(record.file); });
    }
    if (record.bytesWritten != line.size() * static_cast<size_t>(state.iterations()))
        state.SkipWithError("wrong number of bytes");
    unlink(path);
    kplib::bench::report(state, 1, static_cast<double>(line.size()), "write", 2.0);
}

void traceLine(benchmark::State& state)
{
    logLine(state, [](KpLogFile& log) { log.trace(KpLogWarning, "Dicom", text); });
}

void formattedLine(benchmark::State& state)
{
    logLine(state, [](KpLogFile& log) {
        log.tracef(KpLogWarning, "Dicom", "volume %d: %d x %d x %d voxels", 17, 512, 512, 300);
    });
}

}  // namespace

BENCHMARK(writeCall)->Name("write");
BENCHMARK(traceLine)->Name("KpLogFile/trace");
BENCHMARK(formattedLine)->Name("KpLogFile/tracef");
