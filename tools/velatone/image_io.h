// Image files for the velatone tool: read into straight RGBA floats and written back, keeping
// alpha as the file stores it (never premultiplied on reading or divided out on writing).
#pragma once

#include <string>
#include <vector>

namespace velatone {

struct Image {
    int width = 0;
    int height = 0;
    int channels = 0;    // as stored in the file: 1 grey, 2 grey+alpha, 3 RGB, 4 RGBA
    int depth = 8;       // 8, 16 or 32 (half and float files are 32)
    std::string format;  // the file's own pixel type name, e.g. "uint8", "half"
    std::vector<float> rgba;  // width * height * 4, straight alpha (1 where the file has none)
};

bool ReadImage(const std::string& path, Image* image, std::string* error);
// Writes with the channels and pixel type of `like` (the input file), as the output's format allows.
bool WriteImage(const std::string& path, const Image& image, std::string* error);

// Frame-numbered names: "in.####.exr" with frame 12 is "in.0012.exr". Paths without a run of '#' are
// single files.
bool IsSequencePattern(const std::string& pattern);
std::string FramePath(const std::string& pattern, int frame);
// The frame numbers for which the pattern names an existing file, in order.
std::vector<int> ExistingFrames(const std::string& pattern);

}  // namespace velatone
