#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/log/KpResult.h>
#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/KpSocketTools.h>
#include <kplib/net/TmMsg.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/rawdata/TmDataAccess.h>
#include <kplib/volume/KpBitfield.h>

#include <arpa/inet.h>
#include <cstring>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>

namespace kplib::probe {

namespace {

Digest digestOf(const TmMsg& msg)
{
    return Digest().add(msg.dataPtr(), msg.size());
}

Outcome values()
{
    KpDArray<int> numbers{1, 2, 3};
    TmMsg msg;
    msg << 7 << 2.5 << KpVec3f(1, 2, 3) << "a text" << std::string("another text that takes memory of its own")
        << KpString("a third one") << numbers;
    int number = 0;
    double real = 0;
    KpVec3f vector;
    char* text = nullptr;
    std::string standard;
    KpString string;
    KpDArray<int> received;
    msg >> number >> real >> vector >> text >> standard >> string >> received;
    return digestOf(msg) << number << text << standard << string << received.size();
}

Outcome innerMessages()
{
    TmMsg inner, msg;
    for (int i = 0; i < 50; ++i)
        inner << i;
    msg << inner;
    TmMsg copy(msg), received;
    copy >> received;
    msg = received;
    return digestOf(msg) << received.size();
}

Outcome failures()
{
    TmMsg msg;
    msg << KpResult(KpResult::OutOfRange, "a text that takes memory of its own", "and data");
    KpResult received;
    msg >> received;
    return digestOf(msg) << received.text() << received.data();
}

Outcome fields()
{
    KpBitfield field(500, KpBitfield::INIT_SET), received;
    TmMsg msg;
    msg << field;
    msg >> received;
    return digestOf(msg) << received.nSetBits();
}

Outcome pixels()
{
    KpTypedData2D image(20, 10, KpPrimType::Short, 1), received;
    if (!image.data())
        return {};
    std::memset(image.data(), 3, 400);
    TmMsg msg;
    msg << image;
    msg >> received;
    if (!received.data())
        return {};
    return digestOf(msg) << received.dims()[0];
}

Outcome volumes()
{
    const KpHandle<TmDataAccess> volume(
        new TmDataAccess(KpVec3l(9L, 8L, 7L), KpPrimType::Short, 1, KpAllocator::AllocatorMalloc));
    if (!volume->hasData())
        return {};
    std::memset(volume->dataPtr(0), 5, static_cast<unsigned long>(volume->size()));
    TmMsg msg;
    msg << static_cast<const TmDataAccess*>(volume.get());
    TmDataAccess* object = nullptr;
    msg >> object;
    const KpHandle<TmDataAccess> received(object);
    if (!received || !received->hasData())
        return {};
    return digestOf(msg) << received->hash().first;
}

Outcome lines()
{
    int pair[2];
    if (socketpair(AF_UNIX, SOCK_STREAM, 0, pair) != 0)
        return {};
    struct Closer {
        int* pair;
        ~Closer() { KpSocket::close(pair[0]), KpSocket::close(pair[1]); }
    } const closer{pair};
    const std::string text(300, 'x');
    KpSocket::send(pair[0], "%s\n", text.c_str());
    KpString line;
    if (KpSocket::readLine(pair[1], line) < 1)
        return {};
    return Digest() << line << KpSocketTools::getIPV4AddressString("127.0.0.1");
}

/// A server of one file, which needs no memory of the heap; its port.
int port()
{
    static const int found = [] {
        const int listener = socket(AF_INET, SOCK_STREAM, 0);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        socklen_t length = sizeof address;
        bind(listener, reinterpret_cast<sockaddr*>(&address), length);
        listen(listener, 16);
        getsockname(listener, reinterpret_cast<sockaddr*>(&address), &length);
        std::thread([listener] {
            static constexpr char answer[] = "HTTP/1.1 206 Partial Content\r\nContent-Length: 10\r\n\r\n0123456789";
            char request[1000];
            for (int peer; (peer = accept(listener, nullptr, nullptr)) >= 0; close(peer)) {
                while (recv(peer, request, sizeof request, 0) > 0)
                    send(peer, answer, sizeof answer - 1, MSG_NOSIGNAL);
            }
        }).detach();
        return int{ntohs(address.sin_port)};
    }();
    return found;
}

Outcome ranges()
{
    const std::string url = "http://127.0.0.1:" + std::to_string(port()) + "/a/file/with/a/path/of/some/length";
    KpHttpGet http;
    char bytes[10];
    if (!http.request(url.c_str(), 0, 9) || http.read(bytes, sizeof bytes) != sizeof bytes)
        return {};
    return Digest().add(bytes, sizeof bytes) << http.status() << http.errorText();
}

}  // namespace

Operations netOperations()
{
    static constexpr Operation list[] = {
        {"values of a message", values}, {"a message in a message", innerMessages},
        {"failures", failures},          {"fields in a message", fields},
        {"pixels in a message", pixels}, {"volumes in a message", volumes},
        {"lines of a socket", lines},    {"ranges over HTTP", ranges},
    };
    return list;
}

}  // namespace kplib::probe
