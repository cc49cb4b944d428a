#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpString.h>

#include <string>
#include <vector>

// Records of a loader for a series and its images. The loader defines the meaning of the texts;
// these classes store them.

namespace Tmg {

/// One image.
class KPLIB_API ImageInfo {
public:
    /// Of two texts.
    ImageInfo(const std::string& first, const std::string& second) : first_(first), second_(second) {}
    ImageInfo(const ImageInfo&) = delete;
    ImageInfo& operator=(const ImageInfo&) = delete;
    virtual ~ImageInfo();

    /// @{
    /// A text of the image.
    const std::string& first() const { return first_; }
    const std::string& second() const { return second_; }
    /// @}

    /// A word for the loader, 0 at first.
    long long word() const { return word_; }
    /// Sets that word.
    void setWord(long long word) { word_ = word; }

private:
    std::string first_;
    std::string second_;
    long long word_ = 0;
};

/// A series, which owns its images.
class KPLIB_API SeriesInfo : public KpHandable {
public:
    /// Without images.
    explicit SeriesInfo(const std::string& series) : series_(series) {}
    SeriesInfo(const SeriesInfo&) = delete;
    SeriesInfo& operator=(const SeriesInfo&) = delete;
    /// Deletes the images.
    ~SeriesInfo() override;

    /// The text of the series.
    const std::string& series() const { return series_; }
    /// @{
    /// The images, owned by this.
    std::vector<ImageInfo*>& images() { return images_; }
    const std::vector<ImageInfo*>& images() const { return images_; }
    /// @}

    /// A flag for the loader, false at first.
    bool isFlagged() const { return flag_; }
    /// Sets that flag.
    void setFlagged(bool flag) { flag_ = flag; }

private:
    std::string series_;
    std::vector<ImageInfo*> images_;
    bool flag_ = false;
};

/// Collects the images of a series while they are loaded.
class KPLIB_API ImageSeriesHelper {
public:
    /// Without images.
    explicit ImageSeriesHelper(const std::string& series) : series_(series) {}
    ImageSeriesHelper(const ImageSeriesHelper&) = delete;
    ImageSeriesHelper& operator=(const ImageSeriesHelper&) = delete;
    /// Deletes the images that are still here.
    ~ImageSeriesHelper();

    /// Makes the SeriesInfo if there is none yet.
    void create2DImageSet();
    /// create2DImageSet(), and a new image of the two texts.
    void processImage(const std::string& a, const std::string& b);

    /// The text of the series.
    const std::string& series() const { return series_; }
    /// The images so far. Code that moves them, for example into the images of the SeriesInfo,
    /// removes them from here.
    std::vector<ImageInfo*>& images() { return images_; }
    /// The series, null before create2DImageSet().
    const KpHandle<SeriesInfo>& seriesInfo() const { return seriesInfo_; }

private:
    std::string series_;
    std::vector<ImageInfo*> images_;
    KpHandle<SeriesInfo> seriesInfo_;
};

/// Loads volumes into a cache before their use. The installed function defines the meaning of
/// names and flags.
using VolumeCachePrecache = bool (*)(KpDArray<KpString>& names, bool flag1, bool flag2);

/// Calls the installed function.
KPLIB_API bool volumeCachePrecache(KpDArray<KpString>& names, bool flag1, bool flag2);
/// Installs a function; null stands for the default one. Process-wide and unlocked: set it before
/// other threads start.
KPLIB_API void volumeCacheSetFuncPrecache(VolumeCachePrecache function);
/// Does nothing and gives false.
KPLIB_API bool volumeCachePrecache_default(KpDArray<KpString>& names, bool flag1, bool flag2);

}  // namespace Tmg
