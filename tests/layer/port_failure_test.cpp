// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Connecting and disconnecting what has no port, with another mixer, without a working mutex; what connecting leaves
 *  to others. */
#include "pmx_hal.h"
#include "tests/layer/source_events.h"
#include "u_os.h"

using source_events::answered;
using source_events::done;
using source_events::lock;
using source_events::lock_failed;
using source_events::log8;
using source_events::no_such_port;
using source_events::unlock;
using source_events::unlock_failed;

namespace
{

/** The two operations have the same form. */
struct Operation
{
    UINT32 (*call)(UINT16, UINT16, UINT16, UINT16);
    const char* verb;
    int connected; ///< afterwards
};
constexpr Operation operations[] = { { i4Pmx_Connect, "connect", 1 }, { i4Pmx_Disconnect, "disconnect", 0 } };

std::string traces(const Operation& operation, int type, int id, int port)
{
    return log8("Tp,Id=%d,%d", type, id) + log8(std::string("Comp(%d) ") + operation.verb, port);
}

} // namespace

class PortFailure : public SourceTest
{
protected:
    /** The port of the second video plane is as it is not after this operation. */
    static void prepare(const Operation& operation)
    {
        set_record("arPortInfo[1].fgConnected", 1 - operation.connected);
        set_record("arPortInfo[1].u2CompType", 0x55);
        set_record("arPortInfo[1].u2CompId", 0x66);
        board::trace::clear();
    }

    static void expect_recorded(const Operation& operation)
    {
        EXPECT_EQ(operation.connected, record("arPortInfo[1].fgConnected"));
        EXPECT_EQ(operation.connected * 0x41, record("arPortInfo[1].u2CompType"));
        EXPECT_EQ(operation.connected * 2, record("arPortInfo[1].u2CompId"));
    }
};

