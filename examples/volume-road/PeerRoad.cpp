#include "PeerRoad.h"

#include "DicomSeries.h"
#include "Parcel.h"
#include "Reduce.h"
#include "Road.h"
#include "Space.h"

#include <kplib/net/KpSocket.h>
#include <kplib/threads/ProgressScope.h>

#include <algorithm>
#include <cstdio>
#include <cstring>

#include <netinet/in.h>
#include <sys/socket.h>

namespace {

constexpr unsigned long longestMessage = 1UL << 33;
constexpr int bufferSize = 1 << 20;
constexpr unsigned long pieceSize = 1UL << 20;

/// A descriptor that is closed at the end of its scope.
class Socket {
public:
    explicit Socket(int descriptor) : descriptor_(descriptor) {}
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;
    ~Socket()
    {
        if (descriptor_ >= 0)
            KpSocket::close(descriptor_);
    }
    operator int() const { return descriptor_; }

private:
    int descriptor_;
};

/// The message behind its length.
KpResult sendMessage(int socket, const TmMsg& msg, KpProgressInterface& progress)
{
    unsigned long size = msg.size();
    bool isSent = KpSocket::safeSend(socket, &size, sizeof size) == sizeof size;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(size / pieceSize + 1), "");
    for (unsigned long at = 0; isSent && at < size && !progress.isCanceled(); at += pieceSize) {
        const int piece = static_cast<int>(std::min(pieceSize, size - at));
        isSent = KpSocket::safeSend(socket, msg.dataPtr() + at, piece) == piece;
        progress.nextStep();
    }
    return isSent ? KpResult() : badInput("the peer doesn't take the message: %s", KpSocket::strerror());
}

KpResult receiveMessage(int socket, TmMsg& msg)
{
    unsigned long size = 0;
    if (KpSocket::receive(socket, reinterpret_cast<char*>(&size), sizeof size, 0) != sizeof size)
        return badInput("the peer sends nothing");
    if (size > longestMessage)
        return badInput("the peer announces %lu bytes; that is no message", size);
    for (unsigned long at = 0; at < size; at += pieceSize) {
        const int piece = static_cast<int>(std::min(pieceSize, size - at));
        msg.resize(static_cast<long>(at) + piece);  // what has come, not what was announced, takes memory
        if (KpSocket::receive(socket, reinterpret_cast<char*>(msg.dataPtr() + at), piece, 0) != piece)
            return badInput("the peer went away after %lu of %lu bytes", at, size);
    }
    return KpResult();
}

/// The peer confirms a message by a line with the digest of its voxels.
KpResult awaitConfirmation(int socket, const std::string& hash)
{
    std::string line(hash.size() + 1, '\0');  // not what a stranger takes for a line: it may never end
    const int size = static_cast<int>(line.size());
    if (KpSocket::receive(socket, line.data(), size, 0) != size)
        return badInput("the peer doesn't confirm the message");
    if (line != hash + '\n')
        return badInput("the peer has other voxels than those that were sent");
    return KpResult();
}

KpResult listenAt(int port, Socket& listener)
{
    constexpr int enable = 1;
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<unsigned short>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof address;
    auto* const where = reinterpret_cast<sockaddr*>(&address);
    if (listener < 0 || setsockopt(listener, SOL_SOCKET, SO_REUSEADDR, &enable, sizeof enable) != 0 ||
        bind(listener, where, length) != 0 || listen(listener, 1) != 0 || getsockname(listener, where, &length) != 0)
        return badInput("can't listen at port %d: %s", port, KpSocket::strerror());
    std::printf("waiting at port %d\n", ntohs(address.sin_port));
    std::fflush(stdout);
    return KpResult();
}

/// Series to parcel: what is sent is the reduced volume.
KpResult pack(const Job& job, Road& road, KpProgressInterface& progress, Parcel& parcel)
{
    Series series;
    Volume whole;
    road.nested("look for images", [&] { return scanSeries(job.folder.c_str(), job.uid, progress, series); });
    road.nested("read images", [&] { return readSeries(series, progress, whole, parcel.root); });
    road.nested("reduce by mean", [&] {
        parcel.volume = reducedByMean(whole, {2, 2, 2}, progress);
        parcel.window = windowOf(parcel.root, parcel.volume);
        return KpResult();
    });
    road.nested("segment", [&] {
        parcel.frameUid = series.frameUid();
        return segment(parcel.volume, Space(parcel.frameUid, parcel.volume), job.threshold, progress, parcel.region);
    });
    return road.result();
}

}  // namespace

KpResult sendRoad(const Job& job, const std::string& host, int port, const std::string& target,
                  KpProgressInterface& progress)
{
    OutputFolder out;
    if (!target.empty()) {
        if (KpResult opened = out.open(target); opened.isBad())
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
    road.nested("send", [&] {
        const Socket socket(KpSocket::connect(host.c_str(), port, 0, bufferSize, bufferSize));
        if (socket < 0)
            return badInput("can't connect to %s, port %d: %s", host.c_str(), port, KpSocket::strerror());
        KpResult sent = sendMessage(socket, msg, progress);
        if (sent.isOk() && !progress.isCanceled())
            sent << awaitConfirmation(socket, hash);
        return sent;
    });
    KpResult result = road.result();
    if (result.isOk() && !target.empty()) {
        result << writePictures(parcel, out);
        if (result.isOk())
            result << out.publish();
    }
    if (result.isOk())
        std::printf("sent %lu bytes, content hash %s\n", msg.size(), hash.c_str());
    return result;
}

KpResult serveRoad(int port, const std::string& target)
{
    OutputFolder out;
    if (KpResult opened = out.open(target); opened.isBad())
        return opened;
    Socket listener(socket(AF_INET, SOCK_STREAM, 0));
    if (KpResult listening = listenAt(port, listener); listening.isBad())
        return listening;
    const Socket peer(accept(listener, nullptr, nullptr));
    if (peer < 0)
        return badInput("no peer came: %s", KpSocket::strerror());
    TmMsg msg;
    Parcel parcel;
    KpResult result = receiveMessage(peer, msg);
    if (result.isOk())
        result << readParcel(msg, parcel);
    if (result.isOk())
        result << writePictures(parcel, out);
    if (result.isOk())
        result << out.publish();
    if (result.isOk()) {
        const std::string hash = hexadecimal(contentHash(parcel.volume));
        KpSocket::send(peer, "%s\n", hash.c_str());
        std::printf("received %lu bytes, content hash %s\n", msg.size(), hash.c_str());
    }
    return result;
}
