#include "volume-road/dicom/DicomTree.h"

#include <kplib/foundation/KpString.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>
#include <dcmtk/oflog/oflog.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <iostream>
#include <vector>

// Real headers: what the library says of a tree is held against what the DICOM toolkit says of the file.

namespace {

namespace fs = std::filesystem;

std::vector<std::string> realFiles()
{
    std::vector<std::string> paths;
    for (const char* folder : {REAL_DATA, "/usr/lib/python3/dist-packages/pydicom/data/test_files"}) {
        const size_t before = paths.size();
        std::error_code error;
        for (fs::recursive_directory_iterator entry(folder, error), end; !error && entry != end;
             entry.increment(error)) {
            if (entry->is_regular_file(error))
                paths.push_back(entry->path().string());
        }
        if (paths.size() == before)
            std::cout << "skipped: no real headers in " << folder << '\n';
    }
    return paths;
}

void findPrivateTags(DcmDataset& data, HxParamBundle& root)
{
    for (unsigned long i = 0; i < data.card(); ++i) {
        const DcmElement& element = *data.getElement(i);
        const DcmTag& tag = element.getTag();
        if (!tag.isPrivate() || tag.isPrivateReservation() || tag.getETag() < 0x1000 || element.ident() == EVR_SQ)
            continue;
        OFString creator;  // of the block that the element lies in
        data.findAndGetOFStringArray(DcmTagKey(tag.getGTag(), static_cast<Uint16>(tag.getETag() >> 8)), creator);
        if (creator.empty())
            continue;
        const KpString full(0, "G%04X-%04X", tag.getGTag(), tag.getETag());
        const KpString inBlock(0, "G%04X-00%02X", tag.getGTag(), tag.getETag() & 255);
        EXPECT_STREQ(root.findPrivateTag(creator.c_str(), inBlock, "none"), root.findTag(full, "none"));
    }
}

TEST(Headers, privateTagsAreFoundByTheirCreators)
{
    OFLog::configure(OFLogger::OFF_LOG_LEVEL);
    for (const std::string& path : realFiles()) {
        SCOPED_TRACE(path);
        DcmFileFormat file;
        HxParamBundle root("Header");
        if (!loadDicom(path.c_str(), file).isOk())
            continue;
        fillHeader(root, file);
        findPrivateTags(*file.getDataset(), root);
    }
}

}  // namespace
