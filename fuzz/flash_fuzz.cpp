// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are the image of the boot partition: the layer starts from it, and runs.
#include <cstddef>
#include <cstdint>

#include "fuzz/support/holds.h"
#include "fuzz/support/place.h"
#include "fuzz/support/scenario.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    fuzz::file_with({ reinterpret_cast<const char*>(data), size }, "image.bin");
    const fuzz::Shown shown = fuzz::run("power-on\n"
                                        "flash fast_init_param image.bin\n"
                                        "PMX_Init\n"
                                        "PMX_SetMode 0 RES_720P60HZ 60 FALSE\n"
                                        "PMX_Reset 0\n"
                                        "advance 20s\n"
                                        "PMX_Uninit\n");
    fuzz::must(shown.done, "the layer runs, whatever the boot partition holds");
    return 0;
}
