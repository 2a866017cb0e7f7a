#pragma once

// The busy clip of the maintenance dialog: a sheet of paper rises out of one
// folder, flies across and drops into another, then a short pause before the
// loop starts again. Drawn pixel by pixel with a small fixed palette, so the
// same source always gives the same file.

#include "avi_writer.h"

#include <cmath>

namespace clipgen {

namespace scene {

enum Colour : std::uint8_t {
    Background,
    Outline,
    Folder,
    FolderShade,
    Paper,
    PaperLine,
    FolderFront
};

struct Canvas {
    int width;
    int height;
    std::vector<std::uint8_t> pixels;

    void fill(int x0, int y0, int x1, int y1, std::uint8_t colour)
    {
        for (int y = std::max(y0, 0); y <= std::min(y1, height - 1); ++y)
            for (int x = std::max(x0, 0); x <= std::min(x1, width - 1); ++x)
                pixels[std::size_t(y * width + x)] = colour;
    }
    void box(int x0, int y0, int x1, int y1, std::uint8_t inside)
    {
        fill(x0, y0, x1, y1, Outline);
        fill(x0 + 1, y0 + 1, x1 - 1, y1 - 1, inside);
    }
};

inline void folderBack(Canvas& c, int x)
{
    c.box(x, 13, x + 10, 17, FolderShade);  // the tab
    c.box(x, 16, x + 23, 33, FolderShade);
}

inline void folderFront(Canvas& c, int x)
{
    c.box(x + 1, 21, x + 24, 34, FolderFront);
    c.fill(x + 2, 22, x + 23, 22, Folder);
}

inline void sheet(Canvas& c, int left, int top)
{
    c.box(left, top, left + 8, top + 10, Paper);
    for (int line = top + 3; line <= top + 8; line += 2)
        c.fill(left + 2, line, left + 6, line, PaperLine);
}

}  // namespace scene

inline Clip fileMoveScene()
{
    using namespace scene;
    Clip clip;
    clip.width = 80;
    clip.height = 36;
    clip.microsecondsPerFrame = 66667;  // 15 frames a second
    clip.palette = {0xC0C0C0, 0x000000, 0xE8B84A, 0xA87A1E, 0xFFFFFF, 0x7F7F7F, 0xF8D070};
    const int flight = 16;
    const int pause = 4;
    const double pi = std::acos(-1.0);
    for (int f = 0; f < flight + pause; ++f) {
        Canvas c{clip.width, clip.height, std::vector<std::uint8_t>(std::size_t(clip.width * clip.height), Background)};
        folderBack(c, 2);
        folderBack(c, 54);
        if (f < flight) {
            const double t = double(f) / double(flight - 1);
            const int left = int(std::lround(8 + t * 52));
            const int top = int(std::lround(19 - 19 * std::sin(pi * t)));
            sheet(c, left, top);
        }
        folderFront(c, 2);
        folderFront(c, 54);
        clip.frames.push_back(std::move(c.pixels));
    }
    return clip;
}

}  // namespace clipgen
