#include "RemoteVolume.h"

#include "Parcel.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/KpWorkerThread.h>
#include <kplib/threads/ProgressScope.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>

namespace {

constexpr unsigned int mark = 0x57'41'52'56;  // "VRAW" in the file
constexpr unsigned long longestHead = 1UL << 26;

/// What stands first in the file.
struct Prefix {
    unsigned int mark;
    unsigned int headSize;
};

void writeHead(TmMsg& msg, const Series& series, const Volume& volume, const HxParamBundle& root)
{
    TmMsg head;
    head << static_cast<int>(series.slices.size()) << series.frameUid();
    writeTree(head, root);
    writeGeometry(head, volume);
    msg << mark << static_cast<unsigned int>(head.size());
    msg.writeRawBytes(head.size(), head.dataPtr());
}

bool readHead(TmMsg& head, Series& series, Volume& volume, HxParamBundle& root)
{
    int images = 0;
    SliceFile slice;
    head >> images >> slice.frameUid;
    if (images < 1 || images > 1 << 16)
        return false;
    series.slices.assign(static_cast<size_t>(images), slice);
    return readTree(head, root) && readGeometry(head, volume) && head.readOffset() == head.size();
}

/// Whether all bytes are in the file, and it is closed.
bool writeFile(const std::string& file, const TmMsg& head, Volume& volume)
{
    FILE* const stream = std::fopen(file.c_str(), "wb");
    if (!stream)
        return false;
    const auto bytes = static_cast<unsigned long>(volume.bytes.size());
    const bool isWritten =
        KpRawData::fwrite(const_cast<unsigned char*>(head.dataPtr()), 1, head.size(), stream) == head.size() &&
        KpRawData::fwrite(volume.bytes.data(), 1, bytes, stream) == bytes;
    return std::fclose(stream) == 0 && isWritten;
}

/// Exactly the bytes of a range.
KpResult readRange(KpHttpGet& http, const std::string& url, unsigned long first, unsigned long count, void* out)
{
    constexpr int partialContent = 206;
    if (!http.request(url.c_str(), first, first + count - 1))
        return badInput("can't ask '%s': %s", url.c_str(), http.errorText().c_str());
    const long long length = http.contentLength();
    if (http.status() != partialContent || length != static_cast<long long>(count))
        return badInput("'%s' gives status %d and %lld bytes in place of %lu: %s", url.c_str(), http.status(), length,
                        count, http.errorText().c_str());
    if (http.read(out, count) != static_cast<long>(count))
        return badInput("'%s' ends too early: %s", url.c_str(), http.errorText().c_str());
    return KpResult();
}

/// Fetches the slices, one range each, on its own thread.
class SliceReader : public KpWorkerThread {
public:
    SliceReader(const std::string& url, unsigned long offset, KpHttpGet& http, Volume& volume) :
        KpWorkerThread("slices over HTTP"), url_(url), offset_(offset), http_(http), volume_(volume)
    {
    }
    ~SliceReader() override { terminate(); }

    void compute() override
    {
        const auto bytes = static_cast<unsigned long>(volume_.sliceCount() * volume_.type.size());
        for (long z = 0; z < volume_.dims[2] && result_.isOk() && !canceled(); ++z) {
            result_ =
                readRange(http_, url_, offset_ + static_cast<unsigned long>(z) * bytes, bytes, volume_.slice(z).data);
            ++read_;
        }
    }

    /// Ends the pass, and a read that waits for the server.
    void stop()
    {
        cancel();
        http_.cancel();
    }

    long slicesRead() const { return read_; }
    const KpResult& result() const { return result_; }  ///< when the pass is over

private:
    std::string url_;
    unsigned long offset_;
    KpHttpGet& http_;
    Volume& volume_;
    std::atomic<long> read_ = 0;
    KpResult result_;
};

KpResult readSlices(SliceReader& reader, long slices, KpProgressInterface& progress)
{
    constexpr unsigned long often = 50;  // ms between two looks at progress and Ctrl-C
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(slices), "");
    reader.start(false);
    long shown = 0;
    const auto show = [&] {
        for (; shown < reader.slicesRead(); ++shown)
            progress.nextStep();
    };
    bool timedOut = false;
    while (reader.wait(timedOut, often) && timedOut) {
        show();
        if (progress.isCanceled())
            reader.stop();
    }
    show();
    return progress.isCanceled() ? KpResult() : reader.result();
}

}  // namespace

KpResult exportVolume(const std::string& folder, const std::string& uid, const std::string& file,
                      KpProgressInterface& progress)
{
    Series series;
    Volume volume;
    HxParamBundle root("Volume");
    const ProgressScope scope(&progress);
    progress.startWorking(2, "export");
    KpResult result = scanSeries(folder.c_str(), uid, progress, series);
    if (result.isOk())
        result << readSeries(series, progress, volume, root);
    if (progress.isCanceled())
        return KpResult(KpResult::Interrupted, "cancelled, nothing was written", nullptr);
    if (result.isBad())
        return result;
    TmMsg head;
    writeHead(head, series, volume, root);
    const std::string unfinished = file + ".part";
    if (writeFile(unfinished, head, volume) && std::rename(unfinished.c_str(), file.c_str()) == 0)
        return KpResult();
    KpResult failure = badInput("can't write '%s': %s", file.c_str(), std::strerror(errno));
    std::remove(unfinished.c_str());
    return failure;
}

KpResult readRemote(const std::string& url, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root)
{
    KpHttpGet http;
    Prefix prefix{};
    if (KpResult read = readRange(http, url, 0, sizeof prefix, &prefix); read.isBad())
        return read;
    if (prefix.mark != mark || prefix.headSize > longestHead)
        return badInput("'%s' is no volume of ours; export one with: volume-road export SERIES FILE", url.c_str());
    TmMsg head;
    head.resize(prefix.headSize);
    if (KpResult read = readRange(http, url, sizeof prefix, prefix.headSize, head.dataPtr()); read.isBad())
        return read;
    if (!readHead(head, series, volume, root))
        return badInput("the head of '%s' is damaged", url.c_str());
    volume.allocate();
    SliceReader reader(url, sizeof prefix + prefix.headSize, http, volume);
    return readSlices(reader, volume.dims[2], progress);
}
