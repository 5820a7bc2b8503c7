// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Ports whose flags hold neither 0 nor 1: any number but 0 is set, and what sets or clears a flag leaves 1 or 0. */
#include <vector>

#include "tests/layer/source_events.h"

using source_events::change;
using source_events::inform;
using source_events::log8;
using source_events::port_field;

namespace
{

constexpr unsigned odd_bytes[] = { 2, 128, 254, 255 };

} // namespace

class OddPort : public SourceTest
{
protected:
    static void flag(unsigned port, const char* name, unsigned number) { set_record(port_field(port, name), number); }
    static std::int64_t flag(unsigned port, const char* name) { return record(port_field(port, name)); }

    /** A source whose plane counts for the master colour space, in BT.601. */
    static void source(unsigned port, unsigned enabled)
    {
        flag(port, "fgEnabled", enabled);
        flag(port, "ucLumaKey", enabled);
        set_record(port_field(port, "eInputColorMode"), DRV_GFX_COLOR_MODE_YCBCR);
        set_record(port_field(port, "eSrcColorSpace"), DRV_PMX_CS_YCBCR_601);
    }
};

TEST_F(OddPort, Connect_ConnectedIsOne_AndEnabledStaysAsItWas)
{
    for (const unsigned number : odd_bytes)
    {
        flag(3, "fgConnected", number);
        flag(3, "fgEnabled", number);
        EXPECT_EQ(0x71000000u, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, 1));
        EXPECT_EQ(1, flag(3, "fgConnected"));
        EXPECT_EQ(number, flag(3, "fgEnabled"));
    }
}

TEST_F(OddPort, Disconnect_BothFlagsAreZero)
{
    for (const unsigned number : odd_bytes)
    {
        flag(3, "fgConnected", number);
        flag(3, "fgEnabled", number);
        EXPECT_EQ(0x71000000u, i4Pmx_Disconnect(66, 0, PMX_COMP_TYPE_OSD, 1));
        EXPECT_EQ(0, flag(3, "fgConnected"));
        EXPECT_EQ(0, flag(3, "fgEnabled"));
    }
}

TEST_F(OddPort, VdpEnabled_AnyNonZeroConnected_IsConnected_AndEnabledBecomesOne)
{
    for (const unsigned number : odd_bytes)
    {
        for (const unsigned port : { 0u, 1u })
        {
            const RecordSnapshot before;
            flag(port, "fgConnected", number);
            flag(port, "fgEnabled", number);
            EXPECT_EQ(1u, PMX_VdpEnabled(0, static_cast<UCHAR>(port == 0 ? 0 : 3), 1280, 720, 0));
            EXPECT_EQ(1, flag(port, "fgEnabled"));
            EXPECT_EQ(number, flag(port, "fgConnected"));
            EXPECT_EQ(1u, PMX_VdpDisabled(0, static_cast<UCHAR>(port)));
            flag(port, "fgConnected", 0);
            EXPECT_RECORD_UNCHANGED(before);
        }
    }
}

TEST_F(OddPort, VdpDisabled_EnabledBecomesZero)
{
    for (const unsigned number : odd_bytes)
    {
        flag(0, "fgEnabled", number);
        flag(1, "fgEnabled", number);
        EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
        EXPECT_EQ(0, flag(0, "fgEnabled"));
        EXPECT_EQ(number, flag(1, "fgEnabled"));
        EXPECT_EQ(1u, PMX_VdpDisabled(0, 1));
        EXPECT_EQ(0, flag(1, "fgEnabled"));
    }
}

TEST_F(OddPort, OsdEnabledAndDisabled_EnabledBecomesOneAndZero)
{
    for (const unsigned number : odd_bytes)
    {
        flag(7, "fgEnabled", number);
        EXPECT_EQ(1u, PMX_OsdEnabled(0, 5, 1280, 720, DRV_GFX_COLOR_MODE_RGB));
        EXPECT_EQ(1, flag(7, "fgEnabled"));
        flag(7, "fgEnabled", number);
        EXPECT_EQ(1u, PMX_OsdDisabled(0, 5));
        EXPECT_EQ(0, flag(7, "fgEnabled"));
    }
}

TEST_F(OddPort, DecideMasterColorSpace_AnyNonZeroEnabled_Counts)
{
    for (const unsigned number : odd_bytes)
    {
        for (unsigned port = 0; port < 8; ++port)
        {
            SCOPED_TRACE(port_field(port, "fgEnabled = ") + std::to_string(number));
            set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_709);
            source(port, number);
            mix_second_video(true);
            EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
            const char* const text = port == 0   ? "[PMX] VDP_COMP_1 enabled and Color Space is %d."
                                     : port == 1 ? "[PMX] VDP_COMP_2 enabled and Color Space is %d."
                                                 : "[PMX] Gfx enabled and Color Space is %d.";
            EXPECT_TRACE((port == 1 ? "fgPmxHalMixPlane(0, 1) = 1\n" : "") + log8(text, 0) + change(1, 0));
            EXPECT_EQ(number, flag(port, "fgEnabled"));
            flag(port, "fgEnabled", 0);
        }
    }
}

TEST_F(OddPort, DecideMasterColorSpace_OnlyTheWholeNumberZeroIsYCbCr)
{
    for (const std::int64_t mode : { 1LL, 2LL, 0x100LL, 0x10000LL, 0x80000000LL, 0xFFFFFF00LL })
    {
        for (unsigned port = 2; port < 8; ++port)
        {
            source(port, 1);
            set_record(port_field(port, "eInputColorMode"), mode);
        }
        EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
        EXPECT_NO_TRACE();
        EXPECT_EQ(DRV_PMX_CS_YCBCR_709, record("eMasterColorSpace"));
    }
}

TEST_F(OddPort, InformVdpColorSpace_AnyNonZeroConnected_IsTold)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    for (const unsigned number : odd_bytes)
    {
        flag(0, "fgConnected", number);
        flag(1, "fgConnected", 0);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(1, { main_video }));
        flag(1, "fgConnected", number);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(1, { main_video, second_video }));
        flag(0, "fgConnected", 0);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(1, { second_video }));
    }
}
