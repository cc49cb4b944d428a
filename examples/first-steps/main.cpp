#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/rawdata/KpRawData.h>

#include <cstdio>

int main()
{
    HxParamBundle volume("Brain");
    volume.setTag("G0008-0060", "MR");
    volume.setTag("G0028-0030", "0.5\\0.75");
    KpDArray<float> spacing;
    if (volume.findTag("G0028-0030", spacing))
        std::printf("%s, %g mm x %g mm\n", volume.findTag("G0008-0060", "?"), double(spacing[0]), double(spacing[1]));

    short voxels[8] = {1, 2, 3, 4, 5, 6, 7, 1000}, mean = 0;
    unsigned char shown[8];
    KpRawData::downSample3D(&mean, {voxels, KpPrimType::Short}, 2, 2, 2, 2, 2, 2, nullptr);
    KpRawData::mapLinear({shown, KpPrimType::Byte}, {voxels, KpPrimType::Short}, 8, 0, 25.5);
    std::printf("mean %d, shown from %d to %d\n", mean, shown[0], shown[7]);

    KpString text;
    volume.print(text, 0, nullptr);
    std::fputs(text, stdout);
}
