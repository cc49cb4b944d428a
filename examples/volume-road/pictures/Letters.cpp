#include "Letters.h"

#include <algorithm>
#include <initializer_list>
#include <iterator>
#include <string>
#include <utility>

namespace {

constexpr long glyphWidth = 5, glyphHeight = 7;

struct Glyph {
    char letter;
    const char* rows[glyphHeight];
};

const Glyph glyphs[] = {
    {'L', {"#    ", "#    ", "#    ", "#    ", "#    ", "#    ", "#####"}},
    {'R', {"#### ", "#   #", "#   #", "#### ", "# #  ", "#  # ", "#   #"}},
    {'P', {"#### ", "#   #", "#   #", "#### ", "#    ", "#    ", "#    "}},
    {'A', {" ### ", "#   #", "#   #", "#####", "#   #", "#   #", "#   #"}},
    {'H', {"#   #", "#   #", "#   #", "#####", "#   #", "#   #", "#   #"}},
    {'F', {"#####", "#    ", "#    ", "#### ", "#    ", "#    ", "#    "}},
};

/// Fills the square of each dot of a glyph, grown by `rim` pixels on all sides.
void drawGlyph(Picture& picture, const Glyph& glyph, long left, long top, long dot, long rim, unsigned char grey)
{
    for (long y = 0; y < glyphHeight; ++y) {
        for (long x = 0; x < glyphWidth; ++x) {
            if (glyph.rows[y][x] != '#')
                continue;
            for (long row = top + y * dot - rim; row < top + (y + 1) * dot + rim; ++row) {
                for (long column = left + x * dot - rim; column < left + (x + 1) * dot + rim; ++column)
                    picture.set(column, row, grey);
            }
        }
    }
}

/// Draws a text with its middle at the given place, as a share of what room the picture leaves within its margin.
void drawText(Picture& picture, const std::string& text, double across, double down)
{
    const long dot = std::clamp(std::min(picture.width, picture.height) / 70, 1L, 4L);
    const long margin = 3 * dot, advance = (glyphWidth + 1) * dot;
    const long width = static_cast<long>(text.size()) * advance - dot;
    const auto room = [&](long size, long own, double share) {
        return margin + static_cast<long>(static_cast<double>(size - own - 2 * margin) * share);
    };
    const long left = room(picture.width, width, across);
    const long top = room(picture.height, glyphHeight * dot, down);
    for (const auto& [rim, grey] : {std::pair<long, unsigned char>{dot, 0}, {0L, 255}}) {
        for (size_t i = 0; i < text.size(); ++i) {
            const auto glyph = std::find_if(std::begin(glyphs), std::end(glyphs),
                                            [&](const Glyph& candidate) { return candidate.letter == text[i]; });
            if (glyph != std::end(glyphs))
                drawGlyph(picture, *glyph, left + static_cast<long>(i) * advance, top, dot, rim, grey);
        }
    }
}

}  // namespace

void drawLetters(Picture& picture, const KpOrientationLetters& letters)
{
    if (std::min(picture.width, picture.height) < 5 * glyphHeight)
        return;
    drawText(picture, letters.right(), 1, 0.5);
    drawText(picture, letters.top(), 0.5, 0);
    drawText(picture, letters.left(), 0, 0.5);
    drawText(picture, letters.bottom(), 0.5, 1);
}
