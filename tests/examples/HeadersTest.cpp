#include "volume-road/dicom/DicomTree.h"

#include <kplib/foundation/KpString.h>
#include <kplib/imaging/KpWindowLevel.h>
#include <kplib/imaging/TmgImages.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>
#include <dcmtk/oflog/oflog.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <iostream>
#include <memory>
#include <set>
#include <vector>

// Real headers: what the library says of a tree is held against what the DICOM toolkit says of the file.

namespace {

namespace fs = std::filesystem;

struct Header {
    std::string path;
    DcmFileFormat file;
    HxParamBundle root{"Header"};
    DcmDataset& data() { return *file.getDataset(); }
};

void addHeaders(const fs::path& folder, std::vector<std::unique_ptr<Header>>& headers)
{
    std::error_code error;
    for (fs::recursive_directory_iterator entry(folder, error), end; !error && entry != end; entry.increment(error)) {
        auto header = std::make_unique<Header>();
        header->path = entry->path().string();
        if (entry->is_regular_file(error) && loadDicom(header->path.c_str(), header->file).isOk()) {
            fillHeader(header->root, header->file);
            headers.push_back(std::move(header));
        }
    }
}

std::vector<std::unique_ptr<Header>>& allHeaders()
{
    static std::vector<std::unique_ptr<Header>> headers = [] {
        OFLog::configure(OFLogger::OFF_LOG_LEVEL);
        std::vector<std::unique_ptr<Header>> read;
        for (const char* folder : {REAL_DATA, "/usr/lib/python3/dist-packages/pydicom/data/test_files"}) {
            const size_t before = read.size();
            addHeaders(folder, read);
            if (read.size() == before)
                std::cout << "skipped: no real headers in " << folder << '\n';
        }
        return read;
    }();
    return headers;
}

/// A text attribute of the data set itself, all values; false if it isn't there.
bool textOf(Header& header, const DcmTagKey& tag, std::string& text)
{
    OFString value;
    const bool isThere = header.data().findAndGetOFStringArray(tag, value).good();
    text.assign(value.c_str(), value.length());
    return isThere;
}

class Headers : public testing::Test {
protected:
    void SetUp() override
    {
        if (allHeaders().empty())
            GTEST_SKIP() << "no real headers on this machine";
    }
};

TEST_F(Headers, windowsAreThoseOfTheFile)
{
    int windows = 0;
    for (const auto& header : allHeaders()) {
        SCOPED_TRACE(header->path);
        std::string center, width, explanation;
        if (!textOf(*header, DCM_WindowCenter, center) || !textOf(*header, DCM_WindowWidth, width))
            continue;
        textOf(*header, DCM_WindowCenterWidthExplanation, explanation);
        const auto presets = KpWindowLevel::createFromTags(
            std::array<std::string, 3>{header->root.findTag("G0028-1050", ""), header->root.findTag("G0028-1051", ""),
                                       header->root.findTag("G0028-1055", "")});
        const auto tags = KpWindowLevel::toTags(presets);
        EXPECT_EQ(tags.center, center);
        EXPECT_EQ(tags.width, width);
        for (unsigned long i = 0; i < presets.size(); ++i) {
            double value = 0;
            ASSERT_TRUE(header->data().findAndGetFloat64(DCM_WindowCenter, value, i).good());
            EXPECT_EQ(presets[i].center(), static_cast<float>(value));
            ++windows;
        }
    }
    std::cout << windows << " windows\n";
}

TEST_F(Headers, numbersAreThoseOfTheFile)
{
    int numbers = 0, frames = 0;
    for (const auto& header : allHeaders()) {
        SCOPED_TRACE(header->path);
        Sint32 expected = 0;
        int number = -1;
        if (header->data().findAndGetSint32(DCM_InstanceNumber, expected).good()) {
            EXPECT_TRUE(Tmg::imageNumber(header->root, 0, number));
            EXPECT_EQ(number, expected);
            ++numbers;
        }
        const bool hasFrames = header->data().findAndGetSint32(DCM_NumberOfFrames, expected).good() && expected >= 2;
        EXPECT_EQ(Tmg::frameNumber(header->root, true, 1, number), hasFrames);
        frames += hasFrames;
    }
    std::cout << numbers << " instance numbers, " << frames << " objects of frames\n";
}

/// The creator of the block in which a private element lies; empty without a reservation.
std::string creatorOf(Header& header, const DcmTag& tag)
{
    std::string creator;
    textOf(header, DcmTagKey(tag.getGTag(), static_cast<Uint16>(tag.getETag() >> 8)), creator);
    return creator;
}

TEST_F(Headers, privateTagsAreFoundByTheirCreators)
{
    std::set<std::string> creators;
    int found = 0;
    for (const auto& header : allHeaders()) {
        SCOPED_TRACE(header->path);
        for (unsigned long i = 0; i < header->data().card(); ++i) {
            const DcmElement& element = *header->data().getElement(i);
            const DcmTag& tag = element.getTag();
            if (!tag.isPrivate() || tag.isPrivateReservation() || tag.getETag() < 0x1000 || element.ident() == EVR_SQ)
                continue;
            const std::string creator = creatorOf(*header, tag);
            if (creator.empty())
                continue;
            const KpString full(0, "G%04X-%04X", tag.getGTag(), tag.getETag());
            const KpString inBlock(0, "G%04X-00%02X", tag.getGTag(), tag.getETag() & 255);
            EXPECT_STREQ(header->root.findPrivateTag(creator.c_str(), inBlock, "none"),
                         header->root.findTag(full, "none"));
            creators.insert(creator);
            ++found;
        }
    }
    std::cout << found << " private elements of " << creators.size() << " creators\n";
}

}  // namespace
