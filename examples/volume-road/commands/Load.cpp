#include "Load.h"

#include <kplib/log/KpLogFile.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

void loadSeries(const Job& job, Road& road, KpProgressInterface& progress, Series& series, Volume& volume,
                HxParamBundle& root)
{
    road.nested("look for images", [&] { return scanSeries(job.choice, progress, series); });
    printWarnings(series.warnings);
    road.nested("read images", [&] { return readSeries(series, progress, volume, root); });
}

void printWarnings(const std::vector<std::string>& warnings)
{
    for (const std::string& warning : warnings) {
        std::fprintf(stderr, "volume-road: warning: %s\n", warning.c_str());
        getTheLogInstance().warn(nullptr, warning.c_str());
    }
}

KpResult printText(const std::string& text)
{
    const bool isWritten = std::fwrite(text.data(), 1, text.size(), stdout) == text.size();
    if (!isWritten || std::fflush(stdout) != 0)
        return badInput("can't write to standard output: %s", std::strerror(errno));
    return KpResult();
}
