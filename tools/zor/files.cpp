// Reading and writing the user's files: PNG through libpng's simplified
// interface, binary PPM/PGM and 16-bit PCM WAV by hand.  Every failure is one
// line that names the file and what is wrong with it.
#include <png.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>

#include "tools/zor/tool.h"

namespace ztool {
namespace {

[[noreturn]] void fail(const std::string& path, const std::string& what) { throw UserError(path + ": " + what); }

std::vector<uint8_t> slurp(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) fail(path, std::string("cannot open (") + std::strerror(errno) + ")");
    std::vector<uint8_t> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (in.bad()) fail(path, "read error");
    return bytes;
}

void spill(const std::string& path, const void* data, size_t n) {
    std::ofstream out(path, std::ios::binary);
    if (!out) fail(path, std::string("cannot create (") + std::strerror(errno) + ")");
    out.write(static_cast<const char*>(data), static_cast<std::streamsize>(n));
    if (!out) fail(path, "write error");
}

bool endsWith(const std::string& s, const char* tail) {
    const size_t n = std::strlen(tail);
    if (s.size() < n) return false;
    for (size_t i = 0; i < n; ++i)
        if (std::tolower(static_cast<unsigned char>(s[s.size() - n + i])) != tail[i]) return false;
    return true;
}

Image readPng(const std::string& path, const std::vector<uint8_t>& bytes) {
    png_image png;
    std::memset(&png, 0, sizeof png);
    png.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_memory(&png, bytes.data(), bytes.size()))
        fail(path, std::string("not a readable PNG (") + png.message + ")");
    const bool colour = png.format & PNG_FORMAT_FLAG_COLOR;
    const bool alpha = png.format & PNG_FORMAT_FLAG_ALPHA;
    png.format = colour ? (alpha ? PNG_FORMAT_RGBA : PNG_FORMAT_RGB) : (alpha ? PNG_FORMAT_GA : PNG_FORMAT_GRAY);
    Image img(static_cast<int>(png.width), static_cast<int>(png.height),
              static_cast<int>(PNG_IMAGE_SAMPLE_CHANNELS(png.format)));
    if (!png_image_finish_read(&png, nullptr, img.px.data(), img.step(), nullptr)) {
        const std::string msg = png.message;
        png_image_free(&png);
        fail(path, "damaged PNG (" + msg + ")");
    }
    if (img.channels == 2) {  // grey + alpha: keep the grey
        Image grey(img.width, img.height, 1);
        for (size_t i = 0; i < grey.px.size(); ++i) grey.px[i] = img.px[2 * i];
        return grey;
    }
    return img;
}

Image readPnm(const std::string& path, const std::vector<uint8_t>& bytes) {
    size_t at = 2;
    auto number = [&](const char* what) {
        for (;;) {  // white space and comments
            while (at < bytes.size() && std::isspace(bytes[at])) ++at;
            if (at < bytes.size() && bytes[at] == '#') {
                while (at < bytes.size() && bytes[at] != '\n') ++at;
            } else {
                break;
            }
        }
        long v = 0;
        if (at >= bytes.size() || !std::isdigit(bytes[at])) fail(path, std::string("bad header: no ") + what);
        while (at < bytes.size() && std::isdigit(bytes[at]) && v < 1000000) v = v * 10 + (bytes[at++] - '0');
        return v;
    };
    const int channels = bytes[1] == '6' ? 3 : 1;
    const long w = number("width"), h = number("height"), maxval = number("maxval");
    if (w < 1 || h < 1 || w > 65535 || h > 65535)
        fail(path, "bad size " + std::to_string(w) + " x " + std::to_string(h));
    if (maxval != 255) fail(path, "maxval " + std::to_string(maxval) + " is not supported (8-bit samples only)");
    ++at;  // the single white-space byte before the samples
    Image img(static_cast<int>(w), static_cast<int>(h), channels);
    if (bytes.size() < at + img.px.size())
        fail(path, "truncated: " + std::to_string(img.px.size()) + " bytes of samples expected, " +
                       std::to_string(bytes.size() > at ? bytes.size() - at : 0) + " found");
    std::memcpy(img.px.data(), bytes.data() + at, img.px.size());
    return img;
}

uint32_t le32(const uint8_t* p) { return p[0] | p[1] << 8 | p[2] << 16 | static_cast<uint32_t>(p[3]) << 24; }
uint16_t le16(const uint8_t* p) { return static_cast<uint16_t>(p[0] | p[1] << 8); }

}  // namespace

