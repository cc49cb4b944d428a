#include "Fuzz.h"

#include <volume-road/peers/Parcel.h>

#include <kplib/log/KpLogFile.h>

#include <cstddef>
#include <cstdint>

// Any bytes as what a peer sends: they are refused, or are a volume that can be shown and goes on unchanged to the next
// peer.

namespace {

void checkNextPeer(Parcel& parcel)
{
    TmMsg sent, before, after;
    Parcel received;
    writeParcel(sent, parcel);
    check(readParcel(sent, received).isOk());
    parcel.root.removeAll();  // nodes without a name get another one each time
    received.root.removeAll();
    writeParcel(before, parcel);
    writeParcel(after, received);
    check(before.size() == after.size() && std::memcmp(before.dataPtr(), after.dataPtr(), before.size()) == 0);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    TmMsg msg;
    msg.writeRawBytes(size, data);
    Parcel parcel;
    if (readParcel(msg, parcel).isBad())
        return 0;
    Volume shown;
    display(parcel.volume, parcel.window, shown);
    check(shown.bytes.size() == parcel.volume.count() * parcel.volume.components);
    checkNextPeer(parcel);
    return 0;
}
