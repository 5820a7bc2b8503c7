// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/hardware.h"
#include "drv_if_pmx.h"

namespace board::picture
{

std::optional<Raster> raster_of(unsigned mode)
{
    constexpr Raster ntsc{ 720, 480, Standard::Bt601, true };
    constexpr Raster pal{ 720, 576, Standard::Bt601, true };
    constexpr Raster hd720{ 1280, 720, Standard::Bt709, true };
    constexpr Raster hd1080{ 1920, 1080, Standard::Bt709, true };
    switch (mode)
    {
    case RES_480I:
    case RES_480P:
    case RES_480P_1440: // the same pixels, each sent more often
    case RES_480P_2880:
    case RES_480I_2880:
    case RES_3D_480P60HZ: // a 3D mode: the picture of one eye
    case RES_3D_480I30HZ:
    case RES_3D_480I60HZ:
    case RES_2D_480I60HZ: return ntsc;
    case RES_576I:
    case RES_576P:
    case RES_576P_1440:
    case RES_576P_2880:
    case RES_576I_2880:
    case RES_3D_576P50HZ:
    case RES_3D_576I25HZ:
    case RES_3D_576I50HZ: return pal;
    case RES_720P60HZ:
    case RES_720P50HZ:
    case RES_3D_720P60HZ:
    case RES_3D_720P50HZ:
    case RES_3D_720P30HZ:
    case RES_3D_720P25HZ:
    case RES_3D_720P60HZ_TB:
    case RES_3D_720P50HZ_TB: return hd720;
    case RES_2D_576I50HZ: return Raster{ 720, 576, Standard::Bt601, false };
    case RES_2D_640x480HZ: return Raster{ 640, 480, Standard::Bt601, true };
    case RES_PANEL_AUO_B089AW01: return Raster{ 1024, 600, Standard::Bt601, true };
    case RES_4K2K23976HZ:
    case RES_4K2K24HZ:
    case RES_2160P: return Raster{ 3840, 2160, Standard::Bt709, false };
    case RES_2160P_4096: return Raster{ 4096, 2160, Standard::Bt709, false };
    default: return mode < RES_MODE_NUM ? std::optional(hd1080) : std::nullopt;
    }
}

} // namespace board::picture
