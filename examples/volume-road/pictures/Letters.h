#pragma once

#include "Picture.h"

#include <kplib/imaging/KpOrientationLetters.h>

/// Draws the patient's direction into the middle of each edge of the picture, white with a black
/// rim. Draws nothing into a picture that is too small.
void drawLetters(Picture& picture, const KpOrientationLetters& letters);
