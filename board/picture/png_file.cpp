// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <png.h>

#include <algorithm>

#include "board/picture/image.h"
#include "board/picture/picture_files.h"

namespace board::picture
{
namespace
{

/** libpng's own record of a picture that is read or written, which has to be freed. */
struct PngImage : png_image
{
    PngImage() : png_image{} { version = PNG_IMAGE_VERSION; }
    ~PngImage() { png_image_free(this); }
    PngImage(const PngImage&) = delete;
    PngImage& operator=(const PngImage&) = delete;

    [[noreturn]] void failed() const
    {
        throw PictureError(std::string("no PNG: ") + static_cast<const char*>(message));
    }
};

constexpr unsigned BYTES = 4; // of a pixel: R, G, B, and how opaque it is

unsigned scaled(unsigned number, unsigned by)
{
    return (number * by + 127) / 255;
}

Pixel with_opacity(const png_byte* rgba)
{
    const unsigned a = rgba[3];
    return a << 24 | scaled(rgba[0], a) << 16 | scaled(rgba[1], a) << 8 | scaled(rgba[2], a);
}

png_byte without_opacity(unsigned number, unsigned a)
{
    return static_cast<png_byte>(a == 0 ? 0 : std::min((number * 255 + a / 2) / a, 255u));
}

bool is_transparent(const Image& image)
{
    return std::any_of(image.pixels().begin(), image.pixels().end(), [](Pixel pixel) { return opacity(pixel) != 255; });
}

} // namespace

bool is_png(std::string_view bytes)
{
    return bytes.starts_with("\x89PNG\r\n\x1A\n");
}

Image read_png(std::string_view bytes)
{
    PngImage png;
    if (png_image_begin_read_from_memory(&png, bytes.data(), bytes.size()) == 0)
        png.failed();
    if (png.width > longest_side || png.height > longest_side)
        throw PictureError("a picture's sides are 1 to 8192 pixels, not " + std::to_string(png.width) + "x" +
                           std::to_string(png.height));
    Image image(static_cast<int>(png.width), static_cast<int>(png.height));
    png.format = PNG_FORMAT_RGBA;
    png.flags |=
        PNG_IMAGE_FLAG_16BIT_sRGB; // as with eight bits where the file does not tell; else they would be linear
    std::vector<png_byte> rgba(image.pixels().size() * BYTES);
    if (png_image_finish_read(&png, nullptr, rgba.data(), 0, nullptr) == 0)
        png.failed();
    for (std::size_t i = 0; i < image.pixels().size(); ++i)
        image.pixels()[i] = with_opacity(&rgba[i * BYTES]);
    image.set_opaque(!is_transparent(image));
    return image;
}

std::string to_png(const Image& image)
{
    const Image rgb = converted(image, full_rgb);
    const bool transparent = is_transparent(rgb);
    std::vector<png_byte> samples(rgb.pixels().size() * (transparent ? 4 : 3));
    png_byte* next = samples.data();
    for (const Pixel pixel : rgb.pixels())
    {
        for (unsigned index = 0; index < 3; ++index)
            *next++ = transparent ? without_opacity(code(pixel, index), opacity(pixel))
                                  : static_cast<png_byte>(code(pixel, index));
        if (transparent)
            *next++ = static_cast<png_byte>(opacity(pixel));
    }

    PngImage png;
    png.width = static_cast<png_uint_32>(image.width());
    png.height = static_cast<png_uint_32>(image.height());
    png.format = transparent ? PNG_FORMAT_RGBA : PNG_FORMAT_RGB;
    png_alloc_size_t size = PNG_IMAGE_PNG_SIZE_MAX(png);
    std::string file(size, '\0');
    if (png_image_write_to_memory(&png, file.data(), &size, 0, samples.data(), 0, nullptr) == 0)
        png.failed();
    file.resize(size);
    return file;
}

Image read_picture(std::string_view bytes)
{
    if (is_png(bytes))
        return read_png(bytes);
    if (is_y4m(bytes))
        return read_y4m(bytes);
    throw PictureError("this is neither a PNG nor a Y4M file");
}

} // namespace board::picture
