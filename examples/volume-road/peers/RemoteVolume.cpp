#include "RemoteVolume.h"

#include "../commands/Abort.h"
#include "Parcel.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/KpWorkerThread.h>
#include <kplib/threads/ProgressScope.h>

#include <nlohmann/json.hpp>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <sys/stat.h>

using Json = nlohmann::ordered_json;

namespace {

constexpr unsigned int mark = 0x58'41'52'56;  // "VRAX" in the file
constexpr unsigned long longestHead = 1UL << 26;

/// What stands first in the file.
struct Prefix {
    unsigned int mark;
    unsigned int headSize;
};

void writeTexts(TmMsg& msg, const std::vector<std::string>& texts)
{
    msg << static_cast<int>(texts.size());
    for (const std::string& text : texts)
        msg << text;
}

bool readTexts(TmMsg& msg, std::vector<std::string>& texts)
{
    int count = 0;
    msg >> count;
    for (int i = 0; i < count; ++i) {
        if (!msg.holds(1))
            return false;
        msg >> texts.emplace_back();
    }
    return count >= 0;
}

void writeWindows(TmMsg& msg, const Windows& windows)
{
    std::vector<std::string> texts;
    for (const KpWindowLevel& preset : windows.presets)
        texts.insert(texts.end(), {preset.centerString(), preset.widthString(), preset.explanation()});
    writeTexts(msg, texts);
    msg << static_cast<int>(windows.function) << windows.isInverted << windows.origin;
}

bool readWindows(TmMsg& msg, Windows& windows)
{
    std::vector<std::string> texts;
    int function = 0;
    const bool isWhole = readTexts(msg, texts) && texts.size() % 3 == 0;
    msg >> function >> windows.isInverted >> windows.origin;
    for (size_t i = 0; isWhole && i < texts.size(); i += 3)
        windows.presets.emplace_back(texts[i], texts[i + 1], texts[i + 2]);
    windows.function = static_cast<Window::Function>(function);
    return isWhole && function >= Window::Linear && function <= Window::Sigmoid;
}

void writeHead(TmMsg& msg, const Series& series, const Volume& volume, const HxParamBundle& root)
{
    TmMsg head;
    head << static_cast<int>(series.planes.size()) << series.frameUid();
    writeTree(head, root);
    writeGeometry(head, volume);
    writeWindows(head, series.windows);
    writeTexts(head, series.warnings);
    msg << mark << static_cast<unsigned int>(head.size());
    msg.writeRawBytes(head.size(), head.dataPtr());
}

bool readHead(TmMsg& head, Series& series, Volume& volume, HxParamBundle& root)
{
    int images = 0;
    Image plane;
    head >> images >> plane.frameUid;
    if (images < 1 || images > 1 << 16)
        return false;
    series.planes.assign(static_cast<size_t>(images), plane);
    return readTree(head, root) && readGeometry(head, volume) && readWindows(head, series.windows) &&
           readTexts(head, series.warnings) && head.readOffset() == head.size();
}

/// Whether all bytes are in the stream.
bool writeTo(FILE* stream, const TmMsg& head, Volume& volume)
{
    const auto bytes = static_cast<unsigned long>(volume.bytes.size());
    return KpRawData::fwrite(head.dataPtr(), 1, head.size(), stream) == head.size() &&
           KpRawData::fwrite(volume.bytes.data(), 1, bytes, stream) == bytes && std::fflush(stream) == 0;
}

KpResult cannotWrite(const std::string& file)
{
    return badInput("can't write '%s': %s", file.c_str(), std::strerror(errno));
}

/// Writes by `write` into what is at the path; a regular file is replaced at the end.
template <typename Write>
KpResult writeFile(const std::string& file, Write write)
{
    if (file == "-")
        return write(stdout) ? KpResult() : cannotWrite("standard output");
    struct stat info {};
    const bool isThere = lstat(file.c_str(), &info) == 0;
    const bool isReplaced = !isThere || S_ISREG(info.st_mode);
    const std::string path = isReplaced ? file + ".part" : file;
    Unfinished unfinished;
    FILE* const stream = std::fopen(path.c_str(), "wb");
    if (!stream)
        return cannotWrite(file);
    if (isReplaced)
        unfinished.remember(path);
    bool isWritten = write(stream);
    int cause = errno;
    if (std::fclose(stream) != 0) {
        cause = isWritten ? errno : cause;
        isWritten = false;
    }
    errno = cause;
    const Publishing publishing;
    if (isWritten && (!isReplaced || std::rename(path.c_str(), file.c_str()) == 0))
        return KpResult();
    KpResult failure = cannotWrite(file);
    if (isReplaced)
        std::remove(path.c_str());
    return failure;
}

Json vectorJson(const KpVec3d& v)
{
    return {v[0], v[1], v[2]};
}

/// Where each slice is in the file and in the patient.
std::string description(const Series& series, const Volume& volume, unsigned long offset)
{
    Json slices = Json::array();
    for (long z = 0; z < volume.dims[2]; ++z) {
        const Image& plane = series.planes[static_cast<size_t>(z)];
        slices.push_back({{"file", plane.path},
                          {"frame", plane.frame},
                          {"tile", plane.tile},
                          {"instance", plane.instanceUid},
                          {"position", vectorJson(volume.slicePosition(z))}});
    }
    const Json json{{"offset", offset},
                    {"dims", {volume.dims[0], volume.dims[1], volume.dims[2]}},
                    {"components", volume.components},
                    {"type", volume.type.name()},
                    {"row", vectorJson(volume.axes[0])},
                    {"column", vectorJson(volume.axes[1])},
                    {"step", vectorJson(volume.axes[2])},
                    {"spacing", vectorJson(volume.spacing)},
                    {"tilt", volume.tilt()},
                    {"placed", volume.isPlaced},
                    {"scaled", volume.isScaled},
                    {"slope", volume.slope},
                    {"intercept", volume.intercept},
                    {"volume", series.volume},
                    {"volumes", series.volumes},
                    {"label", series.label},
                    {"slices", slices}};
    return json.dump(1, ' ', false, Json::error_handler_t::replace) + "\n";
}

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

KpResult writeRemote(const std::string& file, const std::string& describe, const Series& series, Volume& volume,
                     const HxParamBundle& root)
{
    TmMsg head;
    writeHead(head, series, volume, root);
    KpResult written = writeFile(file, [&](FILE* stream) { return writeTo(stream, head, volume); });
    if (written.isBad() || describe.empty())
        return written;
    const std::string text = description(series, volume, head.size());
    return writeFile(describe, [&](FILE* stream) {
        return std::fwrite(text.data(), 1, text.size(), stream) == text.size() && std::fflush(stream) == 0;
    });
}

KpResult readRemote(const std::string& url, int timeout, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root)
{
    if (url.compare(0, 7, "http://") != 0)
        return badInput("'%s' is not an address that can be read: only http:// is supported", url.c_str());
    Silence silence(timeout, "'" + url + "' was silent for " + std::to_string(timeout) + " s; see --timeout");
    KpHttpGet http;
    Prefix prefix{};
    if (KpResult read = readRange(http, url, 0, sizeof prefix, &prefix); read.isBad())
        return read;
    if (prefix.mark != mark || prefix.headSize > longestHead)
        return badInput("'%s' is not an exported volume; make one with: volume-road export SERIES FILE", url.c_str());
    TmMsg head;
    head.resize(prefix.headSize);
    if (KpResult read = readRange(http, url, sizeof prefix, prefix.headSize, head.dataPtr()); read.isBad())
        return read;
    if (!readHead(head, series, volume, root))
        return badInput("the head of '%s' is damaged", url.c_str());
    volume.allocate();
    SliceReader reader(url, sizeof prefix + prefix.headSize, http, volume);
    return readSlices(reader, volume.dims[2], progress, silence);
}
