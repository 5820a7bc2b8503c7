// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Pictures in memory, and how they come from files and go there. */
#pragma once

#include <cstddef>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "board/picture/colour.h"

namespace board::picture
{

/** What no picture can be made of: why. */
class PictureError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/** No picture is wider or taller, and none has more pixels than 16 times 2^20. */
inline constexpr int longest_side = 8192;
inline constexpr std::size_t most_pixels = std::size_t{ 1 } << 24;

bool is_picture_size(int width, int height);
/** That of pictures of which nothing else is known: BT.709 when they are larger than those of SD. */
constexpr Standard standard_of(int width, int height)
{
    return width > 720 || height > 576 ? Standard::Bt709 : Standard::Bt601;
}

/** Rows of pixels, the uppermost first. */
class Image
{
public:
    Image() = default;
    /** Throws PictureError for a size that no picture has. */
    Image(int width, int height, Space space = full_rgb, Pixel filled = 0);

    int width() const { return m_width; }
    int height() const { return m_height; }
    bool empty() const { return m_pixels.empty(); }
    /** What the codes of its pixels mean. */
    Space space() const { return m_space; }
    /** Say what they mean; they stay as they are. */
    void set_space(Space space) { m_space = space; }
    /** Whether nothing shows through, as far as somebody has said so. */
    bool is_opaque() const { return m_opaque; }
    void set_opaque(bool opaque) { m_opaque = opaque; }

    std::span<Pixel> pixels() { return m_pixels; }
    std::span<const Pixel> pixels() const { return m_pixels; }
    std::span<Pixel> row(int y) { return pixels().subspan(start_of(y), static_cast<std::size_t>(m_width)); }
    std::span<const Pixel> row(int y) const { return pixels().subspan(start_of(y), static_cast<std::size_t>(m_width)); }
    Pixel& at(int x, int y) { return m_pixels.at(start_of(y) + static_cast<std::size_t>(x)); }
    Pixel at(int x, int y) const { return m_pixels.at(start_of(y) + static_cast<std::size_t>(x)); }

private:
    std::size_t start_of(int y) const { return static_cast<std::size_t>(y) * static_cast<std::size_t>(m_width); }

    int m_width = 0;
    int m_height = 0;
    Space m_space;
    bool m_opaque = false;
    std::vector<Pixel> m_pixels;
};

/** The same picture in another space. */
Image converted(const Image& image, const Space& to);

/** A picture of a PNG or a Y4M file, of whose frames the first is taken; which of the two it is, its first bytes tell.
 *  A PNG is RGB, and may be transparent. Y4M has the codes of Y'C'BC'R, whose standard the file does not tell: it is
 *  that of its size. Colour differences that several pixels share are those of each of them. Throws PictureError. */
Image read_picture(std::string_view bytes);

/** The bytes of a PNG file. */
std::string to_png(const Image& image);

} // namespace board::picture
