#include <kplib/foundation/KpRemotificationID.h>

const char* KpRemotificationID::singletonClassName() const
{
    static constexpr const char* names[RS_MAX + 1] = {
        nullptr,         "TmServerPeer",      "TmBackendPeer",     "TmTransferManager",
        "ExLoadManager", "ExDataManager",     "TmVolumeInfoCache", "TmErrorNotifier",
        nullptr,         "TmPowerScribeCtrl",
    };
    return names[value()];
}
