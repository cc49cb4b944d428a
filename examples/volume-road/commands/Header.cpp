#include "../dicom/DicomTree.h"
#include "../report/TreeJson.h"
#include "Commands.h"
#include "Load.h"

#include <string>

KpResult printHeader(const Job& job)
{
    if (job.isJson) {
        std::string json;
        KpResult read = readHeaderAsJson(job.source.c_str(), json);
        return read.isOk() ? printText(json + "\n") : read;
    }
    HxParamBundle root("Header");
    if (KpResult read = readHeader(job.source.c_str(), root); read.isBad())
        return read;
    KpString text;
    root.print(text, 0, nullptr);
    return printText(text.c_str());
}
