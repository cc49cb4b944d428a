#include <kplib/foundation/KpRemotificationID.h>

#include <kplib/foundation/KpCheck.h>

const char* KpRemotificationID::singletonClassName() const
{
    KPLIB_CHECK(value() >= 0 && value() <= RS_MAX, "KpRemotificationID: not the number of a singleton");
    static constexpr const char* names[RS_MAX + 1] = {
        nullptr,         "TmServerPeer",      "TmBackendPeer",     "TmTransferManager",
        "ExLoadManager", "ExDataManager",     "TmVolumeInfoCache", "TmErrorNotifier",
        nullptr,         "TmPowerScribeCtrl",
    };
    return names[value()];
}
