#include "ParcelPictures.h"

#include "../pictures/Oblique.h"
#include "../pictures/Pictures.h"
#include "../volume/Space.h"

KpResult writePictures(Parcel& parcel, const OutputFolder& out)
{
    Volume shown;
    const Space space(parcel.frameUid, parcel.volume);
    display(parcel.volume, parcel.window, shown);
    KpResult written = writePlanes(shown, space, parcel.region.outline, out);
    written << writeOblique(shown, space, parcel.region.outline, out);
    written << writeOverview(shown, out, "overview.png");
    return written;
}
