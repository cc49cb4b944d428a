#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Names of hosts and their IPv4 addresses. A lookup takes as long as the system's resolver does. Any thread.
class KPLIB_API KpSocketTools {
public:
    /// The name of this machine; empty on failure.
    static KpString getHostName();

    /// The first IPv4 address of a host, by name or dotted, in network byte order; 0 if there is none.
    static unsigned int getIPV4Address(const char* host);
    /// As above.
    static unsigned int getIPV4Address(const KpString& host);
    /// The first IPv4 address of this machine, by its name.
    static unsigned int getIPV4Address();

    /// The same as "192.0.2.1"; "0.0.0.0" if there is none.
    static KpString getIPV4AddressString(const KpString& host);
    /// The same for this machine.
    static KpString getIPV4AddressString();
};
