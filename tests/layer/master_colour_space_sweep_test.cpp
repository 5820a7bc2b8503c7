// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** How the master colour space is chosen, over all that it may depend on. */
#include <array>
#include <optional>

#include "tests/layer/source_events.h"

using source_events::log8;

namespace
{

struct SweptPort
{
    bool enabled = false;
    bool ycbcr = false;
    int colour_space = 1;

    bool operator==(const SweptPort&) const = default;
};

struct Situation
{
    std::array<SweptPort, 8> ports;
    int luma_key = 0;
    bool mixed = false;
    int master = 1;
};

/** What is decided, with the lines that lead to it. */
struct Decision
{
    int master;
    std::string lines;
};

/** Who outranks whom, from the top: the highest YCbCr graphics, the second video with a luma key while it is mixed, the
 *  main video, what there is. The messages come from the bottom up. */
Decision decision(const Situation& now)
{
    std::string lines;
    std::optional<int> main, second, graphics;
    if (now.ports[0].enabled)
    {
        main = now.ports[0].colour_space;
        lines += log8("[PMX] VDP_COMP_1 enabled and Color Space is %d.", *main);
    }
    if (now.ports[1].enabled && now.luma_key != 0)
    {
        lines += std::string("fgPmxHalMixPlane(0, 1) = ") + (now.mixed ? "1\n" : "0\n");
        if (now.mixed)
        {
            second = now.ports[1].colour_space;
            lines += log8("[PMX] VDP_COMP_2 enabled and Color Space is %d.", *second);
        }
    }
    for (unsigned port = 2; port < 8; ++port)
    {
        if (!now.ports[port].enabled || !now.ports[port].ycbcr)
            continue;
        graphics = now.ports[port].colour_space;
        lines += log8("[PMX] Gfx enabled and Color Space is %d.", *graphics);
    }
    const int wins = graphics.value_or(second.value_or(main.value_or(now.master)));
    if (wins != now.master)
        lines += source_events::change(now.master, wins);
    return { wins, lines };
}

} // namespace

class MasterColourSpaceSweep : public SourceTest
{
protected:
    void SetUp() override
    {
        SourceTest::SetUp();
        mix_second_video(false);
        for (unsigned port = 0; port < 8; ++port)
            put(port, m_last.ports[port]);
    }

    /** Arrange the situation, decide, compare. */
    void check(const Situation& now)
    {
        for (unsigned port = 0; port < 8; ++port)
        {
            if (now.ports[port] != m_last.ports[port])
                put(port, now.ports[port]);
        }
        if (now.luma_key != m_last.luma_key)
            set_record("arPortInfo[1].ucLumaKey", now.luma_key);
        if (now.mixed != m_last.mixed)
            mix_second_video(now.mixed);
        if (now.master != record("eMasterColorSpace"))
            set_record("eMasterColorSpace", now.master);
        m_last = now;

        const Decision expected = decision(now);
        EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
        EXPECT_TRACE(expected.lines);
        EXPECT_EQ(expected.master, record("eMasterColorSpace"));
        ++m_checked;
        m_changed += expected.master != now.master ? 1 : 0;
    }

    unsigned m_checked = 0;
    unsigned m_changed = 0;

private:
    static void put(unsigned port, const SweptPort& what)
    {
        const std::string name = "arPortInfo[" + std::to_string(port) + "].";
        set_record(name + "fgEnabled", what.enabled ? 1 : 0);
        set_record(name + "eInputColorMode", what.ycbcr ? DRV_GFX_COLOR_MODE_YCBCR : DRV_GFX_COLOR_MODE_RGB);
        set_record(name + "eSrcColorSpace", what.colour_space);
    }

    Situation m_last;
};

TEST_F(MasterColourSpaceSweep, DecideMasterColorSpace_EveryStateOfTheVideosUnderSomeGraphics)
{
    constexpr SweptPort none{};
    constexpr SweptPort rgb{ true, false, 0 };
    constexpr SweptPort sd{ true, true, 0 };
    constexpr SweptPort hd{ true, true, 1 };
    constexpr SweptPort stopped{ false, true, 0 };
    const std::array<SweptPort, 6> graphics[] = { { none, none, none, none, none, none },
                                                  { rgb, stopped, rgb, stopped, rgb, rgb },
                                                  { sd, none, none, none, rgb, none },
                                                  { sd, rgb, none, none, none, hd },
                                                  { none, hd, none, sd, stopped, none } };
    Situation now;
    const auto with_graphics = [&] {
        for (const std::array<SweptPort, 6>& planes : graphics)
        {
            for (unsigned i = 0; i < 6; ++i)
                now.ports[i + 2] = planes[i];
            for (now.master = 0; now.master < 3; ++now.master)
                check(now);
        }
    };
    for (unsigned bits = 0; bits < 32; ++bits)
    {
        now.ports[0] = { (bits & 1) != 0, true, (bits & 2) != 0 };
        now.ports[1] = { (bits & 4) != 0, true, (bits & 8) != 0 };
        now.mixed = (bits & 16) != 0;
        for (const int key : { 0, 1, 255 })
        {
            now.luma_key = key;
            with_graphics();
        }
    }
    EXPECT_EQ(32u * 3 * 5 * 3, m_checked);
    EXPECT_LT(500u, m_changed);
}

TEST_F(MasterColourSpaceSweep, DecideMasterColorSpace_EveryStateOfTheGraphicsOverVideos)
{
    // Off, RGB and YCbCr of either colour space. What does not count has the colour space that would be seen.
    constexpr SweptPort states[2][4] = {
        { { false, true, 0 }, { true, false, 1 }, { true, true, 0 }, { true, true, 1 } },
        { { false, true, 1 }, { true, false, 0 }, { true, true, 0 }, { true, true, 1 } }
    };
    Situation now;
    now.luma_key = 1;
    now.mixed = true;
    for (unsigned number = 0; number < 4 * 4 * 4 * 4 * 4 * 4; ++number)
    {
        const unsigned digits = number ^ number >> 2; // from one number to the next mostly a single port is different
        for (unsigned i = 0; i < 6; ++i)
            now.ports[i + 2] = states[i % 2][digits >> 2 * i & 3];
        now.ports[0] = { true, true, static_cast<int>(number >> 5 & 1) };
        now.ports[1] = { (number >> 8 & 1) != 0, true, static_cast<int>(number >> 7 & 1) };
        now.master = static_cast<int>((number >> 4 ^ number >> 9 ^ number) & 1);
        check(now);
    }
    EXPECT_EQ(4096u, m_checked);
    EXPECT_LT(1500u, m_changed);
    EXPECT_GT(2600u, m_changed);
}