Image readImage(const std::string& path) {
    const std::vector<uint8_t> bytes = slurp(path);
    if (bytes.size() >= 8 && png_sig_cmp(bytes.data(), 0, 8) == 0) return readPng(path, bytes);
    if (bytes.size() >= 2 && bytes[0] == 'P' && (bytes[1] == '5' || bytes[1] == '6')) return readPnm(path, bytes);
    if (bytes.size() >= 2 && bytes[0] == 'P' && bytes[1] >= '1' && bytes[1] <= '4')
        fail(path, "ASCII or bitmap PNM is not supported (binary P5/P6 only)");
    fail(path, "unsupported format (PNG, binary PPM or PGM expected)");
}

void writeImage(const std::string& path, const Image& img) {
    if (img.width < 1 || img.height < 1) fail(path, "empty image");
    if (endsWith(path, ".png")) {
        png_image png;
        std::memset(&png, 0, sizeof png);
        png.version = PNG_IMAGE_VERSION;
        png.width = static_cast<png_uint_32>(img.width);
        png.height = static_cast<png_uint_32>(img.height);
        png.format = img.channels == 1 ? PNG_FORMAT_GRAY : img.channels == 3 ? PNG_FORMAT_RGB : PNG_FORMAT_RGBA;
        if (!png_image_write_to_file(&png, path.c_str(), 0, img.px.data(), img.step(), nullptr))
            fail(path, std::string("cannot write PNG (") + png.message + ")");
        return;
    }
    const bool ppm = endsWith(path, ".ppm");
    if (!ppm && !endsWith(path, ".pgm")) fail(path, "unknown extension (use .png, .ppm or .pgm)");
    if (img.channels != (ppm ? 3 : 1))
        fail(path, std::string(ppm ? "PPM holds 3 channels" : "PGM holds 1 channel") + ", the image has " +
                       std::to_string(img.channels));
    std::string out = std::string(ppm ? "P6" : "P5") + "\n" + std::to_string(img.width) + " " +
                      std::to_string(img.height) + "\n255\n";
    out.append(reinterpret_cast<const char*>(img.px.data()), img.px.size());
    spill(path, out.data(), out.size());
}

Audio readWav(const std::string& path) {
    const std::vector<uint8_t> b = slurp(path);
    if (b.size() < 12 || std::memcmp(b.data(), "RIFF", 4) != 0 || std::memcmp(b.data() + 8, "WAVE", 4) != 0)
        fail(path, "not a WAV file");
    int channels = 0, bits = 0, rate = 0;
    size_t at = 12;
    while (at + 8 <= b.size()) {
        const uint32_t len = le32(b.data() + at + 4);
        const uint8_t* body = b.data() + at + 8;
        const size_t avail = b.size() - at - 8;
        if (std::memcmp(b.data() + at, "fmt ", 4) == 0) {
            if (len < 16 || avail < 16) fail(path, "bad fmt chunk");
            int format = le16(body);
            if (format == 0xFFFE && len >= 26 && avail >= 26) format = le16(body + 24);  // extensible
            channels = le16(body + 2);
            rate = static_cast<int>(le32(body + 4));
            bits = le16(body + 14);
            if (format != 1) fail(path, "WAV format " + std::to_string(format) + " is not supported (16-bit PCM only)");
            if (bits != 16) fail(path, std::to_string(bits) + "-bit samples are not supported (16-bit PCM only)");
            if (channels < 1 || rate < 1) fail(path, "bad fmt chunk");
        } else if (std::memcmp(b.data() + at, "data", 4) == 0) {
            if (!channels) fail(path, "data chunk before the fmt chunk");
            const size_t frames = std::min<size_t>(len, avail) / (2u * channels);
            if (frames == 0) fail(path, "no samples");
            Audio a;
            a.rate = rate;
            a.samples.resize(frames);
            for (size_t i = 0; i < frames; ++i) {
                long sum = 0;
                for (int c = 0; c < channels; ++c) sum += static_cast<int16_t>(le16(body + 2 * (i * channels + c)));
                a.samples[i] = static_cast<int16_t>(sum / channels);
            }
            return a;
        }
        at += 8 + len + (len & 1);
    }
    fail(path, "no data chunk");
}

void writeWav(const std::string& path, const Audio& a) {
    const uint32_t bytes = static_cast<uint32_t>(a.samples.size() * 2);
    std::string out;
    auto put = [&](uint32_t v, int n) {
        for (int i = 0; i < n; ++i) out += static_cast<char>(v >> (8 * i));
    };
    out += "RIFF";
    put(36 + bytes, 4);
    out += "WAVEfmt ";
    put(16, 4);  // fmt chunk: PCM, one channel, 16 bits
    put(1, 2);
    put(1, 2);
    put(static_cast<uint32_t>(a.rate), 4);
    put(static_cast<uint32_t>(a.rate) * 2, 4);
    put(2, 2);
    put(16, 2);
    out += "data";
    put(bytes, 4);
    for (int16_t v : a.samples) put(static_cast<uint16_t>(v), 2);
    spill(path, out.data(), out.size());
}

}  // namespace ztool
