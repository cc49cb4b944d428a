#include "RemoteVolume.h"

#include "../commands/Abort.h"
#include "VolumeHead.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/threads/KpWorkerThread.h>
#include <kplib/threads/ProgressScope.h>

#include <array>
#include <atomic>

namespace {

constexpr unsigned long longestHead = 1UL << 26;

/// Exactly the bytes of a range, if the server still has the connection open.
KpResult readRangeOnce(KpHttpGet& http, const std::string& url, unsigned long first, unsigned long count, void* out)
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

/// The same; a server that has closed after its last answer is asked once more over a new connection.
KpResult readRange(KpHttpGet& http, const std::string& url, unsigned long first, unsigned long count, void* out)
{
    const bool wasOpen = http.state() == KpHttpGet::Finished;
    KpResult read = readRangeOnce(http, url, first, count, out);
    if (read.isBad() && wasOpen && http.status() == 0) {
        http.cancel();
        read = readRangeOnce(http, url, first, count, out);
    }
    return read;
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
        const auto bytes = static_cast<unsigned long>(volume_.sliceBytes());
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

KpResult readSlices(SliceReader& reader, long slices, KpProgressInterface& progress, Silence& silence)
{
    constexpr unsigned long often = 50;  // ms between two looks at progress and Ctrl-C
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(slices), "");
    reader.start(false);
    long shown = 0;
    const auto show = [&] {
        for (; shown < reader.slicesRead(); ++shown) {
            progress.nextStep();
            silence.heard();
        }
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

KpResult readRemote(const std::string& url, int timeout, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root)
{
    if (url.compare(0, 7, "http://") != 0)
        return badInput("'%s' is not an address that can be read: only http:// is supported", url.c_str());
    Silence silence(timeout, "'" + url + "' was silent for " + std::to_string(timeout) + " s; see --timeout");
    KpHttpGet http;
    VolumePrefix prefix{};
    if (KpResult read = readRange(http, url, 0, sizeof prefix, &prefix); read.isBad())
        return read;
    if (prefix.mark != volumeMark || prefix.headSize > longestHead)
        return badInput("'%s' is not an exported volume; make one with: volume-road export SERIES FILE", url.c_str());
    TmMsg head;
    head.resize(prefix.headSize);
    if (KpResult read = readRange(http, url, sizeof prefix, prefix.headSize, head.dataPtr()); read.isBad())
        return read;
    if (!readHead(head, series, volume, root))
        return badInput("the head of '%s' is damaged", url.c_str());
    const unsigned long offset = sizeof prefix + prefix.headSize;
    const auto size = static_cast<unsigned long>(volume.dims[2] * volume.sliceBytes());
    char last = 0;  // a server that has it has them all: the head alone does not decide on the memory that is taken
    if (KpResult read = readRange(http, url, offset + size - 1, 1, &last); read.isBad())
        return read;
    volume.allocate();
    SliceReader reader(url, offset, http, volume);
    return readSlices(reader, volume.dims[2], progress, silence);
}
