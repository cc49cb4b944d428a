#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/numerics/KpDelaunay.h>
#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpMD5Coder.h>
#include <kplib/system/KpUUID.h>
#include <kplib/volume/KpBitfield.h>

#include <array>
#include <cstdio>
#include <fcntl.h>
#include <memory>
#include <unistd.h>
#include <vector>

namespace kplib::probe {

namespace {

struct Close {
    void operator()(FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<FILE, Close>;

std::uint64_t target()
{
    return digestOf("target");
}

void source()
{
    std::remove(pathOf("target").c_str());
    put("source", std::string(20000, 's'));
}

/// Files that an operation replaces.
void sourceAndTarget()
{
    source();
    put("target", "what was there before");
}

KpBitfield mask()
{
    KpBitfield field(100001, KpBitfield::INIT_UNSET);
    for (unsigned long i = 0; i < field.nBits(); i += 3)
        field.set(i);
    return field;
}

Outcome saveField()
{
    if (!mask().save(pathOf("target").c_str()))
        return {};
    return Digest() << true;
}

void savedField()
{
    saveField();
}

Outcome loadField()
{
    KpBitfield field;
    if (!field.load(pathOf("target").c_str(), 100001))
        return {};
    return Digest() << field.nSetBits();
}

Outcome copyFile()
{
    if (!KpFilename(pathOf("source").c_str()).copy(pathOf("target").c_str()))
        return {};
    return Digest() << true;
}

Outcome createFile()
{
    if (!KpFilename(pathOf("target").c_str()).create(0644))
        return {};
    return Digest() << true;
}

Outcome renameFile()
{
    if (!KpFilename(pathOf("source").c_str()).rename(pathOf("target").c_str()))
        return {};
    return Digest() << true;
}

Outcome unlinkFile()
{
    if (!KpFilename(pathOf("target").c_str()).unlink())
        return {};
    return Digest() << true;
}

Outcome askFile()
{
    const KpFilename name(pathOf("source").c_str());
    const unsigned long long size = name.fileSize();
    const bool isKnown = size != ~0ULL && name.getModTime() != 0 && name.getMode() != 0 && name.doesExist() &&
                         name.isReadable() && name.isWriteable();
    if (!isKnown)
        return {};
    return Digest() << size;
}

std::vector<short> voxels()
{
    std::vector<short> values(50000);
    for (unsigned long i = 0; i < values.size(); ++i)
        values[i] = static_cast<short>(i * 7);
    return values;
}

Outcome writeStream()
{
    std::vector<short> values = voxels();
    const File file(std::fopen(pathOf("target").c_str(), "wb"));
    const auto n = values.size();
    const bool isWritten =
        file && KpRawData::fwrite(values.data(), 2, n, file.get()) == n &&
        KpRawData::writeBigEndian({values.data(), KpPrimType::Short}, n, file.get()) == static_cast<long>(n) &&
        std::fflush(file.get()) == 0;
    if (!isWritten || values != voxels())
        return {};
    return Digest() << n;
}

void writtenStream()
{
    writeStream();
}

Outcome readStream()
{
    std::vector<short> first(50000), second(50000);
    const File file(std::fopen(pathOf("target").c_str(), "rb"));
    if (!file || KpRawData::fread(first.data(), 2, first.size(), file.get()) != first.size() ||
        KpRawData::readBigEndian({second.data(), KpPrimType::Short}, second.size(), file.get()) != 50000)
        return {};
    return Digest().add(first.data(), 100000).add(second.data(), 100000);
}

Outcome writeDescriptor()
{
    const std::vector<short> values = voxels();
    const int descriptor = ::open(pathOf("target").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0644);
    const bool isWritten = descriptor >= 0 && KpRawData::write(descriptor, values.data(), 100000) == 100000;
    if (descriptor >= 0 && ::close(descriptor) != 0)
        return {};
    if (!isWritten)
        return {};
    return Digest() << isWritten;
}

Outcome readDescriptor()
{
    std::vector<char> bytes(20000);
    const int descriptor = ::open(pathOf("source").c_str(), O_RDONLY);
    if (descriptor < 0)
        return {};
    const long long n = KpRawData::read(descriptor, bytes.data(), 20000, true);
    ::close(descriptor);
    if (n != 20000)
        return {};
    return Digest().add(bytes.data(), bytes.size());
}

Outcome digestFile()
{
    std::array<char, 4096> piece;
    KpLib::MD5Coder coder;
    const File file(std::fopen(pathOf("source").c_str(), "rb"));
    unsigned long n = 0, all = 0;
    while (file && (n = KpRawData::fread(piece.data(), 1, piece.size(), file.get())) > 0) {
        coder.append(piece.data(), n);
        all += n;
    }
    if (!file || std::ferror(file.get()) || all != 20000)
        return {};
    return Digest() << coder.md5().words()[0];
}

Outcome printTree()
{
    HxParamBundle root("Root");
    KpDArray<KpString> uids;
    for (int i = 0; i < 400; ++i)
        uids.append(KpString(0, "1.2.826.0.1.3680043.2.1125.%d", i));
    KpSOPInstanceUtility::setSopUIDList(root.bundle("SOPInstanceUIDs", 1), uids);
    const File file(std::fopen(pathOf("target").c_str(), "w"));
    if (!file)
        return {};
    root.print(file.get());
    if (std::fflush(file.get()) != 0 || std::ferror(file.get()))
        return {};
    return Digest() << root.size();
}

Outcome writeTriangles()
{
    std::array<KpVec2f, 4> points{KpVec2f(0, 0), KpVec2f(1, 0), KpVec2f(0, 1), KpVec2f(1, 1.1F)};
    KpDArray<KpDelaunay::Triangle> triangles;
    if (!KpDelaunay::triangulate2D(points.data(), 4, triangles) ||
        !KpDelaunay::writeEPS(pathOf("target").c_str(), points.data(), 4, triangles))
        return {};
    return Digest() << triangles.size();
}

Outcome uuid()
{
    if (KpUUID::generateUUID() == KpUUID())
        return {};
    return Digest() << true;
}

}  // namespace

Operations fileOperations()
{
    static constexpr const char* incomplete = "false leaves a file that may be incomplete";
    static constexpr Operation list[] = {
        {"a bit field saved", saveField, sourceAndTarget, target, nullptr, incomplete},
        {"a bit field loaded", loadField, savedField},
        {"a file copied", copyFile, sourceAndTarget, target},
        {"a file made", createFile, source, target},
        {"a file renamed", renameFile, sourceAndTarget, target},
        {"a file deleted", unlinkFile, sourceAndTarget, target},
        {"a file asked", askFile, source},
        {"a stream written", writeStream, source, target, nullptr, "the caller opens the file and gets the count"},
        {"a stream read", readStream, writtenStream},
        {"a descriptor written", writeDescriptor, source, target, nullptr,
         "the caller opens the file and gets the count"},
        {"a descriptor read", readDescriptor, source},
        {"the digest of a file", digestFile, source},
        {"a tree with a list of instances printed", printTree, source, target, nullptr, "the caller opens the file"},
        {"triangles drawn", writeTriangles, source, target, "what happens to the bytes of a drawing is not reported",
         incomplete},
        {"a random identifier", uuid},
    };
    return list;
}

}  // namespace kplib::probe
