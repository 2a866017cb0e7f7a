// clipgen: writes the maintenance dialog's busy clip.
//
//   clipgen OUTPUT.avi [rle8-delta|rle8|raw8|raw24]
//
// The shipped data/filemove.avi is "clipgen data/filemove.avi" (the default
// encoding, run-length encoded with only the changes after the first frame);
// `cmake --build build --target clip` rewrites it.

#include "filemove_scene.h"

#include <cstdio>
#include <cstring>

int main(int argc, char** argv)
{
    if (argc < 2 || argc > 3) {
        std::fputs("usage: clipgen OUTPUT.avi [rle8-delta|rle8|raw8|raw24]\n", stderr);
        return 2;
    }
    clipgen::Encoding encoding = clipgen::Encoding::Rle8Delta;
    if (argc == 3) {
        const char* name = argv[2];
        if (std::strcmp(name, "rle8") == 0)
            encoding = clipgen::Encoding::Rle8;
        else if (std::strcmp(name, "raw8") == 0)
            encoding = clipgen::Encoding::Raw8;
        else if (std::strcmp(name, "raw24") == 0)
            encoding = clipgen::Encoding::Raw24;
        else if (std::strcmp(name, "rle8-delta") != 0) {
            std::fprintf(stderr, "clipgen: unknown encoding %s\n", name);
            return 2;
        }
    }
    const std::vector<std::uint8_t> bytes = clipgen::writeAvi(clipgen::fileMoveScene(), encoding);
    std::FILE* out = std::fopen(argv[1], "wb");
    if (!out) {
        std::perror(argv[1]);
        return 1;
    }
    const bool written = std::fwrite(bytes.data(), 1, bytes.size(), out) == bytes.size();
    if (std::fclose(out) != 0 || !written) {
        std::perror(argv[1]);
        return 1;
    }
    return 0;
}
