#include "tools/velatone/image_io.h"

#include <OpenImageIO/imageio.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <regex>

namespace velatone {

namespace {

int DepthOf(const OIIO::TypeDesc& type) {
    if (type == OIIO::TypeDesc::UINT8 || type == OIIO::TypeDesc::INT8) return 8;
    if (type == OIIO::TypeDesc::UINT16 || type == OIIO::TypeDesc::INT16) return 16;
    return 32;
}

// The run of '#' characters in the file name part of a pattern: its start and length.
bool HashRun(const std::string& pattern, size_t* start, size_t* length) {
    const size_t slash = pattern.find_last_of("/\\");
    const size_t from = slash == std::string::npos ? 0 : slash + 1;
    const size_t first = pattern.find('#', from);
    if (first == std::string::npos) return false;
    size_t end = first;
    while (end < pattern.size() && pattern[end] == '#') ++end;
    *start = first;
    *length = end - first;
    return true;
}

}  // namespace

bool ReadImage(const std::string& path, Image* image, std::string* error) {
    OIIO::ImageSpec config;
    config.attribute("oiio:UnassociatedAlpha", 1);
    auto input = OIIO::ImageInput::open(path, &config);
    if (!input) {
        *error = "cannot read " + path + ": " + OIIO::geterror();
        return false;
    }
    const OIIO::ImageSpec& header = input->spec();
    if (header.width <= 0 || header.height <= 0 || header.nchannels <= 0) {
        *error = path + " holds no pixels";
        return false;
    }
    image->width = header.width;
    image->height = header.height;
    image->channels = std::min(header.nchannels, 4);
    image->depth = DepthOf(header.format);
    image->format = header.format.c_str();
    std::vector<float> pixels(static_cast<size_t>(header.width) * static_cast<size_t>(header.height) *
                              static_cast<size_t>(header.nchannels));
    if (!input->read_image(0, 0, 0, header.nchannels, OIIO::TypeDesc::FLOAT, pixels.data())) {
        *error = "cannot read " + path + ": " + input->geterror();
        return false;
    }
    const size_t count = static_cast<size_t>(header.width) * static_cast<size_t>(header.height);
    image->rgba.assign(count * 4, 1.0f);
    const int alphaChannel = header.alpha_channel >= 0 ? header.alpha_channel : (header.nchannels == 2 || header.nchannels >= 4 ? header.nchannels - 1 : -1);
    for (size_t i = 0; i < count; ++i) {
        const float* p = pixels.data() + i * static_cast<size_t>(header.nchannels);
        float* out = image->rgba.data() + i * 4;
        if (header.nchannels < 3) {
            out[0] = out[1] = out[2] = p[0];
        } else {
            out[0] = p[0], out[1] = p[1], out[2] = p[2];
        }
        if (alphaChannel >= 0) out[3] = p[alphaChannel];
    }
    return true;
}

bool WriteImage(const std::string& path, const Image& image, std::string* error) {
    auto output = OIIO::ImageOutput::create(path);
    if (!output) {
        *error = "cannot write " + path + ": " + OIIO::geterror();
        return false;
    }
    const int channels = image.channels == 1 ? 1 : image.channels == 2 ? 2 : image.channels == 3 ? 3 : 4;
    OIIO::TypeDesc type = image.format.empty() ? OIIO::TypeDesc::UINT8 : OIIO::TypeDesc(image.format);
    OIIO::ImageSpec header(image.width, image.height, channels, type);
    if (channels == 2 || channels == 4) {
        header.alpha_channel = channels - 1;
        header.attribute("oiio:UnassociatedAlpha", 1);
    }
    const size_t count = static_cast<size_t>(image.width) * static_cast<size_t>(image.height);
    std::vector<float> pixels(count * static_cast<size_t>(channels));
    for (size_t i = 0; i < count; ++i) {
        const float* in = image.rgba.data() + i * 4;
        float* out = pixels.data() + i * static_cast<size_t>(channels);
        switch (channels) {
            case 1: out[0] = 0.299f * in[0] + 0.587f * in[1] + 0.114f * in[2]; break;
            case 2: out[0] = 0.299f * in[0] + 0.587f * in[1] + 0.114f * in[2], out[1] = in[3]; break;
            case 3: out[0] = in[0], out[1] = in[1], out[2] = in[2]; break;
            default: out[0] = in[0], out[1] = in[1], out[2] = in[2], out[3] = in[3]; break;
        }
    }
    // Written next to the destination and moved over it once complete, so a failure never leaves
    // a half-written file under the requested name.
    const std::string partial = path + ".partial" + std::filesystem::path(path).extension().string();
    if (!output->open(partial, header) || !output->write_image(OIIO::TypeDesc::FLOAT, pixels.data()) ||
        !output->close()) {
        *error = "cannot write " + path + ": " + output->geterror();
        std::remove(partial.c_str());
        return false;
    }
    std::error_code code;
    std::filesystem::rename(partial, path, code);
    if (code) {
        *error = "cannot write " + path + ": " + code.message();
        std::remove(partial.c_str());
        return false;
    }
    return true;
}

bool IsSequencePattern(const std::string& pattern) {
    size_t start = 0;
    size_t length = 0;
    return HashRun(pattern, &start, &length);
}

std::string FramePath(const std::string& pattern, int frame) {
    size_t start = 0;
    size_t length = 0;
    if (!HashRun(pattern, &start, &length)) return pattern;
    char number[32];
    std::snprintf(number, sizeof number, "%0*d", static_cast<int>(length), frame);
    return pattern.substr(0, start) + number + pattern.substr(start + length);
}

std::vector<int> ExistingFrames(const std::string& pattern) {
    size_t start = 0;
    size_t length = 0;
    std::vector<int> frames;
    if (!HashRun(pattern, &start, &length)) return frames;
    const std::filesystem::path full(pattern);
    const std::filesystem::path folder = full.has_parent_path() ? full.parent_path() : std::filesystem::path(".");
    const std::string name = full.filename().string();
    const size_t nameStart = name.find('#');
    const std::regex matcher(std::regex_replace(name.substr(0, nameStart), std::regex(R"([.^$|()\[\]{}*+?\\])"), R"(\$&)") +
                             "([0-9]{" + std::to_string(length) + ",})" +
                             std::regex_replace(name.substr(nameStart + length), std::regex(R"([.^$|()\[\]{}*+?\\])"), R"(\$&)"));
    std::error_code code;
    for (const auto& entry : std::filesystem::directory_iterator(folder, code)) {
        std::smatch match;
        const std::string file = entry.path().filename().string();
        if (std::regex_match(file, match, matcher)) frames.push_back(std::stoi(match[1].str()));
    }
    std::sort(frames.begin(), frames.end());
    return frames;
}

}  // namespace velatone
