// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Telling the video planes the master colour space. */
#include "drv_if.h"
#include "tests/layer/source_events.h"
#include "u_os.h"

using source_events::answered;
using source_events::inform;
using source_events::lock;
using source_events::lock_failed;
using source_events::log8;
using source_events::told;
using source_events::unlock;
using source_events::unlock_failed;

namespace
{

/** A plane whose table cannot be fetched. */
std::string not_told(int colour_space, const SourceTest::Plane& plane, int answer)
{
    return log8("Inform Vdp CS(%d)", colour_space) + "i4ImQueryInterface(" + std::to_string(plane.type) + ", " +
           std::to_string(plane.id) + ", IID_IVdp, *, *) = " + std::to_string(answer) + R"(
        LOG5 "Query VDP Interface Fail!\n"
        Assert("0", "src/driver/pmx/pmx_source.cpp")
    )";
}

} // namespace

class InformVdp : public SourceTest
{
protected:
    static void expect_balanced(const Planes& planes)
    {
        for (const Plane& plane : planes)
            EXPECT_EQ(0, held(plane)) << plane.id;
        EXPECT_FALSE(mutex_held());
    }
};

TEST_F(InformVdp, InformVdpColorSpace_NoPlaneConnected_NoQuery)
{
    for (const Plane& plane : { main_video, second_video })
        publish(plane);
    const RecordSnapshot before;
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(lock() + unlock());
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(InformVdp, InformVdpColorSpace_MainVideo_QueryCallRelease)
{
    connect(main_video);
    const RecordSnapshot before;
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(lock() + R"(
        LOG8 "Inform Vdp CS(1)\n"
        i4ImQueryInterface(PMX_COMP_TYPE_VDP, 0, IID_IVdp, *, 0x5100) = 0
        pu4SetColorMode(0x5100, DRV_PMX_CS_YCBCR_709)
        i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 0, IID_IVdp, 0x5100) = 0
    )" + unlock());
    EXPECT_RECORD_UNCHANGED(before);
    expect_balanced({ main_video });
}

TEST_F(InformVdp, InformVdpColorSpace_BothPlanes_UnderOneLockEachWithItsTag)
{
    connect(second_video);
    connect(main_video);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(lock() + told(1, main_video) + told(1, second_video) + unlock());
    expect_balanced({ main_video, second_video });
}

TEST_F(InformVdp, InformVdpColorSpace_Port1_TheComponentThatIsConnectedThere)
{
    for (const Plane& plane : { second_video, background, fourth_video })
    {
        connect(plane);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(1, { plane }));
    }
    expect_balanced({ second_video, background, fourth_video });
}

TEST_F(InformVdp, InformVdpColorSpace_TheWholeStoredComponentIsTheKey)
{
    // The port was found by 8 bits of the id; the table is fetched by the id as connected.
    constexpr Plane wide{ PMX_COMP_TYPE_VDP, 0x0100, 0x6100 };
    connect(wide);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, { wide }));

    constexpr Plane foreign{ 0x1041, 0x2009, 0x7709 };
    publish(foreign);
    set_record("arPortInfo[0].u2CompType", foreign.type);
    set_record("arPortInfo[0].u2CompId", foreign.id);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, { foreign }));
}

TEST_F(InformVdp, InformVdpColorSpace_OsdPlanesAreNotAsked)
{
    for (UINT16 id = 0; id < 6; ++id)
        EXPECT_EQ(0x71000000u, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, id));
    board::trace::clear();
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, {}));
}

TEST_F(InformVdp, InformVdpColorSpace_ConnectedCountsNotEnabled)
{
    connect(main_video);
    publish(second_video);
    set_record("arPortInfo[1].fgEnabled", 1);
    set_record("arPortInfo[1].u2CompType", PMX_COMP_TYPE_VDP);
    set_record("arPortInfo[1].u2CompId", 1);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, { main_video }));
}

TEST_F(InformVdp, InformVdpColorSpace_TellsTheRecordsMasterColourSpace)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    for (const int colour_space : { 0, 1, 2, 3, 0x101, 0x10001 })
    {
        set_record("eMasterColorSpace", colour_space);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(colour_space, { main_video, second_video }));
    }
}

TEST_F(InformVdp, InformVdpColorSpace_AnyMixerId_TheSame)
{
    connect(main_video);
    for (unsigned mixer = 0; mixer < 256; ++mixer)
    {
        PMX_InformVdpColorSpace(static_cast<UCHAR>(mixer));
        EXPECT_TRACE(inform(1, { main_video })) << mixer;
    }
}

TEST_F(InformVdp, InformVdpColorSpace_PlanesAnswerIsIgnored)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    for (const UINT32 answer : { 0u, 2u, 0x80000000u, 0xFFFFFFFFu })
    {
        planes_answer(answer);
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(inform(1, { main_video, second_video }));
    }
    expect_balanced({ main_video, second_video });
}

