// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The input ports: which component has which, and what connecting and disconnecting leaves there. */
#include "tests/layer/source_events.h"

using source_events::done;
using source_events::lock;
using source_events::log8;
using source_events::no_such_port;
using source_events::port_field;
using source_events::unlock;

namespace
{

constexpr UINT16 vdp = 0x41;
constexpr UINT16 osd = 0xB0;

/** The ports by component type and id, of which 8 bits count; 8: none. */
unsigned port_of(unsigned type, unsigned id)
{
    const unsigned low = id & 0xFF;
    if (type == 0x41)
        return low == 0 ? 0 : low <= 3 ? 1 : 8;
    if (type == 0xB0)
        return low <= 5 ? low + 2 : 8;
    return 8;
}

/** An unknown type is reported with the whole id; an id out of range of a known type is not. */
std::string translation(unsigned type, unsigned id)
{
    if (type == 0x41 || type == 0xB0)
        return "";
    return log8("COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d", static_cast<int>(type), static_cast<int>(id));
}

std::string traced(unsigned type, unsigned id, const char* verb)
{
    return lock() + translation(type, id) + log8("Tp,Id=%d,%d", static_cast<int>(type), static_cast<int>(id)) +
           log8(std::string("Comp(%d) ") + verb, static_cast<int>(port_of(type, id))) + unlock();
}

} // namespace

class Port : public SourceTest
{
protected:
    static UINT32 connect(UINT16 type, UINT16 id) { return i4Pmx_Connect(66, 0, type, id); }
    static UINT32 disconnect(UINT16 type, UINT16 id) { return i4Pmx_Disconnect(66, 0, type, id); }

    /** The component on a port: "65/0", "-" when none is recorded. */
    static std::string component(unsigned port)
    {
        const std::string name = std::to_string(record(port_field(port, "u2CompType"))) + "/" +
                                 std::to_string(record(port_field(port, "u2CompId")));
        return record(port_field(port, "fgConnected")) == 1 ? name : name == "0/0" ? "-" : name + " left behind";
    }

    /** All fields of a port hold values that nothing sets them to by itself. */
    static void fill(unsigned port)
    {
        set_record(port_field(port, "u2CompType"), 0x1234);
        set_record(port_field(port, "u2CompId"), 0x4321);
        set_record(port_field(port, "fgConnected"), 1);
        set_record(port_field(port, "fgEnabled"), 1);
        set_record(port_field(port, "eInputColorMode"), 77);
        set_record(port_field(port, "eSrcColorSpace"), 78);
        set_record(port_field(port, "u4SrcWidth"), 79);
        set_record(port_field(port, "u4SrcHeight"), 80);
        set_record(port_field(port, "ucLumaKey"), 81);
    }
};

TEST_F(Port, CompId2LocalId_VideoPlanes_TwoPorts)
{
    EXPECT_EQ(0u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, 0));
    EXPECT_EQ(1u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, 1));
    EXPECT_EQ(1u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, 2));
    EXPECT_EQ(1u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, 3));
    EXPECT_EQ(8u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, 4));
    EXPECT_NO_TRACE();
}

TEST_F(Port, CompId2LocalId_OsdPlanes_SixPorts)
{
    for (UINT16 id = 0; id < 6; ++id)
        EXPECT_EQ(id + 2u, u4PmxCompId2LocalId(PMX_COMP_TYPE_OSD, id));
    EXPECT_EQ(8u, u4PmxCompId2LocalId(PMX_COMP_TYPE_OSD, 6));
    EXPECT_NO_TRACE();
}

TEST_F(Port, CompId2LocalId_UnknownType_IsLoggedWithTheWholeId)
{
    EXPECT_EQ(8u, u4PmxCompId2LocalId(0x42, 0x0100));
    EXPECT_TRACE(R"(LOG8 "COMP ID to LOCAL ID Fail, CompType = 66, CompId = 256\n")");
    EXPECT_EQ(8u, u4PmxCompId2LocalId(0xFFFF, 0xFFFF));
    EXPECT_TRACE(R"(LOG8 "COMP ID to LOCAL ID Fail, CompType = 65535, CompId = 65535\n")");
}

