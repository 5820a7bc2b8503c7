// SPDX-License-Identifier: MIT OR GPL-2.0-only
// YUV4MPEG2: a line of parameters, and frames of three planes. What most programs write is read: eight bits, 4:2:0,
// 4:2:2, 4:4:4 or luma alone.
#include <array>
#include <charconv>
#include <optional>

#include "board/picture/image.h"
#include "board/picture/picture_files.h"

namespace board::picture
{
namespace
{

constexpr std::string_view Y4M_MAGIC = "YUV4MPEG2 ";
constexpr std::string_view FRAME = "FRAME";
constexpr std::size_t LONGEST_HEADER = 4096;

/** How many pixels share a colour difference, in each direction; none has one in a picture of luma alone. */
struct Sampling
{
    std::string_view name;
    int across;
    int down;
};

constexpr std::array SAMPLINGS = {
    Sampling{ "420jpeg", 2, 2 }, Sampling{ "420mpeg2", 2, 2 }, Sampling{ "420paldv", 2, 2 }, Sampling{ "420", 2, 2 },
    Sampling{ "422", 2, 1 },     Sampling{ "444", 1, 1 },      Sampling{ "mono", 0, 0 },
};

struct Y4mHeader
{
    int width = 0;
    int height = 0;
    Sampling sampling = SAMPLINGS.front();
    Range range = Range::Limited;
};

/** A line without its end, cut off from the bytes. */
std::string_view cut_line(std::string_view& bytes)
{
    const std::size_t end = bytes.substr(0, LONGEST_HEADER).find('\n');
    if (end == bytes.npos)
        throw PictureError("no Y4M: a line of parameters has no end");
    const std::string_view line = bytes.substr(0, end);
    bytes.remove_prefix(end + 1);
    return line;
}

int length_in(std::string_view digits)
{
    int number = 0;
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, number);
    if (error != std::errc() || stop != end)
        throw PictureError("no Y4M: a side's length is no number");
    return number;
}

Sampling sampling_in(std::string_view name)
{
    for (const Sampling& sampling : SAMPLINGS)
        if (sampling.name == name)
            return sampling;
    throw PictureError("a Y4M file is read when it has eight bits, and is 4:2:0, 4:2:2, 4:4:4 or mono");
}

void read_parameter(std::string_view parameter, Y4mHeader& header)
{
    if (parameter.starts_with('W'))
        header.width = length_in(parameter.substr(1));
    else if (parameter.starts_with('H'))
        header.height = length_in(parameter.substr(1));
    else if (parameter.starts_with('C'))
        header.sampling = sampling_in(parameter.substr(1));
    else if (parameter == "XCOLORRANGE=FULL")
        header.range = Range::Full;
}

Y4mHeader read_header(std::string_view& bytes)
{
    Y4mHeader header;
    std::string_view line = cut_line(bytes).substr(Y4M_MAGIC.size());
    while (!line.empty())
    {
        const std::string_view parameter = line.substr(0, line.find(' '));
        read_parameter(parameter, header);
        line.remove_prefix(std::min(line.size(), parameter.size() + 1));
    }
    return header;
}

/** One of the three planes; each of its samples is that of so many pixels. */
struct SamplePlane
{
    std::string_view samples;
    int width;
    int across;
    int down;

    unsigned at(int x, int y) const
    {
        const std::size_t row = static_cast<std::size_t>(y / down) * static_cast<std::size_t>(width);
        return static_cast<unsigned char>(samples[row + static_cast<std::size_t>(x / across)]);
    }
};

SamplePlane cut_plane(std::string_view& bytes, const Y4mHeader& header, int across, int down)
{
    const int width = (header.width + across - 1) / across;
    const int height = (header.height + down - 1) / down;
    const std::size_t size = static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
    if (bytes.size() < size)
        throw PictureError("the Y4M file ends within its first frame");
    const SamplePlane plane{ bytes.substr(0, size), width, across, down };
    bytes.remove_prefix(size);
    return plane;
}

} // namespace

bool is_y4m(std::string_view bytes)
{
    return bytes.starts_with(Y4M_MAGIC);
}

Image read_y4m(std::string_view bytes)
{
    const Y4mHeader header = read_header(bytes);
    if (!cut_line(bytes).starts_with(FRAME))
        throw PictureError("no Y4M: there is no frame behind the parameters");
    const Standard standard = standard_of(header.width, header.height);
    Image image(header.width, header.height, ycbcr(standard, header.range), opaque(0, 128, 128));
    const SamplePlane luma = cut_plane(bytes, header, 1, 1);
    const auto [name, across, down] = header.sampling;
    std::optional<SamplePlane> blue;
    std::optional<SamplePlane> red;
    if (across != 0)
    {
        blue = cut_plane(bytes, header, across, down);
        red = cut_plane(bytes, header, across, down);
    }
    for (int y = 0; y < header.height; ++y)
        for (int x = 0; x < header.width; ++x)
            image.at(x, y) = opaque(luma.at(x, y), blue ? blue->at(x, y) : 128, red ? red->at(x, y) : 128);
    return image;
}

} // namespace board::picture