TEST_F(InformVdp, InformVdpColorSpace_TableIsFetchedAnewEachTime)
{
    connect(main_video);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, { main_video }));
    for (const char* kept : { "piVdp1", "pvTag1", "piVdp2", "pvTag2" })
        EXPECT_EQ(0, record(kept)) << kept;

    // The driver comes back with another table and another tag, unseen by the mixer.
    constexpr Plane again{ PMX_COMP_TYPE_VDP, 0, 0x9100 };
    EXPECT_EQ(0, i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, 0, IID_IVdp));
    publish(again);
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(inform(1, { again }));
    expect_balanced({ again });
}

TEST_F(InformVdp, InformVdpColorSpace_MutexIsHeldAcrossQueryCallAndReleaseOfBothPlanes)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    unsigned calls = 0;
    std::vector<std::int64_t> lent; // of main and second video, while a plane is told
    board::at_every_call([&](const board::TraceEntry& entry) {
        ++calls;
        EXPECT_EQ(entry.function != "x_sema_unlock", mutex_held()) << entry.brief();
        if (entry.function != "pu4SetColorMode")
            return;
        lent.push_back(held(main_video));
        lent.push_back(held(second_video));
    });
    PMX_InformVdpColorSpace(0);
    board::at_every_call({});
    EXPECT_EQ(2u + 2 * 4, calls);
    EXPECT_EQ((std::vector<std::int64_t>{ 1, 0, 0, 1 }), lent);
    expect_balanced({ main_video, second_video });
}

TEST_F(InformVdp, InformVdpColorSpace_FailedQuery_ThatPlaneIsPassedOver)
{
    const struct
    {
        unsigned fails; ///< the query that does
        Planes order;
    } cases[] = { { 1, { main_video, second_video } }, { 2, { second_video, main_video } } };
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    for (const auto& [fails, order] : cases)
    {
        for (const int answer : { -1, -7, -0x7FFFFFFF })
        {
            board::faults::set({ .function = "i4ImQueryInterface", .answer = answer, .n = fails });
            PMX_InformVdpColorSpace(0);
            const std::string failed = not_told(1, order[0], answer);
            const std::string other = told(1, order[1]);
            EXPECT_TRACE(lock() + (fails == 1 ? failed + other : other + failed) + unlock());
            expect_balanced({ main_video, second_video });
        }
    }
    expect_asserts(2 * 3);
}

TEST_F(InformVdp, InformVdpColorSpace_EveryQueryFails_NobodyIsCalled)
{
    connect_without_table(main_video);
    connect_without_table(second_video);
    const RecordSnapshot before;
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(lock() + not_told(1, main_video, -1) + not_told(1, second_video, -1) + unlock());
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_FALSE(mutex_held());
    expect_asserts(2);
}

TEST_F(InformVdp, InformVdpColorSpace_FailedRelease_IsIgnored)
{
    for (const Plane& plane : { main_video, second_video })
        connect(plane);
    board::faults::set({ .function = "i4ImReleaseInterface", .answer = -1 });
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(lock() + answered(told(1, main_video), -1) + told(1, second_video) + unlock());
    board::faults::clear_all();
    EXPECT_EQ(0, i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 0, IID_IVdp, reinterpret_cast<void*>(main_video.tag)));
}

TEST_F(InformVdp, InformVdpColorSpace_FailedLock_GoesOn)
{
    connect(main_video);
    for (const int answer : { -1, 1 })
    {
        // Somebody else's lock: the unlock at the end finds it.
        ASSERT_EQ(OSR_OK, x_sema_lock(static_cast<HANDLE_T>(record("MutexPMX")), X_SEMA_OPTION_WAIT));
        board::trace::clear();
        board::faults::set({ .function = "x_sema_lock", .answer = answer });
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(answered(lock(), answer) + lock_failed + told(1, main_video) + unlock());
    }
    expect_asserts(2);
}

TEST_F(InformVdp, InformVdpColorSpace_FailedUnlock_IsReported)
{
    connect(main_video);
    for (const int answer : { -1, 1 })
    {
        board::faults::set({ .function = "x_sema_unlock", .answer = answer });
        PMX_InformVdpColorSpace(0);
        EXPECT_TRACE(lock() + told(1, main_video) + answered(unlock(), answer) + unlock_failed);
        expect_balanced({ main_video });
    }
    expect_asserts(2);
}

TEST_F(InformVdp, InformVdpColorSpace_BeforeStartUp_WithoutAMutex)
{
    power_on();
    PMX_InformVdpColorSpace(0);
    EXPECT_TRACE(std::string("x_sema_lock(0, X_SEMA_OPTION_WAIT) = -1\n") + lock_failed + "x_sema_unlock(0) = -1\n" +
                 unlock_failed);
    expect_asserts(2);
}