TEST_F(Port, CompId2LocalId_IdOutOfRangeOfAKnownType_IsSilent)
{
    for (const UINT16 id : { 6, 7, 8, 0x7F, 0x80, 0xFF, 0x0106, 0xFFFF })
    {
        EXPECT_EQ(8u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, id)) << id;
        EXPECT_EQ(8u, u4PmxCompId2LocalId(PMX_COMP_TYPE_OSD, id)) << id;
    }
    EXPECT_NO_TRACE();
}

TEST_F(Port, CompId2LocalId_LowEightBitsOfTheIdCount)
{
    for (const UINT16 high : { 0x0100, 0x4100, 0x8000, 0xFF00 })
    {
        EXPECT_EQ(0u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, high)) << high;
        EXPECT_EQ(1u, u4PmxCompId2LocalId(PMX_COMP_TYPE_VDP, high | 3)) << high;
        EXPECT_EQ(2u, u4PmxCompId2LocalId(PMX_COMP_TYPE_OSD, high)) << high;
        EXPECT_EQ(7u, u4PmxCompId2LocalId(PMX_COMP_TYPE_OSD, high | 5)) << high;
    }
    EXPECT_NO_TRACE();
}

TEST_F(Port, CompId2LocalId_EveryIdOfEveryKindOfType)
{
    const RecordSnapshot before;
    for (const UINT16 type : { 0, 1, 0x40, 0x41, 0x42, 0xAF, 0xB0, 0xB1, 0x141, 0x1B0, 0x4100, 0xB000, 0xFF41, 0xFFFF })
    {
        for (unsigned id = 0; id < 0x200; ++id)
        {
            EXPECT_EQ(port_of(type, id), u4PmxCompId2LocalId(type, static_cast<UINT16>(id))) << type << " " << id;
            EXPECT_TRACE(translation(type, id)) << type << " " << id;
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Port, CompId2LocalId_NoOtherTypeHasAPort)
{
    for (unsigned type = 0; type < 0x400; ++type)
    {
        const bool known = type == 0x41 || type == 0xB0;
        EXPECT_EQ(known ? port_of(type, 0) : 8u, u4PmxCompId2LocalId(static_cast<UINT16>(type), 0)) << type;
    }
    EXPECT_EQ(0x400u - 2, board::trace::entries().size());
}

TEST_F(Port, Connect_RecordsTheComponent)
{
    const RecordSnapshot before;
    EXPECT_EQ(done, i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 3));
    EXPECT_TRACE(lock() + R"(
        LOG8 "Tp,Id=176,3\n"
        LOG8 "Comp(5) connect\n"
    )" + unlock());
    EXPECT_RECORD_CHANGED(before, "arPortInfo[5].u2CompType", "arPortInfo[5].u2CompId", "arPortInfo[5].fgConnected");
    EXPECT_EQ("176/3", component(5));
}

TEST_F(Port, Disconnect_ClearsThePort)
{
    connect(osd, 3);
    set_record("arPortInfo[5].fgEnabled", 1);
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(done, i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 3));
    EXPECT_TRACE(lock() + R"(
        LOG8 "Tp,Id=176,3\n"
        LOG8 "Comp(5) disconnect\n"
    )" + unlock());
    EXPECT_RECORD_CHANGED(before, "arPortInfo[5].u2CompType", "arPortInfo[5].u2CompId", "arPortInfo[5].fgConnected",
                          "arPortInfo[5].fgEnabled");
    EXPECT_EQ("-", component(5));
    EXPECT_EQ(0, record("arPortInfo[5].fgEnabled"));
}

TEST_F(Port, ConnectAndDisconnect_EveryComponentLandsOnItsPortAlone)
{
    for (const UINT16 type : { vdp, osd })
    {
        for (const UINT16 id : { 0, 1, 2, 3, 4, 5, 6, 7, 8, 0x40, 0xFF, 0x100, 0x103, 0x105, 0x106, 0x1FF, 0xFF02 })
        {
            SCOPED_TRACE(std::to_string(type) + " " + std::to_string(id));
            const unsigned port = port_of(type, id);
            EXPECT_EQ(port < 8 ? done : no_such_port, connect(type, id));
            EXPECT_TRACE(traced(type, id, "connect"));
            const std::string name = std::to_string(type) + "/" + std::to_string(id);
            for (unsigned other = 0; other < 8; ++other)
                EXPECT_EQ(other == port ? name : "-", component(other)) << other;
            EXPECT_EQ(port < 8 ? done : no_such_port, disconnect(type, id));
            EXPECT_TRACE(traced(type, id, "disconnect"));
            for (unsigned every = 0; every < 8; ++every)
                EXPECT_EQ("-", component(every)) << every;
        }
    }
}