TEST_F(PortFailure, ConnectAndDisconnect_IdWithoutAPort_RefusedWithTheTwoTracesAlone)
{
    for (const Operation& operation : operations)
    {
        const RecordSnapshot before;
        EXPECT_EQ(no_such_port, operation.call(66, 0, PMX_COMP_TYPE_OSD, 6));
        EXPECT_TRACE(lock() + traces(operation, 176, 6, 8) + unlock());
        EXPECT_EQ(no_such_port, operation.call(66, 0, PMX_COMP_TYPE_VDP, 4));
        EXPECT_TRACE(lock() + traces(operation, 65, 4, 8) + unlock());
        EXPECT_RECORD_UNCHANGED(before);
        EXPECT_FALSE(mutex_held());
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_TheWholeTypeIsTold)
{
    for (const Operation& operation : operations)
    {
        EXPECT_EQ(no_such_port, operation.call(66, 0, 0x8041, 0xFFFF));
        EXPECT_TRACE(lock() + log8("COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d", 0x8041, 0xFFFF) +
                     traces(operation, 0x8041, 0xFFFF, 8) + unlock());
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_UnknownType_ReportedBeforeTheTraces)
{
    for (const Operation& operation : operations)
    {
        const RecordSnapshot before;
        EXPECT_EQ(no_such_port, operation.call(66, 0, 0x42, 0x0100));
        EXPECT_TRACE(lock() + R"(LOG8 "COMP ID to LOCAL ID Fail, CompType = 66, CompId = 256\n"
            )" + traces(operation, 66, 256, 8) +
                     unlock());
        EXPECT_RECORD_UNCHANGED(before);
        EXPECT_FALSE(mutex_held());
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_RefusedComponent_ConnectedPortsStay)
{
    for (const Plane& plane : { main_video, second_video })
        SourceTest::connect(plane);
    for (UINT16 id = 0; id < 6; ++id)
        i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, id);
    const RecordSnapshot before;
    for (const Operation& operation : operations)
    {
        EXPECT_EQ(no_such_port, operation.call(66, 0, PMX_COMP_TYPE_OSD, 255));
        EXPECT_EQ(no_such_port, operation.call(66, 0, PMX_COMP_TYPE_VDP, 255));
        EXPECT_EQ(no_such_port, operation.call(66, 0, 0, 0));
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(PortFailure, ConnectAndDisconnect_MixersComponentTypeIsIgnored)
{
    for (const Operation& operation : operations)
    {
        for (const UINT16 type : { 0, 1, 65, 66, 176, 0xFFFF })
        {
            prepare(operation);
            EXPECT_EQ(done, operation.call(type, 0, PMX_COMP_TYPE_VDP, 2)) << type;
            EXPECT_TRACE(lock() + traces(operation, 65, 2, 1) + unlock());
            expect_recorded(operation);
        }
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_AnotherMixersId_RefusedWithThePortAsFound)
{
    for (const Operation& operation : operations)
    {
        prepare(operation);
        const RecordSnapshot before;
        for (const UINT16 mixer : { 1, 2, 7, 8, 0xFF, 0x0100, 0x8000, 0xFFFF })
        {
            EXPECT_EQ(no_such_port, operation.call(66, mixer, PMX_COMP_TYPE_VDP, 2)) << mixer;
            EXPECT_TRACE(lock() + traces(operation, 65, 2, 1) + unlock());
            EXPECT_FALSE(mutex_held());
        }
        EXPECT_EQ(no_such_port, operation.call(66, 1, PMX_COMP_TYPE_OSD, 6));
        EXPECT_TRACE(lock() + traces(operation, 176, 6, 8) + unlock());
        EXPECT_EQ(no_such_port, operation.call(66, 1, 0x42, 1));
        EXPECT_TRACE(lock() + log8("COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d", 66, 1) +
                     traces(operation, 66, 1, 8) + unlock());
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_FailedLock_CarriesOnAsIfLocked)
{
    for (const Operation& operation : operations)
    {
        for (const int answer : { -1, 1, 77 })
        {
            prepare(operation);
            // Somebody else's lock: the unlock at the end finds it.
            ASSERT_EQ(OSR_OK, x_sema_lock(static_cast<HANDLE_T>(record("MutexPMX")), X_SEMA_OPTION_WAIT));
            board::faults::set({ .function = "x_sema_lock", .answer = answer });
            board::trace::clear();
            EXPECT_EQ(done, operation.call(66, 0, PMX_COMP_TYPE_VDP, 2));
            EXPECT_TRACE(answered(lock(), answer) + lock_failed + traces(operation, 65, 2, 1) + unlock());
            expect_recorded(operation);
        }
    }
    expect_asserts(2 * 3);
}

TEST_F(PortFailure, ConnectAndDisconnect_FailedLock_TheUnlockIsTriedAllTheSame)
{
    for (const Operation& operation : operations)
    {
        prepare(operation);
        board::faults::set({ .function = "x_sema_lock", .answer = -1 });
        EXPECT_EQ(done, operation.call(66, 0, PMX_COMP_TYPE_VDP, 2));
        EXPECT_TRACE(answered(lock(), -1) + lock_failed + traces(operation, 65, 2, 1) + answered(unlock(), -1) +
                     unlock_failed);
        expect_recorded(operation);
    }
    expect_asserts(2 * 2);
    expect_misuses(2);
}

TEST_F(PortFailure, ConnectAndDisconnect_FailedUnlock_IsReportedAndTheResultStays)
{
    for (const Operation& operation : operations)
    {
        for (const int answer : { -1, 1 })
        {
            prepare(operation);
            board::faults::set({ .function = "x_sema_unlock", .answer = answer });
            EXPECT_EQ(done, operation.call(66, 0, PMX_COMP_TYPE_VDP, 2));
            EXPECT_TRACE(lock() + traces(operation, 65, 2, 1) + answered(unlock(), answer) + unlock_failed);
            expect_recorded(operation);
        }
    }
    expect_asserts(2 * 2);
}

TEST_F(PortFailure, ConnectAndDisconnect_FailedLockOrUnlockOfARefusedOne_IsReportedToo)
{
    for (const Operation& operation : operations)
    {
        prepare(operation);
        const RecordSnapshot before;
        for (const UINT16 mixer : { 0, 1 })
        {
            const UINT16 id = mixer == 0 ? 4 : 2;
            board::faults::set({ .function = "x_sema_unlock", .answer = -1 });
            EXPECT_EQ(no_such_port, operation.call(66, mixer, PMX_COMP_TYPE_VDP, id));
            EXPECT_TRACE(lock() + traces(operation, 65, id, mixer == 0 ? 8 : 1) + answered(unlock(), -1) +
                         unlock_failed);
            board::faults::set({ .function = "x_sema_lock", .answer = -1 });
            EXPECT_EQ(no_such_port, operation.call(66, mixer, PMX_COMP_TYPE_VDP, id));
            EXPECT_TRACE(answered(lock(), -1) + lock_failed + traces(operation, 65, id, mixer == 0 ? 8 : 1) +
                         answered(unlock(), -1) + unlock_failed);
        }
        EXPECT_RECORD_UNCHANGED(before);
    }
    expect_asserts(2 * 2 * 3);
    expect_misuses(2 * 2);
}

TEST_F(PortFailure, ConnectAndDisconnect_BeforeStartUp_WithoutAMutex)
{
    power_on();
    for (const Operation& operation : operations)
    {
        prepare(operation);
        EXPECT_EQ(done, operation.call(66, 0, PMX_COMP_TYPE_VDP, 2));
        EXPECT_TRACE(std::string("x_sema_lock(0, X_SEMA_OPTION_WAIT) = -1\n") + lock_failed +
                     traces(operation, 65, 2, 1) + "x_sema_unlock(0) = -1\n" + unlock_failed);
        expect_recorded(operation);
    }
    expect_asserts(2 * 2);
}

TEST_F(PortFailure, ConnectAndDisconnect_LookUpAndStoresAreMadeUnderTheMutex)
{
    for (const Operation& operation : operations)
    {
        prepare(operation);
        const RecordSnapshot before;
        unsigned logged = 0;
        board::at_every_call([&](const board::TraceEntry& entry) {
            if (entry.function == "x_sema_unlock")
                expect_recorded(operation); // nothing is stored behind it
            else
                EXPECT_RECORD_UNCHANGED(before) << entry.brief();
            EXPECT_EQ(entry.function != "x_sema_unlock", mutex_held()) << entry.brief();
            logged += entry.function == "PMX_IsLog" ? 1 : 0;
        });
        EXPECT_EQ(done, operation.call(66, 0, PMX_COMP_TYPE_VDP, 2));
        board::at_every_call({});
        EXPECT_EQ(2u, logged);
        EXPECT_FALSE(mutex_held());
    }
}

TEST_F(PortFailure, ConnectAndDisconnect_LeaveTheMasterColourSpaceToTheNextDecision)
{
    SourceTest::connect(main_video);
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 480, 0));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("eMasterColorSpace"));
    set_record("arPortInfo[7].fgEnabled", 1);
    set_record("arPortInfo[7].eInputColorMode", DRV_GFX_COLOR_MODE_YCBCR);
    board::trace::clear();

    // Plane 5 counts as BT.709 from now on, the main video as nothing: neither is looked at.
    EXPECT_EQ(done, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, 5));
    EXPECT_TRACE(lock() + traces(operations[0], 176, 5, 7) + unlock());
    EXPECT_EQ(done, i4Pmx_Disconnect(66, 0, PMX_COMP_TYPE_VDP, 0));
    EXPECT_TRACE(lock() + traces(operations[1], 65, 0, 0) + unlock());
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("eMasterColorSpace"));

    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRACE(log8("[PMX] Gfx enabled and Color Space is %d.", 1) + source_events::change(0, 1));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, record("eMasterColorSpace"));
}

