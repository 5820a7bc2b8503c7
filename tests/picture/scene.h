// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Scenes of layer and board, for what is seen of them. */
#pragma once

#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <memory>
#include <string>

#include "board/board.h"
#include "board/picture/hardware.h"
#include "board/picture/image.h"
#include "board/picture/pattern.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"

namespace picture_test
{

/** The layer has started; the boot loader left this mode. */
inline void start_layer(unsigned boot_mode = RES_480P)
{
    board::Description description;
    description.flash_words["fast_init_param"] = boot_mode;
    board::power_on(description);
    PMX_Init();
    PMX_SetEnable(0, 1); // the digital port follows this switch
    PMX_SetDigitalOutEnable(0, 1);
}

/** All outputs are on. */
inline UINT32 set_outputs(unsigned mode, unsigned component, unsigned composite)
{
    const auto on = [](unsigned output_mode) {
        return PMX_RESOLUTION_T{ TRUE, static_cast<PMX_RESOLUTION_MODE_T>(output_mode), 60, {} };
    };
    std::array<PMX_RESOLUTION_T, PMX_OUTPUT_NUM> outputs = { on(mode), on(mode), on(component), on(composite) };
    return PMX_SetModeEx(0, outputs.data(), 60, DRV_NON_EXT_CHIP, 0);
}

inline void show(const char* source, const std::string& picture)
{
    board::sources::set_picture(board::sources::find(source), { picture, {} });
}

/** A source that shows nothing. */
inline void show_nothing(const char* source)
{
    board::sources::set_picture(board::sources::find(source),
                                { "nothing", std::make_shared<const board::picture::Image>(1, 1) });
}

/** Sizes that are small, and make a source one of SD or of HD. */
inline constexpr board::sources::Size sd_size{ 720, 16 };
inline constexpr board::sources::Size hd_size{ 722, 16 };

/** Graphics that nobody sees decide the master colour space. */
inline void decide_master(DRV_PMX_COLOR_SPACE_T master)
{
    show_nothing("osd5");
    board::sources::start_graphics(5, master == DRV_PMX_CS_YCBCR_601 ? sd_size : hd_size, DRV_GFX_COLOR_MODE_YCBCR);
}

} // namespace picture_test