TEST_F(Port, Connect_ChangesNothingButTheComponent)
{
    for (unsigned port = 0; port < 8; ++port)
    {
        fill(port);
        set_record(port_field(port, "fgConnected"), 0);
        const RecordSnapshot before;
        const UINT16 id = static_cast<UINT16>(port < 2 ? port : port - 2);
        EXPECT_EQ(done, connect(port < 2 ? vdp : osd, id));
        EXPECT_RECORD_CHANGED(before, port_field(port, "u2CompType"), port_field(port, "u2CompId"),
                              port_field(port, "fgConnected"));
        EXPECT_EQ(std::to_string(port < 2 ? 65 : 176) + "/" + std::to_string(id), component(port));
    }
}

TEST_F(Port, Disconnect_KeepsWhatIsKnownOfTheSource)
{
    for (unsigned port = 0; port < 8; ++port)
    {
        fill(port);
        const RecordSnapshot before;
        EXPECT_EQ(done, disconnect(port < 2 ? vdp : osd, static_cast<UINT16>(port < 2 ? port : port - 2)));
        EXPECT_RECORD_CHANGED(before, port_field(port, "u2CompType"), port_field(port, "u2CompId"),
                              port_field(port, "fgConnected"), port_field(port, "fgEnabled"));
        EXPECT_EQ("-", component(port));
        EXPECT_EQ(0, record(port_field(port, "fgEnabled")));
        EXPECT_EQ(78, record(port_field(port, "eSrcColorSpace")));
        EXPECT_EQ(81, record(port_field(port, "ucLumaKey")));
    }
}

TEST_F(Port, Connect_EnabledStaysAsItIs)
{
    for (const int enabled : { 0, 1 })
    {
        set_record("arPortInfo[2].fgEnabled", enabled);
        EXPECT_EQ(done, connect(osd, 0));
        EXPECT_EQ(enabled, record("arPortInfo[2].fgEnabled"));
    }
}

TEST_F(Port, Connect_SharedPort_TheLaterComponentReplacesTheEarlier)
{
    EXPECT_EQ(done, connect(vdp, 1));
    EXPECT_EQ("65/1", component(1));
    const RecordSnapshot before;
    EXPECT_EQ(done, connect(vdp, 3));
    EXPECT_EQ("65/3", component(1));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[1].u2CompId");
    EXPECT_EQ(done, connect(vdp, 2));
    EXPECT_EQ("65/2", component(1));
}

TEST_F(Port, Connect_SameComponentTwice_TheSameAgain)
{
    EXPECT_EQ(done, connect(vdp, 0));
    const RecordSnapshot before;
    board::trace::clear();
    EXPECT_EQ(done, connect(vdp, 0));
    EXPECT_TRACE(traced(vdp, 0, "connect"));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Port, Connect_TheWholeIdIsStored)
{
    EXPECT_EQ(done, connect(vdp, 0x0100));
    EXPECT_TRACE(traced(vdp, 0x0100, "connect"));
    EXPECT_EQ("65/256", component(0));
    EXPECT_EQ(done, connect(osd, 0xFF05));
    EXPECT_EQ("176/65285", component(7));
}

TEST_F(Port, Disconnect_AnotherComponentOfTheSharedPort_ClearsItAllTheSame)
{
    EXPECT_EQ(done, connect(vdp, 1));
    EXPECT_EQ(done, disconnect(vdp, 3));
    EXPECT_EQ("-", component(1));
}

TEST_F(Port, Disconnect_NeverConnected_ClearsThePortAllTheSame)
{
    set_record("arPortInfo[4].fgEnabled", 1);
    const RecordSnapshot before;
    EXPECT_EQ(done, disconnect(osd, 2));
    EXPECT_TRACE(traced(osd, 2, "disconnect"));
    EXPECT_RECORD_CHANGED(before, "arPortInfo[4].fgEnabled");
}
