// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <utility>

#include "board/threads.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "sources_test.h"
#include "u_os.h"

namespace
{

class SourceContracts : public SourcesTest
{
protected:
    /** The table of a plane as the mixer gets it. */
    static const IVdp* table_of(UINT16 plane, void** tag)
    {
        void* table = nullptr;
        EXPECT_EQ(0, i4ImQueryInterface(PMX_COMP_TYPE_VDP, plane, IID_IVdp, &table, tag));
        return static_cast<const IVdp*>(table);
    }
};

TEST_F(SourceContracts, SetColorMode_WithoutTheMutex_IsMisuse)
{
    void* tag = nullptr;
    board::sources::connect(source("vdp0"));
    const IVdp* const table = table_of(0, &tag);
    board::trace::clear();
    table->pu4SetColorMode(tag, DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ((Lines{ "NOTICE misuse \"pu4SetColorMode of vdp0: called without MutexPMX held\"",
                      "NOTICE source \"vdp0 is told DRV_PMX_CS_YCBCR_601\"" }),
              story());
    EXPECT_EQ("1", now("vdp0.times_told"));

    x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT);
    table->pu4SetColorMode(tag, DRV_PMX_CS_YCBCR_709);
    x_sema_unlock(MutexPMX);
    EXPECT_EQ(1u, board::misuses()) << "with it, it is right";
    table->pu4SetColorMode(tag, DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ(2u, board::misuses()) << "it was given back";
}

TEST_F(SourceContracts, SetColorMode_AfterARefusedLock_IsTheMixersDesign)
{
    board::sources::connect(source("vdp0"));
    board::faults::set({ "x_sema_lock", -1, board::Fault::When::On, 1 });
    board::trace::clear();
    board::sources::start_video(0, { 1, 1 }, 0);
    EXPECT_EQ((Lines{ "NOTICE source \"vdp0 starts, 1x1, luma key 0\"",
                      "NOTICE source \"vdp0 is told without MutexPMX held, which was refused, by design\"",
                      "NOTICE source \"vdp0 is told DRV_PMX_CS_YCBCR_601\"",
                      "NOTICE misuse \"x_sema_unlock: unlock without lock, handle 1\"" }),
              story());
}

TEST_F(SourceContracts, SetColorMode_WhileALockWaits_IsMisuse)
{
    void* tag = nullptr;
    board::sources::connect(source("vdp0"));
    const IVdp* const table = table_of(0, &tag);
    const HANDLE_T mutex = MutexPMX;
    x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
    board::threads::run("neighbour", [mutex] {
        x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
        x_sema_unlock(mutex);
    });
    ASSERT_EQ((Lines{ "neighbour waits for mutex 1" }), board::threads::waiting());
    MutexPMX = 0; // forgotten: nobody holds what is the mixer's now, and the lock that waits was not refused
    table->pu4SetColorMode(tag, DRV_PMX_CS_YCBCR_601);
    MutexPMX = mutex;
    const Lines lines = story();
    EXPECT_EQ(1, std::count(lines.begin(), lines.end(),
                            "NOTICE misuse \"pu4SetColorMode of vdp0: called without MutexPMX held\""));
    x_sema_unlock(mutex);
    EXPECT_EQ(1u, board::misuses());
    EXPECT_TRUE(board::threads::waiting().empty());
}

TEST_F(SourceContracts, SetColorMode_WithoutHoldingTheTable_IsMisuse)
{
    void* tag = nullptr;
    board::sources::connect(source("vdp1"));
    const IVdp* const table = table_of(1, &tag);
    i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, tag);
    x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT);
    board::trace::clear();
    table->pu4SetColorMode(tag, DRV_PMX_CS_YCBCR_709);
    EXPECT_EQ((Lines{ "NOTICE misuse \"pu4SetColorMode of vdp1: called through a table that nobody holds\"",
                      "NOTICE source \"vdp1 is told DRV_PMX_CS_YCBCR_709\"" }),
              story());
    x_sema_unlock(MutexPMX);
}

TEST_F(SourceContracts, SetColorMode_WithAnothersTag_IsMisuse)
{
    void* tag = nullptr;
    board::sources::connect(source("vdp0"));
    const IVdp* const table = table_of(0, &tag);
    x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT);
    board::trace::clear();
    for (const std::uintptr_t wrong : { std::uintptr_t{ 0 }, std::uintptr_t{ 9 }, std::uintptr_t{ 14 } })
    {
        table->pu4SetColorMode(reinterpret_cast<void*>(wrong), DRV_PMX_CS_YCBCR_709);
        EXPECT_EQ(
            (Lines{ "NOTICE misuse \"pu4SetColorMode: no video plane has the tag " + std::to_string(wrong) + "\"" }),
            story());
    }
    table->pu4SetColorMode(reinterpret_cast<void*>(std::uintptr_t{ 11 }), DRV_PMX_CS_YCBCR_709);
    EXPECT_EQ("NOTICE misuse \"pu4SetColorMode of vdp1: called through a table that nobody holds\"", story().at(0));
    x_sema_unlock(MutexPMX);
    EXPECT_EQ("0", now("vdp0.times_told"));
}

