#include "../peers/ParcelPictures.h"
#include "../peers/Socket.h"
#include "Commands.h"
#include "Load.h"

#include <sys/socket.h>

#include <string>

KpResult serve(const Job& job)
{
    OutputFolder out;
    if (KpResult opened = out.open(job.target); opened.isBad())
        return opened;
    const Socket listener(socket(AF_INET, SOCK_STREAM, 0));
    if (KpResult listening = listenAt(job.address, job.port, listener); listening.isBad())
        return listening;
    const Socket peer(accept(listener, nullptr, nullptr));
    if (peer < 0)
        return badInput("no peer came: %s", KpSocket::strerror());
    Silence silence(job.timeout, "the peer was silent for " + std::to_string(job.timeout) + " s; see --timeout");
    TmMsg msg;
    Parcel parcel;
    KpResult result = receiveMessage(peer, msg, silence);
    if (result.isOk())
        result << readParcel(msg, parcel);
    if (result.isOk())
        result << writePictures(parcel, out);
    const std::string hash = hexadecimal(contentHash(parcel.volume));
    if (result.isOk())
        result << out.publish();
    if (result.isOk())
        result << confirm(peer, hash);
    if (result.isOk())
        result << printText(KpString(0, "received %lu bytes, content hash %s\n", msg.size(), hash.c_str()).c_str());
    return result;
}
