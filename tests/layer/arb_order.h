// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The packed plane order as its tests look at it: the lines that a call prints, whatever comes of it. */
#pragma once

#include <array>
#include <cstdio>
#include <string>

#include "tests/support/layer_fixture.h"

/** A started layer in RES_1080P60HZ. The hardware reports no delay unless `description.plane_delay` says so. */
class ArbOrder : public LayerTest
{
protected:
    using Eight = std::array<int, 8>;

    static constexpr Eight offsets_hd{ 12, 12, 10, 8, 6, 4, 2, 0 };
    static constexpr Eight offsets_others{ 6, 6, 5, 4, 3, 2, 1, 0 };

    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    /** Power on and start with these delays of the eight planes. */
    void delays(const std::array<std::int32_t, 8>& of_planes)
    {
        description.plane_delay = of_planes;
        power_on();
        started();
    }

    /** The source that each plane of a packed order names. */
    static Eight sources(UINT32 order)
    {
        Eight planes{};
        for (int& source : planes)
        {
            source = static_cast<int>(order % 8);
            order /= 16;
        }
        return planes;
    }

    static std::string list(const Eight& numbers)
    {
        std::string text;
        for (const int number : numbers)
            text += (text.empty() ? "[" : ", ") + std::to_string(number);
        return text + "]";
    }

    /** The seventeen lines that every call begins with. */
    static std::string printed(unsigned mixer, UINT32 order, const Eight& offsets)
    {
        char line[80];
        std::snprintf(line, sizeof line, R"(Printf "[PMX%u] Set PlaneOrder = [0x%8x]\n")", mixer, order);
        std::string lines = line;
        const Eight planes = sources(order);
        for (std::size_t i = 0; i < 8; ++i)
            lines += "\nPrintf \"[PMX]offset[" + std::to_string(i) + "]=" + std::to_string(offsets[i]) + "\\n\"";
        for (std::size_t i = 0; i < 8; ++i)
            lines += "\nPrintf \"[PMX]u1PlnSel[" + std::to_string(i) + "]=" + std::to_string(planes[i]) + "\\n\"";
        return lines + "\n";
    }

    /** How an order is programmed by a mixer whose planes have no delay. */
    static std::string programmed(unsigned mixer, UINT32 order, const Eight& offsets)
    {
        std::string lines = "PMX_HalSetPlaneOrder(" + std::to_string(mixer) + ", " + list(sources(order)) +
                            ", *) = 0\n" +
                            R"(LOG8 "Set Video Plane dealy: 0,0.\n"
                               LOG8 "Set OSD Plane delay: 0,0,0,0,0.\n"
                               DCM_SetVideoPlaneDelay(0, 0))";
        for (std::size_t i = 0; i < 8; ++i)
            lines +=
                "\nLOG0 \"Plane " + std::to_string(i) + " ofst is " + std::to_string(offsets[i]) + ", delay is 0\\n\"";
        return lines + "\nDCM_SetVideoPlaneDelay(" + std::to_string(offsets[0]) + ", " + std::to_string(offsets[1]) +
               ")\n_i4OSD_SetPosOffset([" + std::to_string(offsets[6]) + ", " + std::to_string(offsets[3]) + ", " +
               std::to_string(offsets[2]) + ", 0, 0])\n";
    }

    /** How two planes of one source are refused. */
    static std::string refused(std::size_t first, std::size_t second)
    {
        return "LOG9 \"Plane[" + std::to_string(first) + "] and Plane[" + std::to_string(second) +
               "] connect to the same input source!\\n\"";
    }
};
