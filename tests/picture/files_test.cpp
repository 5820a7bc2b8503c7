// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>
#include <zlib.h>

#include <random>

#include "board/picture/pattern.h"

namespace
{

using namespace board::picture;

std::string why_not(const std::string& bytes)
{
    try
    {
        read_picture(bytes);
    }
    catch (const PictureError& error)
    {
        return error.what();
    }
    return "it was read";
}

std::string big_endian(std::uint32_t number)
{
    std::string bytes;
    for (int shift = 24; shift >= 0; shift -= 8)
        bytes += static_cast<char>(number >> shift & 0xFF);
    return bytes;
}

const unsigned char* bytes_of(const std::string& text)
{
    return reinterpret_cast<const unsigned char*>(text.data());
}

std::string png_chunk(const std::string& name, const std::string& data)
{
    const std::string checked = name + data;
    const uLong sum = crc32(0, bytes_of(checked), static_cast<uInt>(checked.size()));
    return big_endian(static_cast<std::uint32_t>(data.size())) + checked + big_endian(static_cast<std::uint32_t>(sum));
}

/** A PNG in shades of grey that says nothing of what they mean; in front of each row stands how it is packed. */
std::string grey_png(std::uint32_t width, std::uint32_t height, char bits, const std::string& rows)
{
    std::string packed(compressBound(static_cast<uLong>(rows.size())), '\0');
    uLongf size = packed.size();
    EXPECT_EQ(Z_OK, compress(reinterpret_cast<unsigned char*>(packed.data()), &size, bytes_of(rows),
                             static_cast<uLong>(rows.size())));
    packed.resize(size);
    const std::string head = big_endian(width) + big_endian(height) + bits + std::string(4, '\0');
    return "\x89PNG\r\n\x1A\n" + png_chunk("IHDR", head) + png_chunk("IDAT", packed) + png_chunk("IEND", "");
}

TEST(PictureFiles, Png_IsReadAsItWasWritten)
{
    const Image image = ramp(64, 16, full_rgb);
    const Image read = read_picture(to_png(image));
    EXPECT_EQ(64, read.width());
    EXPECT_EQ(16, read.height());
    EXPECT_TRUE(std::equal(image.pixels().begin(), image.pixels().end(), read.pixels().begin(), read.pixels().end()));
}

TEST(PictureFiles, Png_KeepsHowOpaqueItIs)
{
    Image image(3, 1);
    image.at(0, 0) = 0x80402010; // multiplied by the opacity
    image.at(1, 0) = 0x00000000;
    image.at(2, 0) = 0xFF0102FF;
    const Image read = read_picture(to_png(image));
    for (int x = 0; x < 3; ++x)
        EXPECT_EQ(image.at(x, 0), read.at(x, 0)) << x;
}

TEST(PictureFiles, Png_OfAYcbcrPicture_HasItsColours)
{
    const Image read = read_picture(to_png(solid(1, 1, ycbcr(Standard::Bt709), { 0, 1, 0 })));
    EXPECT_NEAR(0, code(read.at(0, 0), 0), 2);
    EXPECT_NEAR(255, code(read.at(0, 0), 1), 2);
    EXPECT_NEAR(0, code(read.at(0, 0), 2), 2);
}

TEST(PictureFiles, Png_ThatEndsEarly_IsRefused)
{
    const std::string file = to_png(checker(64, 64, full_rgb));
    for (std::size_t size = 8; size < file.size() - 12; size += 7) // behind all pixels stands no more than the end
        EXPECT_TRUE(why_not(file.substr(0, size)).starts_with("no PNG: ")) << size;
}

TEST(PictureFiles, Png_OfSixteenBits_HasTheColoursOfOneOfEight)
{
    const std::string middle(2, '\x80');
    EXPECT_EQ(opaque(128, 128, 128), read_picture(grey_png(1, 1, 16, '\0' + middle)).at(0, 0));
    EXPECT_EQ(opaque(128, 128, 128), read_picture(grey_png(2, 1, 8, '\0' + middle)).at(0, 0));
}

TEST(PictureFiles, Png_LargerThanAPictureMayBe_IsRefusedBeforeItIsUnpacked)
{
    EXPECT_EQ("a picture's sides are 1 to 8192 pixels, not 65536x65536", why_not(grey_png(65536, 65536, 8, "")));
    EXPECT_EQ("no picture is 8192x8192: sides are 1 to 8192 pixels, and there are at most 2^24 of them",
              why_not(grey_png(8192, 8192, 8, "")));
}

TEST(PictureFiles, NeitherOfTheTwo_IsTold)
{
    EXPECT_EQ("this is neither a PNG nor a Y4M file", why_not("GIF89a"));
    EXPECT_EQ("this is neither a PNG nor a Y4M file", why_not(""));
}

TEST(PictureFiles, Y4m_420_SharesColourDifferences)
{
    const Image image = read_picture("YUV4MPEG2 W3 H3 F25:1 Ip A1:1 C420jpeg XYSCSS=420JPEG\nFRAME Ip\n"
                                     "abcdefghi" // luma
                                     "0123"      // blue
                                     "4567");    // red
    EXPECT_EQ(3, image.width());
    EXPECT_EQ(3, image.height());
    EXPECT_EQ(Space::Kind::Ycbcr, image.space().kind);
    EXPECT_EQ(Range::Limited, image.space().range);
    EXPECT_EQ(opaque('a', '0', '4'), image.at(0, 0));
    EXPECT_EQ(opaque('e', '0', '4'), image.at(1, 1));
    EXPECT_EQ(opaque('f', '1', '5'), image.at(2, 1));
    EXPECT_EQ(opaque('h', '2', '6'), image.at(1, 2));
    EXPECT_EQ(opaque('i', '3', '7'), image.at(2, 2));
}

TEST(PictureFiles, Y4m_OtherSamplings)
{
    EXPECT_EQ(opaque('b', 'c', 'd'), read_picture("YUV4MPEG2 W2 H1 C422\nFRAME\nabcd").at(1, 0));
    EXPECT_EQ(opaque('b', 'd', 'f'), read_picture("YUV4MPEG2 W2 H1 C444\nFRAME\nabcdef").at(1, 0));
    EXPECT_EQ(opaque('b', 128, 128), read_picture("YUV4MPEG2 H1 W2 Cmono\nFRAME\nab").at(1, 0));
    EXPECT_EQ(Standard::Bt601, read_picture("YUV4MPEG2 W2 H1 C422\nFRAME\nabcd").space().standard);
    EXPECT_EQ(Standard::Bt709,
              read_picture("YUV4MPEG2 W721 H1 Cmono\nFRAME\n" + std::string(721, 'a')).space().standard);
    EXPECT_EQ(Range::Full, read_picture("YUV4MPEG2 W1 H1 C444 XCOLORRANGE=FULL\nFRAME\nabc").space().range);
}

TEST(PictureFiles, Y4m_ThatCannotBeUsed_SaysWhy)
{
    EXPECT_EQ("no Y4M: a line of parameters has no end", why_not("YUV4MPEG2 W1 H1"));
    EXPECT_EQ("no Y4M: a line of parameters has no end", why_not("YUV4MPEG2 W1 H1\nFRAME"));
    EXPECT_EQ("no Y4M: a line of parameters has no end", why_not("YUV4MPEG2 " + std::string(5000, ' ') + "\nFRAME\n"));
    EXPECT_EQ("no Y4M: a side's length is no number", why_not("YUV4MPEG2 W1x H1\nFRAME\n"));
    EXPECT_EQ("no Y4M: a side's length is no number", why_not("YUV4MPEG2 W99999999999 H1\nFRAME\n"));
    EXPECT_EQ("no Y4M: there is no frame behind the parameters", why_not("YUV4MPEG2 W1 H1\nnone\n"));
    EXPECT_EQ("the Y4M file ends within its first frame", why_not("YUV4MPEG2 W2 H2 C444\nFRAME\nabcdefghijk"));
    EXPECT_EQ("a Y4M file is read when it has eight bits, and is 4:2:0, 4:2:2, 4:4:4 or mono",
              why_not("YUV4MPEG2 W2 H2 C420p10\nFRAME\n"));
    for (const char* const size : { "W0 H1", "W-1 H1", "W8193 H1", "W8192 H8192", "H7" })
        EXPECT_TRUE(why_not("YUV4MPEG2 " + std::string(size) + "\nFRAME\n").starts_with("no picture is ")) << size;
}

/** Right but for a few bytes: it is read or refused, and nothing else happens. */
TEST(PictureFiles, DamagedFiles_AreReadOrRefused)
{
    std::mt19937 random(1);
    const std::string y4m = "YUV4MPEG2 W4 H4 F25:1 C420jpeg\nFRAME\n" + std::string(24, 'x');
    const std::string png = to_png(card(40, 30, full_rgb, { { 0.2, 0.5, 0.7 }, 0.8 }, { "x" }));
    unsigned refused = 0;
    for (const std::string& good : { y4m, png })
    {
        for (int round = 0; round < 3000; ++round)
        {
            std::string bytes = good;
            for (unsigned changes = 1 + random() % 4; changes != 0; --changes)
                bytes[random() % bytes.size()] = static_cast<char>(random());
            refused += why_not(bytes) != "it was read" ? 1 : 0;
        }
    }
    EXPECT_LT(1000U, refused);
}

} // namespace
