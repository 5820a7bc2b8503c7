/** @file
 *  More of what follows from a resolution mode, typed here anew: the video PLL's word, the picture's size, whether it
 *  is reported as progressive and as HD. */
#pragma once

#include <vector>

#include "tests/layer/mode_facts.h"

namespace picture_facts
{

using mode_facts::Modes;
using mode_facts::modes;

/** The modes that run the 60 Hz family's word: 24 Hz is not among them, 23.976 Hz is. */
inline const Modes& pll_60()
{
    static const Modes set = modes({
        RES_480I,
        RES_480P,
        RES_480P_1440,
        RES_480P_2880,
        RES_720P60HZ,
        RES_1080I60HZ,
        RES_1080P60HZ,
        RES_1080P30HZ,
        RES_480I_2880,
        RES_1080P23_976HZ,
        RES_1080P29_97HZ,
        RES_3D_1080P23HZ,
        RES_3D_720P60HZ,
        RES_3D_720P30HZ,
        RES_3D_480P60HZ,
        RES_3D_1080I60HZ,
        RES_3D_1080I30HZ,
        RES_3D_480I30HZ,
        RES_3D_480I60HZ,
        RES_2D_480I60HZ,
        RES_2D_640x480HZ,
        RES_PANEL_AUO_B089AW01,
        RES_3D_720P60HZ_TB,
        RES_3D_1080I60HZ_SBS_HALF,
        RES_3D_1080P23HZ_TB,
    });
    return set;
}

inline const Modes& progressive()
{
    static const Modes set = modes({
        RES_480P,        RES_576P,         RES_480P_1440,    RES_576P_1440,    RES_480P_2880,          RES_576P_2880,
        RES_720P60HZ,    RES_720P50HZ,     RES_1080P60HZ,    RES_1080P50HZ,    RES_1080P30HZ,          RES_1080P25HZ,
        RES_1080P24HZ,   RES_3D_1080P23HZ, RES_3D_1080P24HZ, RES_3D_720P60HZ,  RES_3D_720P50HZ,        RES_3D_720P30HZ,
        RES_3D_720P25HZ, RES_3D_576P50HZ,  RES_3D_480P60HZ,  RES_2D_640x480HZ, RES_PANEL_AUO_B089AW01,
    });
    return set;
}

/** Modes that are no HD output; every other number is one. */
inline const Modes& sd_output()
{
    static const Modes set = modes({
        RES_480I,
        RES_576I,
        RES_480P,
        RES_576P,
        RES_480P_1440,
        RES_576P_1440,
        RES_480P_2880,
        RES_576P_2880,
        RES_480I_2880,
        RES_576I_2880,
        RES_3D_576P50HZ,
        RES_3D_480P60HZ,
        RES_3D_576I25HZ,
        RES_3D_480I30HZ,
        RES_3D_576I50HZ,
        RES_3D_480I60HZ,
        RES_2D_480I60HZ,
        RES_2D_640x480HZ,
    });
    return set;
}

struct Size
{
    UINT32 width;
    UINT32 height;
    std::vector<unsigned> modes;
};

/** Every mode of another size than 1920 x 1080, which is also the size of every number without a mode. */
inline const std::vector<Size>& sizes()
{
    static const std::vector<Size> listed = {
        { 640, 480, { RES_2D_640x480HZ } },
        { 720,
          480,
          { RES_480I, RES_480P, RES_480P_1440, RES_480P_2880, RES_480I_2880, RES_3D_480P60HZ, RES_3D_480I30HZ,
            RES_3D_480I60HZ, RES_2D_480I60HZ } },
        { 720,
          576,
          { RES_576I, RES_576P, RES_576P_1440, RES_576P_2880, RES_576I_2880, RES_3D_576P50HZ, RES_3D_576I25HZ,
            RES_3D_576I50HZ } },
        { 1024, 600, { RES_PANEL_AUO_B089AW01 } },
        { 1280,
          720,
          { RES_720P60HZ, RES_720P50HZ, RES_3D_720P60HZ, RES_3D_720P50HZ, RES_3D_720P30HZ, RES_3D_720P25HZ,
            RES_3D_720P60HZ_TB, RES_3D_720P50HZ_TB } },
    };
    return listed;
}

inline const Size& size_of(unsigned mode)
{
    static const Size any_other = { 1920, 1080, {} };
    for (const Size& size : sizes())
    {
        for (const unsigned listed : size.modes)
        {
            if (listed == mode)
                return size;
        }
    }
    return any_other;
}

} // namespace picture_facts
