#include <kplib/net/KpSocketTools.h>

#include <kplib/foundation/KpString.h>

#include <cstdint>
#include <netdb.h>
#include <netinet/in.h>
#include <unistd.h>

KpString KpSocketTools::getHostName()
{
    char name[257 + 1] = "";  // a name that fills the room may lack its NUL
    return gethostname(name, sizeof(name) - 1) == 0 ? KpString(name) : KpString();
}

unsigned int KpSocketTools::getIPV4Address(const char* host)
{
    addrinfo* results = nullptr;
    if (getaddrinfo(host, nullptr, nullptr, &results) != 0)
        return 0;
    const addrinfo* found = results;
    while (found && found->ai_family != AF_INET)
        found = found->ai_next;
    const unsigned int address = found ? reinterpret_cast<const sockaddr_in*>(found->ai_addr)->sin_addr.s_addr : 0;
    freeaddrinfo(results);
    return address;
}

unsigned int KpSocketTools::getIPV4Address(const KpString& host)
{
    return getIPV4Address(host.c_str());
}

unsigned int KpSocketTools::getIPV4Address()
{
    return getIPV4Address(getHostName());
}

KpString KpSocketTools::getIPV4AddressString(const KpString& host)
{
    const std::uint32_t address = ntohl(getIPV4Address(host));
    return KpString(0, "%d.%d.%d.%d", address >> 24, address >> 16 & 255, address >> 8 & 255, address & 255);
}

KpString KpSocketTools::getIPV4AddressString()
{
    return getIPV4AddressString(getHostName());
}
