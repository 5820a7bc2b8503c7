// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a picture's file: it is refused with a reason, or read, and then it is read again as it was written.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string_view>

#include "board/picture/image.h"
#include "fuzz/support/holds.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
try
{
    using namespace board::picture;
    const Image image = converted(read_picture({ reinterpret_cast<const char*>(data), size }), full_rgb);
    const Image again = read_picture(to_png(image));
    fuzz::must(image.width() == again.width() && image.height() == again.height(), "a picture keeps its size");
    fuzz::must(std::equal(image.pixels().begin(), image.pixels().end(), again.pixels().begin()),
               "a picture is read as it was written");
    return 0;
}
catch (const board::picture::PictureError& refused)
{
    fuzz::must(!std::string_view(refused.what()).empty(), "a picture that is refused is told why");
    return 0;
}
