// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What tests of the aspect ratio have in common: the record's five fields, ratios, expected lines. */
#pragma once

#include <cstdint>
#include <string>

#include "drv_tve.h"
#include "tests/support/layer_fixture.h"
#include "x_vid_dec.h"

namespace aspect
{

/** Every ratio with a name, some without, and the extremes. */
inline constexpr std::uint32_t ratios[] = { 0, 1,  2,  3,  4,   5,   6,          7,          8,
                                            9, 10, 11, 12, 255, 256, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF };

/** A ratio as "%d" prints it. */
inline std::string signed_number(std::uint32_t ratio)
{
    return std::to_string(static_cast<std::int32_t>(ratio));
}

/** HDMI is asked for a ratio. */
inline std::string hdmi(std::uint32_t ratio, const char* answer = "TRUE")
{
    return "fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, " + std::to_string(ratio) + ", 1) = " + answer + "\n";
}

inline const std::string output_change = "VDP_GlobalOutputChange()\n";

/** The record's five fields. */
struct Fields
{
    std::uint32_t normal = 3;
    bool waits = false;
    std::uint32_t next = 3;
    bool digest_shown = false;
    std::uint32_t digest = 0;

    bool operator==(const Fields&) const = default;
};

inline void PrintTo(const Fields& fields, std::ostream* out)
{
    *out << "normal " << fields.normal << ", waits " << fields.waits << ", next " << fields.next << ", digest shown "
         << fields.digest_shown << ", digest " << fields.digest;
}

/** A started layer, and the five fields as they are. */
class AspectTest : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    static Fields fields()
    {
        EXPECT_GE(1, record("fgAspNext"));
        EXPECT_GE(1, record("fgDigestEnable"));
        return { .normal = static_cast<std::uint32_t>(record("u4AspectRatio")),
                 .waits = record("fgAspNext") != 0,
                 .next = static_cast<std::uint32_t>(record("u4AspNext")),
                 .digest_shown = record("fgDigestEnable") != 0,
                 .digest = static_cast<std::uint32_t>(record("u4DigestAsp")) };
    }

    static void set_fields(const Fields& fields)
    {
        set_record("u4AspectRatio", fields.normal);
        set_record("fgAspNext", fields.waits ? 1 : 0);
        set_record("u4AspNext", fields.next);
        set_record("fgDigestEnable", fields.digest_shown ? 1 : 0);
        set_record("u4DigestAsp", fields.digest);
    }

    /** The HDMI driver refuses everything, or answers this. */
    static void hdmi_answers(std::int64_t answer)
    {
        board::faults::set({ "fgPmxDrvSetAvd", answer, board::Fault::When::Always });
    }

    /** What the middleware and the video planes read. */
    static std::uint32_t asked_for()
    {
        UINT32 ratio = 99;
        EXPECT_EQ(1u, PMX_GetAspectRatioMW(0, &ratio));
        return ratio;
    }
    static std::uint32_t in_force()
    {
        UINT32 ratio = 99;
        EXPECT_EQ(1, _rPMXIF.pi4GetAspectRatio(nullptr, &ratio));
        return ratio;
    }
};

} // namespace aspect
