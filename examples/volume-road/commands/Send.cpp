#include "../peers/ParcelPictures.h"
#include "../peers/Socket.h"
#include "../volume/Reduce.h"
#include "Commands.h"
#include "Load.h"

#include <kplib/threads/ProgressScope.h>

#include <cstdio>
#include <netdb.h>
#include <string>

namespace {

constexpr int bufferSize = 1 << 20;

/// Series to parcel: what is sent is the reduced volume.
KpResult pack(const Job& job, Road& road, KpProgressInterface& progress, Parcel& parcel)
{
    Series series;
    Volume whole;
    loadSeries(job, road, progress, series, whole, parcel.root);
    road.nested("reduce by mean", [&] {
        parcel.volume = reducedByMean(whole, {2, 2, 2}, progress);
        parcel.window = windowOf(series.windows, parcel.volume);
        return KpResult();
    });
    road.nested("segment", [&] {
        parcel.frameUid = series.frameUid();
        return segment(parcel.volume, Space(parcel.frameUid, parcel.volume), job.threshold, progress, parcel.region);
    });
    return road.result();
}

/// Whether the name of the peer is one: the connection alone would only say that it failed.
KpResult checkHost(const std::string& host)
{
    addrinfo* found = nullptr;
    addrinfo hints{};
    hints.ai_family = AF_INET;
    const int error = getaddrinfo(host.c_str(), nullptr, &hints, &found);
    if (error != 0)
        return badInput("the host '%s' is unknown: %s", host.c_str(), gai_strerror(error));
    freeaddrinfo(found);
    return KpResult();
}

KpResult deliver(const Job& job, const TmMsg& msg, const std::string& hash, KpProgressInterface& progress)
{
    Silence silence(job.timeout, "the peer was silent for " + std::to_string(job.timeout) + " s; see --timeout");
    const Socket socket(KpSocket::connect(job.address.c_str(), job.port, 0, bufferSize, bufferSize));
    if (socket < 0)
        return badInput("can't connect to %s, port %d: %s", job.address.c_str(), job.port, KpSocket::strerror());
    KpResult sent = sendMessage(socket, msg, progress, silence);
    if (sent.isOk() && !progress.isCanceled())
        sent << awaitConfirmation(socket, hash);
    return sent;
}

}  // namespace

KpResult send(const Job& job, KpProgressInterface& progress)
{
    if (KpResult checked = checkHost(job.address); checked.isBad())
        return checked;
    OutputFolder out;
    if (!job.target.empty()) {
        if (KpResult opened = out.open(job.target); opened.isBad())
            return opened;
    }
    const ProgressScope scope(&progress);
    progress.startWorking(5, "");
    Road road(progress);
    Parcel parcel;
    if (KpResult packed = pack(job, road, progress, parcel); packed.isBad())
        return packed;
    TmMsg msg;
    writeParcel(msg, parcel);
    const std::string hash = hexadecimal(contentHash(parcel.volume));
    road.nested("send", [&] { return deliver(job, msg, hash, progress); });
    KpResult result = road.result();
    if (result.isOk() && !job.target.empty()) {
        result << writePictures(parcel, out);
        if (result.isOk())
            result << out.publish();
    }
    if (result.isOk())
        std::printf("sent %lu bytes, content hash %s\n", msg.size(), hash.c_str());
    return result;
}
