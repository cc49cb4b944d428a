#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpID.h>

/// Names an object that peers call across the connection. Empty: 0.
///
/// The values below RS_LAST_SINGLETON_ID belong to the singletons of the server side, so that peers can address them
/// before they have exchanged any other id.
class KPLIB_API KpRemotificationID : public KpID<int, 0> {
public:
    /// With the constructors of KpID.
    using KpID::KpID;

    static constexpr int RS_SERVER_PEER = 1;         ///< the server's peer
    static constexpr int RS_BACKEND_PEER = 2;        ///< the peer of the back end
    static constexpr int RS_TRANSFER_MANAGER = 3;    ///< the transfer manager
    static constexpr int RS_LOAD_MANAGER = 4;        ///< the load manager
    static constexpr int RS_DATA_MANAGER = 5;        ///< the data manager
    static constexpr int RS_VOLUME_INFO_CACHE = 6;   ///< the cache of volume descriptions
    static constexpr int RS_ERROR_NOTIFIER = 7;      ///< the notifier of errors
    static constexpr int RS_POWERSCRIBE_CTRL = 9;    ///< a controller
    static constexpr int RS_MAX = 9;                 ///< the last singleton
    static constexpr int RS_LAST_SINGLETON_ID = 20;  ///< first value after the range kept for singletons

    /// The name of the singleton's class, null for 0 and 8. Not checked: the value has to be from 0 to RS_MAX.
    const char* singletonClassName() const;
};
