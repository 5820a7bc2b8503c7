// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are the image of the boot partition: the layer starts from it, and runs.
#include <cstddef>
#include <cstdint>

#include "board/board.h"
#include "fuzz/support/holds.h"
#include "fuzz/support/life.h"
#include "fuzz/support/place.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    board::Description description;
    description.flash["fast_init_param"] = fuzz::file_with({ reinterpret_cast<const char*>(data), size }, "image.bin");
    fuzz::run_layer(description);
    fuzz::must(board::misuses() == 0, "the layer runs, whatever the boot partition holds");
    return 0;
}
