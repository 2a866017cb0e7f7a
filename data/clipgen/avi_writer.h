#pragma once

// Writes a silent AVI clip of paletted frames: one video stream, frames
// uncompressed (8 or 24 bits a pixel) or run-length encoded (RLE8, each frame
// whole or only what changed since the one before). Plain C++, so the clip
// generator needs nothing else; the tests use it to build odd clips.

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace clipgen {

struct Clip {
    int width = 0;
    int height = 0;
    int microsecondsPerFrame = 66667;
    std::vector<std::uint32_t> palette;             // 0xRRGGBB, at most 256
    std::vector<std::vector<std::uint8_t>> frames;  // palette indices, top row first
};

enum class Encoding {
    Raw8,
    Raw24,
    Rle8,
    Rle8Delta
};

namespace detail {

inline void put16(std::vector<std::uint8_t>& out, std::uint32_t v)
{
    out.push_back(std::uint8_t(v));
    out.push_back(std::uint8_t(v >> 8));
}

inline void put32(std::vector<std::uint8_t>& out, std::uint32_t v)
{
    put16(out, v & 0xffff);
    put16(out, v >> 16);
}

inline void putTag(std::vector<std::uint8_t>& out, const char* tag)
{
    out.insert(out.end(), tag, tag + 4);
}

inline void set32(std::vector<std::uint8_t>& out, std::size_t at, std::uint32_t v)
{
    for (int i = 0; i < 4; ++i)
        out[at + std::size_t(i)] = std::uint8_t(v >> (8 * i));
}

// Opens a chunk (or a LIST/RIFF with its form type) and returns where its
// size goes; close() fills the size in and pads to an even length.
inline std::size_t open(std::vector<std::uint8_t>& out, const char* tag, const char* form = nullptr)
{
    putTag(out, tag);
    const std::size_t at = out.size();
    put32(out, 0);
    if (form)
        putTag(out, form);
    return at;
}

inline void close(std::vector<std::uint8_t>& out, std::size_t at)
{
    set32(out, at, std::uint32_t(out.size() - at - 4));
    if (out.size() % 2)
        out.push_back(0);
}

// One row of RLE8: pixels equal to the previous frame are skipped with
// delta escapes (when there is a previous frame), runs of three or more
// become encoded runs, the rest absolute runs.
inline void encodeRow(std::vector<std::uint8_t>& out, const std::uint8_t* row, const std::uint8_t* before, int width)
{
    int x = 0;
    auto same = [&](int i) { return before && row[i] == before[i]; };
    auto runAt = [&](int i) {
        int n = 1;
        while (i + n < width && n < 255 && row[i + n] == row[i] && !same(i + n))
            ++n;
        return n;
    };
    while (x < width) {
        if (same(x)) {
            int skip = 0;
            while (x + skip < width && same(x + skip))
                ++skip;
            if (x + skip == width)
                return;  // the end of line leaves the rest as it was
            for (int left = skip; left > 0;) {
                const int step = left > 255 ? 255 : left;
                out.insert(out.end(), {0, 2, std::uint8_t(step), 0});
                left -= step;
            }
            x += skip;
            continue;
        }
        const int run = runAt(x);
        if (run >= 3) {
            out.push_back(std::uint8_t(run));
            out.push_back(row[x]);
            x += run;
            continue;
        }
        int literal = 0;
        while (x + literal < width && literal < 255 && !same(x + literal) && runAt(x + literal) < 3)
            ++literal;
        if (literal < 3) {
            for (int i = 0; i < literal; ++i) {
                out.push_back(1);
                out.push_back(row[x + i]);
            }
        } else {
            out.push_back(0);
            out.push_back(std::uint8_t(literal));
            out.insert(out.end(), row + x, row + x + literal);
            if (literal % 2)
                out.push_back(0);
        }
        x += literal;
    }
}

inline std::vector<std::uint8_t> encodeFrame(const Clip& clip, std::size_t index, Encoding encoding)
{
    std::vector<std::uint8_t> out;
    const std::vector<std::uint8_t>& frame = clip.frames[index];
    const int w = clip.width;
    const int h = clip.height;
    // Device-independent bitmaps store the bottom row first.
    if (encoding == Encoding::Raw8 || encoding == Encoding::Raw24) {
        const int bytes = encoding == Encoding::Raw8 ? 1 : 3;
        const int stride = (w * bytes + 3) / 4 * 4;
        for (int y = h - 1; y >= 0; --y) {
            const std::size_t start = out.size();
            for (int x = 0; x < w; ++x) {
                const std::uint8_t i = frame[std::size_t(y * w + x)];
                if (bytes == 1) {
                    out.push_back(i);
                } else {
                    const std::uint32_t rgb = i < clip.palette.size() ? clip.palette[i] : 0;
                    out.push_back(std::uint8_t(rgb));
                    out.push_back(std::uint8_t(rgb >> 8));
                    out.push_back(std::uint8_t(rgb >> 16));
                }
            }
            out.resize(start + std::size_t(stride), 0);
        }
        return out;
    }
    const std::vector<std::uint8_t>* before =
        encoding == Encoding::Rle8Delta && index > 0 ? &clip.frames[index - 1] : nullptr;
    for (int y = h - 1; y >= 0; --y) {
        encodeRow(out, &frame[std::size_t(y * w)], before ? &(*before)[std::size_t(y * w)] : nullptr, w);
        if (y > 0)
            out.insert(out.end(), {0, 0});
    }
    out.insert(out.end(), {0, 1});
    return out;
}

}  // namespace detail

// The whole file. Frame rate from microsecondsPerFrame; a key-frame index
// (idx1) follows the frames.
inline std::vector<std::uint8_t> writeAvi(const Clip& clip, Encoding encoding)
{
    using namespace detail;
    const bool rle = encoding == Encoding::Rle8 || encoding == Encoding::Rle8Delta;
    const bool paletted = encoding != Encoding::Raw24;
    const std::uint32_t frames = std::uint32_t(clip.frames.size());
    std::vector<std::vector<std::uint8_t>> data;
    std::size_t largest = 0;
    for (std::size_t i = 0; i < clip.frames.size(); ++i) {
        data.push_back(encodeFrame(clip, i, encoding));
        largest = std::max(largest, data.back().size());
    }

    std::vector<std::uint8_t> out;
    const std::size_t riff = open(out, "RIFF", "AVI ");
    const std::size_t hdrl = open(out, "LIST", "hdrl");
    const std::size_t avih = open(out, "avih");
    put32(out, std::uint32_t(clip.microsecondsPerFrame));
    put32(out, 0);     // max bytes per second
    put32(out, 0);     // padding granularity
    put32(out, 0x10);  // has an index
    put32(out, frames);
    put32(out, 0);  // initial frames
    put32(out, 1);  // streams
    put32(out, std::uint32_t(largest));
    put32(out, std::uint32_t(clip.width));
    put32(out, std::uint32_t(clip.height));
    for (int i = 0; i < 4; ++i)
        put32(out, 0);
    close(out, avih);

    const std::size_t strl = open(out, "LIST", "strl");
    const std::size_t strh = open(out, "strh");
    putTag(out, "vids");
    putTag(out, rle ? "RLE " : "DIB ");
    put32(out, 0);                                         // flags
    put16(out, 0);                                         // priority
    put16(out, 0);                                         // language
    put32(out, 0);                                         // initial frames
    put32(out, std::uint32_t(clip.microsecondsPerFrame));  // scale
    put32(out, 1000000);                                   // rate: frames per second = rate / scale
    put32(out, 0);                                         // start
    put32(out, frames);                                    // length
    put32(out, std::uint32_t(largest));
    put32(out, 0xffffffffu);  // quality
    put32(out, 0);            // sample size
    put16(out, 0);
    put16(out, 0);
    put16(out, std::uint32_t(clip.width));
    put16(out, std::uint32_t(clip.height));
    close(out, strh);

    const std::size_t strf = open(out, "strf");
    put32(out, 40);
    put32(out, std::uint32_t(clip.width));
    put32(out, std::uint32_t(clip.height));  // positive: bottom row first
    put16(out, 1);
    put16(out, paletted ? 8 : 24);
    put32(out, rle ? 1 : 0);  // BI_RLE8 or BI_RGB
    put32(out, std::uint32_t(largest));
    put32(out, 0);
    put32(out, 0);
    put32(out, paletted ? std::uint32_t(clip.palette.size()) : 0);
    put32(out, 0);
    if (paletted) {
        for (const std::uint32_t rgb : clip.palette) {
            out.push_back(std::uint8_t(rgb));
            out.push_back(std::uint8_t(rgb >> 8));
            out.push_back(std::uint8_t(rgb >> 16));
            out.push_back(0);
        }
    }
    close(out, strf);
    close(out, strl);
    close(out, hdrl);

    const std::size_t movi = open(out, "LIST", "movi");
    const std::size_t moviTag = movi + 4;  // index offsets count from the "movi" form type
    std::vector<std::uint32_t> offsets;
    for (const auto& frame : data) {
        offsets.push_back(std::uint32_t(out.size() - moviTag));
        const std::size_t chunk = open(out, rle ? "00dc" : "00db");
        out.insert(out.end(), frame.begin(), frame.end());
        close(out, chunk);
    }
    close(out, movi);

    const std::size_t idx1 = open(out, "idx1");
    for (std::size_t i = 0; i < data.size(); ++i) {
        putTag(out, rle ? "00dc" : "00db");
        const bool key = encoding != Encoding::Rle8Delta || i == 0;
        put32(out, key ? 0x10 : 0);
        put32(out, offsets[i]);
        put32(out, std::uint32_t(data[i].size()));
    }
    close(out, idx1);
    close(out, riff);
    return out;
}

}  // namespace clipgen
