#include <kplib/imaging/TmgSeries.h>

#include <memory>

namespace {

Tmg::VolumeCachePrecache funcPrecache = Tmg::volumeCachePrecache_default;

void deleteAll(const std::vector<Tmg::ImageInfo*>& images)
{
    for (const Tmg::ImageInfo* image : images)
        delete image;
}

}  // namespace

namespace Tmg {

ImageInfo::~ImageInfo() = default;

SeriesInfo::~SeriesInfo()
{
    deleteAll(images_);
}

ImageSeriesHelper::~ImageSeriesHelper()
{
    deleteAll(images_);
}

void ImageSeriesHelper::create2DImageSet()
{
    if (!seriesInfo_)
        seriesInfo_ = new SeriesInfo(series_);
}

void ImageSeriesHelper::processImage(const std::string& a, const std::string& b)
{
    create2DImageSet();
    auto image = std::make_unique<ImageInfo>(a, b);
    images_.push_back(image.get());
    static_cast<void>(image.release());
}

bool volumeCachePrecache(KpDArray<KpString>& names, bool flag1, bool flag2)
{
    return funcPrecache(names, flag1, flag2);
}

void volumeCacheSetFuncPrecache(VolumeCachePrecache function)
{
    funcPrecache = function ? function : volumeCachePrecache_default;
}

bool volumeCachePrecache_default(KpDArray<KpString>& /*names*/, bool /*flag1*/, bool /*flag2*/)
{
    return false;
}

}  // namespace Tmg