TEST_F(PortFailure, Reset_ReturnsAllPortsToTheirDefaults)
{
    const RecordSnapshot fresh;
    for (const Plane& plane : { main_video, background })
        SourceTest::connect(plane);
    for (UINT16 id = 0; id < 6; ++id)
        EXPECT_EQ(done, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, id));
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 720, 480, 9));
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 5, 720, 480, DRV_GFX_COLOR_MODE_YCBCR));
    PMX_Reset(0);
    for (const RecordSnapshot::Change& change : fresh.changes())
        EXPECT_FALSE(change.field.starts_with("arPortInfo") || change.field == "eMasterColorSpace") << change.field;
}

TEST_F(PortFailure, ConnectAndDisconnect_LowEightBitsOfAKnownType_AreUnknown)
{
    for (const Operation& operation : operations)
    {
        prepare(operation);
        const RecordSnapshot before;
        for (const UINT16 type : { PMX_COMP_TYPE_VDP, PMX_COMP_TYPE_OSD })
        {
            for (const unsigned above : { 0x100u, 0x8000u, 0xFF00u })
                EXPECT_EQ(no_such_port, operation.call(66, 0, static_cast<UINT16>(above + type), 1)) << above + type;
        }
        EXPECT_RECORD_UNCHANGED(before);
    }
}