TEST_F(SourceContracts, Table_IsComplete_AndTheRestIsNotForTheMixer)
{
    void* tag = nullptr;
    board::sources::connect(source("vdp0"));
    const IVdp* const table = table_of(0, &tag);
    UINT32(*const others[])
    (void*) = { table->pu4SetPlaybackMode,
                table->pu4AssignSyncCtrl,
                table->pu4StcIsValid,
                table->pu4SetFrameAccurateStartPts,
                table->pu4SetFrameAccurateEndPts,
                table->pu4Flush,
                table->pu4AssignVdecCallback,
                table->pu4DesiredResolution,
                table->pu4GetCurrPictureInfo,
                table->pu4PictureSent };
    unsigned misuses = 0;
    for (const auto other : others)
    {
        ASSERT_NE(nullptr, other);
        other(tag);
        EXPECT_EQ(++misuses, board::misuses());
    }
    EXPECT_EQ("NOTICE misuse \"IVdp: the mixer calls pu4SetColorMode alone\"", last_call());
}

TEST_F(SourceContracts, ConnectsBack_TheDeadlockIsReportedAndDoesNotHang)
{
    board::sources::connect(source("vdp0"));
    board::sources::connect(source("vdp1"));
    board::sources::set_connects_back(0, true);
    EXPECT_EQ("1", now("vdp0.connects_back"));
    board::trace::clear();
    EXPECT_EQ(1u, board::sources::start_graphics(0, { 720, 576 }, DRV_GFX_COLOR_MODE_YCBCR));
    const std::string deadlock = "vdp0 connects from inside it, and waits for MutexPMX for ever";
    EXPECT_EQ((Lines{ "NOTICE source \"osd0 connects\"", "NOTICE source \"osd0 starts, 720x576, YCbCr\"",
                      "NOTICE source \"vdp0 is told DRV_PMX_CS_YCBCR_601\"",
                      "NOTICE misuse \"pu4SetColorMode of vdp0: " + deadlock + "\"", "NOTICE source \"vdp0 connects\"",
                      "NOTICE misuse \"x_sema_lock: a second lock by the holder, handle 1\"",
                      "NOTICE source \"vdp1 is told without MutexPMX held, which was refused, by design\"",
                      "NOTICE source \"vdp1 is told DRV_PMX_CS_YCBCR_601\"",
                      "NOTICE misuse \"x_sema_unlock: unlock without lock, handle 1\"" }),
              story());
    EXPECT_EQ(3u, board::misuses());

    board::sources::set_connects_back(0, false);
    board::sources::resize(source("osd0"), { 1280, 720 });
    EXPECT_EQ(3u, board::misuses()) << "and everything is well again";
    EXPECT_EQ("DRV_PMX_CS_YCBCR_709", now("vdp1.colour_space"));
}

TEST_F(SourceContracts, WhileAPlaneIsTold_AnotherThreadWaitsForTheMutex)
{
    board::sources::connect(source("vdp0"));
    board::trace::set_sink([done = false](const board::TraceEntry& entry) mutable {
        if (!std::exchange(done, done || entry.text.starts_with("vdp0 is told")) && done)
            board::threads::run("neighbour", [] { board::sources::connect(source("osd5")); });
    });
    board::sources::start_graphics(0, { 720, 576 }, DRV_GFX_COLOR_MODE_YCBCR);
    board::trace::set_sink({});
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ("1", now("osd5.connected"));
}

TEST_F(SourceContracts, WhileAPlaneIsTold_NobodyMayChangeThePortsOrTheColourSpace)
{
    const struct
    {
        void (*action)();
        const char* reported;
    } rows[] = {
        { [] { board::sources::connect(source("osd5")); }, "osd5 connects" },
        { [] { board::sources::disconnect(source("vdp1")); }, "vdp1 disconnects" },
        { [] {
             board::sources::start_video(1, { 1, 1 }, 0);
         },
          "vdp1 starts" },
        { [] {
             board::sources::start_graphics(1, { 1, 1 }, DRV_GFX_COLOR_MODE_RGB);
         },
          "osd1 starts" },
        { [] {
             board::sources::resize(source("osd0"), { 720, 480 });
         },
          "osd0 changes its size" },
        { [] { board::sources::stop(source("osd1")); }, "osd1 stops" },
        { [] { board::sources::stop(source("vdp0")); }, nullptr }, // decides nothing, and locks nothing
    };
    for (const auto& [action, reported] : rows)
    {
        power_on({});
        PMX_Init();
        board::sources::connect(source("vdp0"));
        board::sources::connect(source("vdp1"));
        std::string misuse;
        bool done = false;
        board::trace::set_sink([&, run = action](const board::TraceEntry& entry) {
            if (entry.function == "misuse" && misuse.empty())
                misuse = entry.text;
            if (done || !entry.text.starts_with("vdp0 is told"))
                return;
            done = true;
            run();
        });
        board::sources::start_graphics(0, { 720, 576 }, DRV_GFX_COLOR_MODE_YCBCR);
        board::trace::set_sink({});
        EXPECT_TRUE(done);
        EXPECT_EQ(reported == nullptr ? ""
                                      : "pu4SetColorMode of vdp0: " + std::string(reported) +
                                            " from inside it, and waits for MutexPMX for ever",
                  misuse);
    }
    power_on({});
}

} // namespace
