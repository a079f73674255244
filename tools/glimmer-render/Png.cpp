#include "Png.h"

#include <png.h>

#include <cerrno>
#include <csetjmp>
#include <cstdio>
#include <cstring>

#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

// The classic write API reports errors by longjmp; nothing with a destructor
// may live in this frame. Returns an error text, or null on success.
const char* WriteRows(FILE* file, png_bytep* rows, png_uint_32 width, png_uint_32 height) {
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    if (png == nullptr) return "out of memory";
    png_infop info = png_create_info_struct(png);
    if (info == nullptr) {
        png_destroy_write_struct(&png, nullptr);
        return "out of memory";
    }
    if (setjmp(png_jmpbuf(png))) {
        png_destroy_write_struct(&png, &info);
        return "libpng could not encode the image";
    }
    png_init_io(png, file);
    png_set_compression_level(png, 9);
    png_set_IHDR(png, info, width, height, 8, PNG_COLOR_TYPE_RGB_ALPHA, PNG_INTERLACE_NONE,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_write_info(png, info);
    png_write_image(png, rows);
    png_write_end(png, info);
    png_destroy_write_struct(&png, &info);
    return nullptr;
}

}  // namespace

Image ReadPng(const std::string& path, std::string_view what, int maxSide) {
    const std::vector<char> file = ReadFileBytes(path, what, kMaxPngBytes);
    png_image png;
    std::memset(&png, 0, sizeof png);
    png.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_memory(&png, file.data(), file.size())) {
        throw RenderError(std::string(what) + ": " + Quote(path) + " is not a PNG file (" + png.message + ")");
    }
    if (png.width == 0 || png.height == 0 || png.width > png_uint_32(maxSide) ||
        png.height > png_uint_32(maxSide)) {
        png_image_free(&png);
        throw RenderError(std::string(what) + ": " + Quote(path) + " is " + std::to_string(png.width) + "x" +
                          std::to_string(png.height) + " pixels; at most " + std::to_string(maxSide) +
                          " a side");
    }
    png.format = PNG_FORMAT_RGBA;
    std::vector<png_byte> bytes(PNG_IMAGE_SIZE(png));
    if (!png_image_finish_read(&png, nullptr, bytes.data(), 0, nullptr)) {
        const std::string message = png.message;
        png_image_free(&png);
        throw RenderError(std::string(what) + ": cannot decode " + Quote(path) + " (" + message + ")");
    }
    Image image(int(png.width), int(png.height));
    for (size_t i = 0; i < image.pixels.size(); ++i) {
        const png_byte* p = &bytes[i * 4];
        image.pixels[i] = uint32_t(p[3]) << 24 | uint32_t(p[0]) << 16 | uint32_t(p[1]) << 8 | p[2];
    }
    return image;
}

void WritePng(const std::string& path, const Image& image) {
    if (image.width <= 0 || image.height <= 0) {
        throw RenderError("cannot write " + Quote(path) + ": the image is empty (" +
                          std::to_string(image.width) + "x" + std::to_string(image.height) + ")");
    }
    std::vector<png_byte> bytes(image.pixels.size() * 4);
    for (size_t i = 0; i < image.pixels.size(); ++i) {
        const uint32_t c = image.pixels[i];
        bytes[i * 4 + 0] = png_byte(c >> 16);
        bytes[i * 4 + 1] = png_byte(c >> 8);
        bytes[i * 4 + 2] = png_byte(c);
        bytes[i * 4 + 3] = png_byte(c >> 24);
    }
    std::vector<png_bytep> rows(size_t(image.height));
    for (int y = 0; y < image.height; ++y) rows[size_t(y)] = &bytes[size_t(y) * size_t(image.width) * 4];

    const std::string temporary = path + ".tmp";
    FILE* file = std::fopen(temporary.c_str(), "wb");
    if (file == nullptr) {
        throw RenderError("cannot write " + Quote(path) + ": " + std::strerror(errno));
    }
    const char* failure = WriteRows(file, rows.data(), png_uint_32(image.width), png_uint_32(image.height));
    int savedErrno = 0;
    if (failure == nullptr && std::fflush(file) != 0) {
        savedErrno = errno;
        failure = std::strerror(savedErrno);
    }
    if (std::fclose(file) != 0 && failure == nullptr) failure = std::strerror(errno);
    if (failure == nullptr && std::rename(temporary.c_str(), path.c_str()) != 0) failure = std::strerror(errno);
    if (failure != nullptr) {
        const std::string reason = failure;
        std::remove(temporary.c_str());
        throw RenderError("cannot write " + Quote(path) + ": " + reason);
    }
}

}  // namespace Glimmer::RenderTool
