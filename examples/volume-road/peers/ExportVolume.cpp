#include "ExportVolume.h"

#include "../commands/Abort.h"

#include <kplib/rawdata/KpRawData.h>

#include <nlohmann/json.hpp>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <sys/stat.h>
#include <vector>

using Json = nlohmann::ordered_json;

namespace {

/// Whether all bytes are in the stream.
bool writeTo(FILE* stream, const TmMsg& head, Volume& volume)
{
    const auto bytes = static_cast<unsigned long>(volume.bytes.size());
    return KpRawData::fwrite(head.dataPtr(), 1, head.size(), stream) == head.size() &&
           KpRawData::fwrite(volume.bytes.data(), 1, bytes, stream) == bytes && std::fflush(stream) == 0;
}

KpResult cannotWrite(const std::string& file)
{
    return badInput("can't write '%s': %s", file.c_str(), std::strerror(errno));
}

/// Writes by `write` into what is at the path; a regular file is replaced at the end.
template <typename Write>
KpResult writeFile(const std::string& file, Write write)
{
    if (file == "-")
        return write(stdout) ? KpResult() : cannotWrite("standard output");
    struct stat info {};
    const bool isThere = lstat(file.c_str(), &info) == 0;
    const bool isReplaced = !isThere || S_ISREG(info.st_mode);
    const std::string path = isReplaced ? file + ".part" : file;
    Unfinished unfinished;
    FILE* const stream = std::fopen(path.c_str(), "wb");
    if (!stream)
        return cannotWrite(file);
    if (isReplaced)
        unfinished.remember(path);
    bool isWritten = write(stream);
    int cause = errno;
    if (std::fclose(stream) != 0) {
        cause = isWritten ? errno : cause;
        isWritten = false;
    }
    errno = cause;
    const Publishing publishing;
    if (isWritten && (!isReplaced || std::rename(path.c_str(), file.c_str()) == 0))
        return KpResult();
    KpResult failure = cannotWrite(file);
    if (isReplaced)
        std::remove(path.c_str());
    return failure;
}

Json vectorJson(const KpVec3d& v)
{
    return {v[0], v[1], v[2]};
}

/// Where each slice is in the file and in the patient.
std::string description(const Series& series, const Volume& volume, unsigned long offset)
{
    Json slices = Json::array();
    for (long z = 0; z < volume.dims[2]; ++z) {
        const Image& plane = series.planes[static_cast<size_t>(z)];
        slices.push_back({{"file", plane.path},
                          {"frame", plane.frame},
                          {"tile", plane.tile},
                          {"instance", plane.instanceUid},
                          {"position", vectorJson(volume.slicePosition(z))}});
    }
    const Json json{{"offset", offset},
                    {"dims", {volume.dims[0], volume.dims[1], volume.dims[2]}},
                    {"components", volume.components},
                    {"type", volume.type.name()},
                    {"row", vectorJson(volume.axes[0])},
                    {"column", vectorJson(volume.axes[1])},
                    {"step", vectorJson(volume.axes[2])},
                    {"spacing", vectorJson(volume.spacing)},
                    {"tilt", volume.tilt()},
                    {"placed", volume.isPlaced},
                    {"scaled", volume.isScaled},
                    {"slope", volume.slope},
                    {"intercept", volume.intercept},
                    {"volume", series.volume},
                    {"volumes", series.volumes},
                    {"label", series.label},
                    {"slices", slices}};
    return json.dump(1, ' ', false, Json::error_handler_t::replace) + "\n";
}

}  // namespace

KpResult writeExport(const std::string& file, const std::string& describe, const Series& series, Volume& volume,
                     const HxParamBundle& root)
{
    TmMsg head;
    writeHead(head, series, volume, root);
    KpResult written = writeFile(file, [&](FILE* stream) { return writeTo(stream, head, volume); });
    if (written.isBad() || describe.empty())
        return written;
    const std::string text = description(series, volume, head.size());
    return writeFile(describe, [&](FILE* stream) {
        return std::fwrite(text.data(), 1, text.size(), stream) == text.size() && std::fflush(stream) == 0;
    });
}
