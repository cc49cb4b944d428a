#include "Values.h"

#include "Hex.h"

#include <kplib/foundation/KpMemory.h>
#include <kplib/kplib.h>
#include <support/Program.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>
#include <iterator>
#include <regex>
#include <sstream>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <vector>

namespace {

constexpr unsigned long longestHex = 64;

// A float as the shortest number that stands for it, and what JSON has no number for as text.
Json jsonOf(double value)
{
    if (!std::isfinite(value))
        return std::isnan(value) ? "nan" : value > 0 ? "inf" : "-inf";
    return value;
}
Json jsonOf(float value)
{
    if (!std::isfinite(value))
        return jsonOf(static_cast<double>(value));
    char text[32];
    const auto end = std::to_chars(text, std::end(text), value).ptr;
    double shortest = 0;
    std::from_chars(text, end, shortest);
    return shortest;
}
Json jsonOf(long value)
{
    return value;
}

template <typename Scalar>
Json jsonOfScalar(Scalar value)
{
    if constexpr (std::is_floating_point_v<Scalar> || std::is_same_v<Scalar, long>)
        return jsonOf(value);
    else
        return value;
}

// A value of one or more scalars, which lie in it as in an array.
template <typename T, typename Scalar>
Json jsonOfValue(const T& value)
{
    static_assert(sizeof(T) % sizeof(Scalar) == 0);
    constexpr unsigned long n = sizeof(T) / sizeof(Scalar);  // NOLINT(bugprone-sizeof-expression): one or more
    Scalar scalars[n];
    std::memcpy(scalars, &value, sizeof value);
    if constexpr (n == 1)
        return jsonOfScalar(scalars[0]);
    Json json = Json::array();
    for (const Scalar scalar : scalars)
        json.push_back(jsonOfScalar(scalar));
    return json;
}

template <typename T, typename Scalar = T>
Json readValue(TmMsg& msg)
{
    T value;
    msg >> value;
    return jsonOfValue<T, Scalar>(value);
}

Json readPrimType(TmMsg& msg)
{
    KpPrimType type;
    msg >> type;
    return type.isValid() ? Json(type.name()) : Json(static_cast<int>(type));
}

Json readDigest(TmMsg& msg)
{
    KpLib::MD5 digest;
    msg >> digest;
    return hexOf({reinterpret_cast<const char*>(&digest), sizeof digest});
}

// An array is read only if the message holds it: a count that is no count would ask for all memory.
template <typename T, typename Scalar = T>
Json readArray(TmMsg& msg)
{
    TmMsg head(msg.size(), msg.dataPtr());
    void* skipped = nullptr;
    head.readRawBytes(msg.readOffset(), skipped);
    unsigned int count = 0;
    head >> count;
    if (!head.holds(count * sizeof(T))) {
        msg.readRawBytes(sizeof count + count * sizeof(T), skipped);
        return nullptr;
    }
    KpDArray<T> array;
    msg >> array;
    Json json = Json::array();
    for (const T& element : array)
        json.push_back(jsonOfValue<T, Scalar>(element));
    return json;
}

template <typename Text>
Json readText(TmMsg& msg)
{
    Text text;
    msg >> text;
    return std::string(std::string_view(text));
}

Json jsonOfText(const char* text)
{
    return text ? Json(text) : Json(nullptr);
}

Json readCharacters(TmMsg& msg)
{
    char* text = nullptr;
    msg >> text;
    return jsonOfText(text);
}

Json readTexts(TmMsg& msg)
{
    KpDArray<char*> texts;
    msg >> texts;
    Json json = Json::array();
    for (const char* text : texts)
        json.push_back(jsonOfText(text));
    return json;
}

Json readResult(TmMsg& msg)
{
    KpResult result;
    msg >> result;
    if (result.isOk())
        return {{"code", 0}};
    return {{"code", result.codeValue()}, {"text", result.text()}, {"data", result.data()}};
}

Json readBitfield(TmMsg& msg)
{
    KpBitfield field;
    msg >> field;
    return {{"bits", field.nBits()}, {"set", field.nSetBits()}};
}

Json readImage(TmMsg& msg)
{
    KpTypedData2D image;
    msg >> image;
    return {{"dims", {image.dims()[0], image.dims()[1]}},
            {"components", image.nDataVar()},
            {"type", image.primType().name()}};
}

Json readVolume(TmMsg& msg)
{
    TmDataAccess* object = nullptr;
    msg >> object;
    if (!object)
        return nullptr;
    const KpHandle<TmDataAccess> volume(object);
    const KpVec3l dims = volume->dims();
    const Kp128 hash = volume->hash();
    return {{"dims", {dims[0], dims[1], dims[2]}},
            {"components", volume->nDataVar()},
            {"type", volume->primType().name()},
            {"bytes", volume->size()},
            {"hash", hexOf({reinterpret_cast<const char*>(&hash), sizeof hash})}};
}

Json readMessage(TmMsg& msg)
{
    TmMsg inner;
    msg >> inner;
    const std::string_view bytes(reinterpret_cast<const char*>(inner.dataPtr()), inner.size());
    return {{"bytes", bytes.size()}, {"begins", hexOf(bytes.substr(0, longestHex))}};
}

const ValueType types[] = {
    {"bool", readValue<bool>},
    {"uchar", readValue<unsigned char>},
    {"ushort", readValue<unsigned short>},
    {"int", readValue<int>},
    {"uint", readValue<unsigned int>},
    {"long", readValue<long>},
    {"ulong", readValue<unsigned long long>},
    {"float", readValue<float>},
    {"double", readValue<double>},
    {"KpString", readText<KpString>},
    {"KpFilename", readText<KpFilename>},
    {"std::string", readText<std::string>},
    {"char*", readCharacters},
    {"KpVec2i", readValue<KpVec2i, int>},
    {"KpVec3i", readValue<KpVec3i, int>},
    {"KpVec4i", readValue<KpVec4i, int>},
    {"KpVec3l", readValue<KpVec3l, long>},
    {"KpVec2f", readValue<KpVec2f, float>},
    {"KpVec3f", readValue<KpVec3f, float>},
    {"KpVec4f", readValue<KpVec4f, float>},
    {"KpPlane", readValue<KpPlane, float>},
    {"KpLine", readValue<KpLine, float>},
    {"KpBox2f", readValue<KpBox2f, float>},
    {"KpBox3f", readValue<KpBox3f, float>},
    {"KpBox3i", readValue<KpBox3i, int>},
    {"KpMat4f", readValue<KpMat4f, float>},
    {"KpRotation", readValue<KpRotation, float>},
    {"KpColor", readValue<KpColor, float>},
    {"KpPrimType", readPrimType},
    {"KpUniqueID", readValue<KpUniqueID, long>},
    {"KpTransferID", readValue<KpTransferID, long>},
    {"KpFrameID", readValue<KpFrameID, long>},
    {"KpRemotificationID", readValue<KpRemotificationID, int>},
    {"TmSessionContextID", readValue<TmSessionContextID, int>},
    {"KpLib::MD5", readDigest},
    {"KpDArray<uchar>", readArray<unsigned char>},
    {"KpDArray<bool>", readArray<bool>},
    {"KpDArray<int>", readArray<int>},
    {"KpDArray<long>", readArray<long>},
    {"KpDArray<float>", readArray<float>},
    {"KpDArray<double>", readArray<double>},
    {"KpDArray<char*>", readTexts},
    {"KpDArray<KpVec2f>", readArray<KpVec2f, float>},
    {"KpDArray<KpVec3i>", readArray<KpVec3i, int>},
    {"KpDArray<KpVec3f>", readArray<KpVec3f, float>},
    {"KpDArray<KpVec4f>", readArray<KpVec4f, float>},
    {"KpDArray<KpPlane>", readArray<KpPlane, float>},
    {"KpDArray<KpLine>", readArray<KpLine, float>},
    {"KpDArray<KpMat4f>", readArray<KpMat4f, float>},
    {"KpResult", readResult},
    {"KpBitfield", readBitfield},
    {"KpTypedData2D", readImage},
    {"TmDataAccess", readVolume},
    {"TmMsg", readMessage},
};

const ValueType& typeOf(const std::string& name)
{
    for (const ValueType& type : types) {
        if (type.name == name)
            return type;
    }
    throw Failure("there is no type '" + name + "'; see kpmsg dump --help for those that there are");
}

// Types whose C++ name has blanks, by one word.
std::string withoutBlankNames(std::string list)
{
    static const std::pair<std::regex, const char*> words[] = {
        {std::regex(R"(\bunsigned\s+long(\s+long)?\b)"), "ulong"}, {std::regex(R"(\blong\s+long\b)"), "long"},
        {std::regex(R"(\bunsigned\s+(char|short|int)\b)"), "u$1"}, {std::regex(R"(\bconst\s+char\s*\*)"), "char*"},
        {std::regex(R"(\bTmDataAccess\s*\*)"), "TmDataAccess"},    {std::regex(R"([,\s]+)"), " "},
    };
    for (const auto& [pattern, word] : words)
        list = std::regex_replace(list, pattern, word);
    return list;
}

}  // namespace

std::vector<const ValueType*> valueTypes(const std::string& list)
{
    std::vector<const ValueType*> result;
    std::istringstream words(withoutBlankNames(list));
    for (std::string word; words >> word;)
        result.push_back(&typeOf(word));
    return result;
}

std::string valueTypeNames()
{
    std::string names;
    for (const ValueType& type : types)
        names += (names.empty() ? "" : " ") + type.name;
    return names;
}

Reading readValues(std::string_view bytes, const std::vector<const ValueType*>& wanted)
{
    auto* const data = reinterpret_cast<unsigned char*>(const_cast<char*>(bytes.data()));
    TmMsg msg(bytes.size(), data);
    Reading reading;
    for (const ValueType* type : wanted) {
        Json json = type->read(msg);
        if (msg.readOffset() > msg.size()) {
            reading.problem = "the message ends in the " + type->name + " at offset " + std::to_string(reading.end);
            break;
        }
        reading.values.push_back({type->name, reading.end, msg.readOffset() - reading.end, std::move(json)});
        reading.end = msg.readOffset();
    }
    return reading;
}
