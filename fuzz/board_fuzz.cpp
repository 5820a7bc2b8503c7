// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a board file: it is refused with its line, or a board comes of it that the layer runs on.
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "board/board.h"
#include "fuzz/support/holds.h"
#include "fuzz/support/life.h"
#include "fuzz/support/place.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    static const std::string image = fuzz::file_with({ "\x0C\0\0\0", 4 }, "fast_init_param.bin");
    const std::string file = fuzz::file_with({ reinterpret_cast<const char*>(data), size }, "board.toml");
    try
    {
        fuzz::run_layer(board::load_description(file));
    }
    catch (const board::DescriptionError& refused)
    {
        fuzz::must(std::string_view(refused.what()).find("board.toml") != std::string_view::npos,
                   "a board file that is refused is named");
    }
    return 0;
}
