#include <kplib/net/TmMsg.h>

#include <kplib/system/KpFilename.h>

#include <algorithm>
#include <cstring>
#include <functional>
#include <string>
#include <string_view>

namespace {

// The text at the read offset: up to the first NUL or, without one, to the end of the message. Moves past the NUL.
std::string_view readToNul(TmMsg& msg)
{
    const unsigned long left = msg.holds(0) ? msg.bytesAvailable() : 0;
    void* bytes = nullptr;
    msg.readRawBytes(0, bytes);
    const auto* const text = static_cast<const char*>(bytes);
    const unsigned long length = text ? strnlen(text, left) : 0;
    msg.readRawBytes(length + 1, bytes);
    return {text, length};
}

// Whether the text is one that was read from the message: it moves with the bytes if these have to grow.
bool isInside(const TmMsg& msg, const char* text)
{
    const auto* const bytes = reinterpret_cast<const unsigned char*>(text);
    return std::less_equal<>()(msg.dataPtr(), bytes) && std::less<>()(bytes, msg.dataPtr() + msg.size());
}

}  // namespace

TmMsg& operator<<(TmMsg& msg, const char* text)
{
    if (!text)
        return msg << 0U;
    const unsigned long length = std::strlen(text) + 1;
    const bool isOwn = isInside(msg, text);
    const long at = isOwn ? reinterpret_cast<const unsigned char*>(text) - msg.dataPtr() : 0;
    msg << static_cast<unsigned int>(length);
    msg.writeRawBytes(length, isOwn ? static_cast<const void*>(msg.dataPtr() + at) : text);
    return msg;
}

TmMsg& operator>>(TmMsg& msg, char*& text)
{
    unsigned int length = 0;
    msg >> length;
    void* bytes = nullptr;
    if (length > 0)
        msg.readRawBytes(length, bytes);
    text = static_cast<char*>(bytes);
    if (text && text[length - 1] != '\0')
        text = nullptr;  // not a text that a writer left here: it would be read on beyond its bytes
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const std::string& text)
{
    msg << static_cast<int>(text.size());
    msg.writeRawBytes(text.size(), text.data());
    return msg;
}

TmMsg& operator>>(TmMsg& msg, std::string& text)
{
    unsigned int length = 0;
    msg >> length;
    void* bytes = nullptr;
    msg.readRawBytes(length, bytes);
    text.clear();
    if (bytes)
        text.assign(static_cast<const char*>(bytes), length);
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const KpString& text)
{
    msg.writeRawBytes(std::strlen(text.c_str()) + 1, text.c_str());
    return msg;
}

TmMsg& operator>>(TmMsg& msg, KpString& text)
{
    text = KpString(readToNul(msg));
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const KpFilename& name)
{
    return msg << static_cast<const KpString&>(name);
}

TmMsg& operator>>(TmMsg& msg, KpFilename& name)
{
    return msg >> static_cast<KpString&>(name);
}

TmMsg& operator<<(TmMsg& msg, const KpDArray<char*>& texts)
{
    const bool anyOwn = std::any_of(texts.begin(), texts.end(), [&](const char* text) { return isInside(msg, text); });
    TmMsg aside;  // if some of the texts would move while they are written
    TmMsg& to = anyOwn ? aside : msg;
    to << static_cast<int>(texts.size());
    for (const char* text : texts)
        to << text;
    msg.writeRawBytes(aside.size(), aside.dataPtr());
    return msg;
}

TmMsg& operator>>(TmMsg& msg, KpDArray<char*>& texts)
{
    int count = 0;
    msg >> count;
    texts.resize(0);
    for (int i = 0; i < count && msg.holds(sizeof(unsigned int)); ++i) {
        char* text = nullptr;
        msg >> text;
        texts.append(text);
    }
    return msg;
}
