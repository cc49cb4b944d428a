#include "../dicom/Pixels.h"
#include "Commands.h"
#include "Load.h"

#include <nlohmann/json.hpp>

#include <array>
#include <string>
#include <vector>

using Json = nlohmann::ordered_json;

namespace {

/// One volume of the list: a row of the table, and an object of the JSON form.
struct Entry {
    Part part;
    Series series;
    std::string lacks;
};

Entry entryOf(const Part& part)
{
    Entry entry{part, {}, {}};
    if (KpResult inspected = inspect(part, entry.series); inspected.isBad())
        entry.lacks = inspected.text();
    for (const std::string& warning : entry.series.warnings)
        entry.lacks += (entry.lacks.empty() ? "" : "; ") + warning;
    return entry;
}

std::string printable(std::string text)
{
    for (char& c : text) {
        if (static_cast<unsigned char>(c) < 32 || c == 127)
            c = '.';
    }
    return text;
}

double tiltOf(const Geometry& geometry)
{
    Volume volume;
    volume.axes = geometry.axes;
    return volume.tilt();
}

Json jsonOf(const Entry& entry, size_t number)
{
    const Image& first = entry.part.planes.front();
    const Geometry& geometry = entry.series.geometry;
    const bool isReadable = !entry.series.planes.empty();
    Json json{{"volume", number},
              {"label", entry.part.label},
              {"columns", first.columns},
              {"rows", first.rows},
              {"slices", entry.part.planes.size()},
              {"readable", isReadable},
              {"syntax", first.transferSyntax}};
    if (isReadable) {
        json["spacing"] = {geometry.spacing[0], geometry.spacing[1], geometry.spacing[2]};
        json["spacing known"] = geometry.isScaled;
        json["placed"] = geometry.isPlaced;
        json["tilt"] = tiltOf(geometry);
    }
    json["lacks"] = entry.lacks;
    return json;
}

std::string rowOf(const Entry& entry, size_t number)
{
    const Image& first = entry.part.planes.front();
    const Geometry& geometry = entry.series.geometry;
    std::string row =
        KpString(0, "  %3zu  %5d x %5d x %5zu", number, first.columns, first.rows, entry.part.planes.size()).c_str();
    if (entry.series.planes.empty())
        row += "  cannot be read";
    else
        row += KpString(0, "  %8.4g x %8.4g x %8.4g mm  tilt %5.2f", geometry.spacing[0], geometry.spacing[1],
                        geometry.spacing[2], tiltOf(geometry))
                   .c_str();
    row += entry.part.label.empty() ? "" : "  " + printable(entry.part.label);
    return row + "\n" + (entry.lacks.empty() ? "" : "       " + entry.lacks + "\n");
}

}  // namespace

KpResult list(const Job& job, KpProgressInterface& progress)
{
    Scan scan;
    if (KpResult scanned = scanFolder(job.choice.folder, progress, scan); scanned.isBad())
        return scanned;
    if (progress.isCanceled())
        return KpResult(KpResult::Interrupted, "cancelled", nullptr);
    Json json{{"series", Json::array()},
              {"warnings", scan.warnings},
              {"otherFiles", scan.otherFiles},
              {"otherObjects", scan.otherObjects}};
    std::string table;
    for (const SeriesEntry& series : scan.series) {
        Json volumes = Json::array();
        table += printable(series.modality + "  " + series.uid + "  " + series.description) + "  (" +
                 std::to_string(series.images) + " images)\n";
        for (size_t i = 0; i < series.volumes.size(); ++i) {
            const Entry entry = entryOf(series.volumes[i]);
            table += rowOf(entry, i + 1);
            volumes.push_back(jsonOf(entry, i + 1));
        }
        json["series"].push_back({{"uid", series.uid},
                                  {"modality", series.modality},
                                  {"description", series.description},
                                  {"images", series.images},
                                  {"volumes", volumes}});
    }
    printWarnings(scan.warnings);
    if (scan.series.empty())
        return badInput("there are no DICOM images in '%s'", job.choice.folder.c_str());
    if (job.isJson)
        return printText(json.dump(2, ' ', false, Json::error_handler_t::replace) + "\n");
    return printText(table + std::to_string(scan.otherObjects) + " other DICOM objects, " +
                     std::to_string(scan.otherFiles) + " other files\n");
}
