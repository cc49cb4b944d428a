#pragma once

#include "Picture.h"

#include <kplib/imaging/KpOrientationLetters.h>

/// Draws into the middle of each edge of the picture which way the patient lies there, white in a black rim.
/// Nothing into a picture that has no room for them.
void drawLetters(Picture& picture, const KpOrientationLetters& letters);
