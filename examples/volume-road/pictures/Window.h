#pragma once

#include "../volume/Volume.h"

#include <kplib/imaging/KpWindowLevel.h>

#include <string>
#include <vector>

/// The range of displayed values that runs from black to white, and the function between.
struct Window {
    enum Function : int { Linear, LinearExact, Sigmoid };

    double center = 0, width = 1;  ///< displayed values, as in DICOM's window centre and width
    Function function = Linear;
    bool isInverted = false;  ///< low values are white
    std::string origin;       ///< for the report
};

/// The windows that the headers of a series recommend.
struct Windows {
    std::vector<KpWindowLevel> presets;
    Window::Function function = Window::Linear;
    bool isInverted = false;
    std::string origin;  ///< where the presets come from

    Window of(const KpWindowLevel& preset) const;
};

const char* nameOf(Window::Function function);

/// The presets of three texts of a header that can be shown by `function`.
std::vector<KpWindowLevel> presetsOf(const std::string& centers, const std::string& widths,
                                     const std::string& explanations, Window::Function function);

/// The first of the recommended windows. If there is none, the window from the lowest to the highest value of the
/// volume, half a percent at either end and padding left out.
Window windowOf(const Windows& windows, Volume& volume);

/// The volume through the window, as bytes, into `shown`, whose memory is used again. Padding becomes black, colours
/// stay as they are. DICOM PS3.3, C.11.2.1.2 and C.11.2.1.3.
void display(Volume& volume, const Window& window, Volume& shown);
