#include <support/Bench.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/log/detail/KpLogFilePrivate.h>
#include <kplib/system/KpTmpDir.h>

#include <fcntl.h>
#include <unistd.h>

#include <memory>
#include <thread>
#include <vector>

// A line of some 60 bytes goes to a file of a memory file system, and is flushed. The baseline is the one system call
// that each line needs.

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
    record.file = open(path, O_CREAT | O_TRUNC | O_WRONLY | O_CLOEXEC, 0600);
    log->setMaxLogFileSizeInBytes(0);
    long lines = 0;
    for (auto _ : state) {
        writeTo(*log);
        rewindNowAndThen(lines, [&] { lseek(record.file, 0, SEEK_SET); });
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

// The same number of lines into a log with files of 1 MB, by some threads at once.
void sharedLog(benchmark::State& state, const std::string& baseline, double limit)
{
    constexpr int lines = 32000;
    KpTmpDir folder("/dev/shm/kplib-log-bench", true, true);
    const std::unique_ptr<KpLogFile> log(KpLogFile::createInstance());
    log->setBaseFolder(folder.path().c_str());
    log->setMaxLogFileSizeInBytes(1000000);
    if (!log->open(false))
        state.SkipWithError("no file");
    const auto threads = static_cast<size_t>(state.range(0));
    for (auto _ : state) {
        std::vector<std::jthread> writers(threads);
        for (std::jthread& writer : writers)
            writer = std::jthread([&log, threads] {
                for (size_t i = 0; i < lines / threads; ++i)
                    log->trace(KpLogWarning, "Dicom", text);
            });
    }
    if (!log->isOpen())
        state.SkipWithError("the file was lost");
    kplib::bench::report(state, lines, static_cast<double>(lines * line.size()), baseline, limit);
}

}  // namespace

BENCHMARK_CAPTURE(sharedLog, , "", 0)->Name("threads")->Arg(1)->UseRealTime();
BENCHMARK_CAPTURE(sharedLog, , "threads/1", 1.3)->Name("KpLogFile/threads")->Arg(8)->UseRealTime();
BENCHMARK(writeCall)->Name("write");
BENCHMARK(traceLine)->Name("KpLogFile/trace");
BENCHMARK(formattedLine)->Name("KpLogFile/tracef");
