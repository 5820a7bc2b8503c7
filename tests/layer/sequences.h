// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Expected calls that many operations have in common, written out for the register and boot values at hand. */
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace sequences
{

inline constexpr std::uint32_t pll_control_a = 0xFD00003C;
inline constexpr std::uint32_t pll_word = 0xFD000040;
inline constexpr std::uint32_t pll_control_b = 0xFD000044;

inline constexpr std::uint32_t word_of_60hz_family = 0x03D2F1AA;
inline constexpr std::uint32_t word_of_all_others = 0x03D1745E;

/** What the PLL's control registers hold once it has been programmed from zero. */
inline constexpr std::uint32_t programmed_control_a = 0x00010002;
inline constexpr std::uint32_t programmed_control_b = 0x00004017;

inline std::string read(std::uint32_t address, std::uint32_t value)
{
    char line[64];
    std::snprintf(line, sizeof line, "x_reg_read32(0x%X) = 0x%X\n", address, value);
    return line;
}

inline std::string write(std::uint32_t address, std::uint32_t value)
{
    char line[64];
    std::snprintf(line, sizeof line, "x_reg_write32(0x%X, 0x%X)\n", address, value);
    return line;
}

/** The whole PLL sequence for a synthesiser word, with what the control registers hold before. */
inline std::string pll(std::uint32_t word, std::uint32_t a = 0, std::uint32_t b = 0)
{
    std::string lines;
    lines += read(pll_control_b, b);
    b |= 0x7;
    lines += write(pll_control_b, b);
    lines += write(pll_word, word);
    lines += read(pll_control_a, a);
    a |= 0x2;
    lines += write(pll_control_a, a);
    lines += read(pll_control_b, b);
    b |= 0x4000;
    lines += write(pll_control_b, b);
    lines += "x_thread_delay(1)\n";
    lines += read(pll_control_a, a);
    lines += write(pll_control_a, a | 0x4);
    lines += read(pll_control_a, a | 0x4);
    a &= ~0x4u;
    lines += write(pll_control_a, a);
    lines += read(pll_word, word);
    lines += write(pll_word, word | 0x1);
    lines += read(pll_word, word | 0x1);
    lines += write(pll_word, word & ~0x1u);
    lines += "x_thread_delay(1)\n";
    lines += read(pll_control_a, a);
    lines += write(pll_control_a, a | 0x10000);
    lines += read(pll_control_b, b);
    lines += write(pll_control_b, b | 0x10);
    return lines;
}

/** How the boot resolution is read from partition 0 and printed. */
inline std::string boot_read(std::uint32_t word)
{
    char lines[400];
    std::snprintf(lines, sizeof lines,
                  "get_part_id_by_name(\"fast_init_param\") = 0\n"
                  "UTIL_Printf \"TESTPMX: Get pard ID:0.\\n\"\n"
                  "i4NFBPartitionRead(0, 0, [0x%X, 0x%X, 0x%X, 0x%X], 4) = 4\n"
                  "UTIL_Printf \"TESTPMX: Get Test Data :%u, 0x%8x.\\n\"\n",
                  word & 0xFF, word >> 8 & 0xFF, word >> 16 & 0xFF, word >> 24, word & 0xFF, word);
    return lines;
}

inline std::string failed_boot_read(const char* id)
{
    return std::string("get_part_id_by_name(\"fast_init_param\") = ") + id +
           "\nUTIL_Printf \"TESTPMX: Get pard ID:" + id + ".\\n\"\n" + "i4NFBPartitionRead(" + id +
           ", 0, <unchanged>, 4)\n"
           "UTIL_Printf \"TESTPMX: Get Test Data :0, 0x       0.\\n\"\n";
}

/** A reset: the boot value that was read, and what it makes of it. */
struct Reset
{
    std::uint32_t boot_word = 0;
    unsigned mode = 0;
    unsigned tv_type = 0;
    std::uint32_t pll_word = word_of_60hz_family;
    std::uint32_t control_a = 0;
    std::uint32_t control_b = 0;
    bool after_boot = false; ///< scaler and TV encoder are programmed too
};

/** Everything behind reading the boot resolution. */
inline std::string reset_tail(const Reset& reset)
{
    const std::string mode = std::to_string(reset.mode);
    std::string lines = "UTIL_Printf \"[PMX]_arPmxConf[ucPmxId].ucMode=" + std::to_string(reset.boot_word & 0xFF) +
                        "\\n\"\n" + pll(reset.pll_word, reset.control_a, reset.control_b) +
                        "PMX_HalSetDigitalOut(0, 0, 0, 0)\n"
                        "PMX_HalSetMode(0, " +
                        mode + ")\n";
    if (reset.after_boot)
        lines += "PMX_HalSetScalerMode(" + mode + ")\n";
    lines += "PMX_HalSetTvType(0, " + std::to_string(reset.tv_type) +
             ")\n"
             "PMX_HalSetBg(0, 0x108080)\n";
    if (reset.after_boot)
        lines += "TVE_SetBrightness(128)\n"
                 "TVE_SetContrast(128)\n"
                 "TVE_SetHue(128)\n"
                 "TVE_SetSaturation(128)\n"
                 "TVE_SetSharpness(0)\n";
    return lines +
           "PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6, 7])\n"
           "PMX_HalInitPlaneOrder(0)\n"
           "fgPmxHalSwapPlane1_2(0) = 0\n"
           "vPmxNotMixPlane(0, 1)\n"
           "VDP_GlobalOutputChange()\n"
           "VDP_SetTvFormat(" +
           mode + ", 1)\n";
}

inline std::string reset(const Reset& reset)
{
    return boot_read(reset.boot_word) + reset_tail(reset);
}

} // namespace sequences
