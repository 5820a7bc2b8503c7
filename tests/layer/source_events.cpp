// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/layer/source_events.h"

#include <array>
#include <limits>

#include "drv_if.h"
#include "drv_if_vdp.h"
#include "pmx_hal.h"
#include "tests/layer/one_mode.h"

namespace
{

constexpr unsigned table_number = 4;

std::array<std::uintptr_t, table_number> tags; ///< with which each table was published
unsigned tables_published = 0;
UINT32 colour_mode_answer = 1;

UINT32 pu4SetColorMode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    BOARD_CALL_ACTING(pu4SetColorMode, tag(pvTag), eColorSpace);
    return boardCall.answer(colour_mode_answer);
}

template <unsigned Table>
UINT32 set_color_mode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    EXPECT_EQ(tags[Table], reinterpret_cast<std::uintptr_t>(pvTag)) << "the tag does not belong to this table";
    return pu4SetColorMode(pvTag, eColorSpace);
}

UINT32 not_for_the_mixer(void*)
{
    ADD_FAILURE() << "the mixer calls pu4SetColorMode alone";
    return 0;
}

template <unsigned Table>
constexpr IVdp table()
{
    return { .pu4SetPlaybackMode = not_for_the_mixer,
             .pu4AssignSyncCtrl = not_for_the_mixer,
             .pu4StcIsValid = not_for_the_mixer,
             .pu4SetFrameAccurateStartPts = not_for_the_mixer,
             .pu4SetFrameAccurateEndPts = not_for_the_mixer,
             .pu4Flush = not_for_the_mixer,
             .pu4AssignVdecCallback = not_for_the_mixer,
             .pu4DesiredResolution = not_for_the_mixer,
             .pu4SetColorMode = set_color_mode<Table>,
             .pu4GetCurrPictureInfo = not_for_the_mixer,
             .pu4PictureSent = not_for_the_mixer };
}

constexpr std::array<IVdp, table_number> tables{ table<0>(), table<1>(), table<2>(), table<3>() };

} // namespace

void SourceTest::SetUp()
{
    LayerTest::SetUp();
    tables_published = 0;
    colour_mode_answer = 1;
    started();
}

void SourceTest::publish(const Plane& plane)
{
    ASSERT_GT(table_number, tables_published);
    tags[tables_published] = plane.tag;
    ASSERT_LE(0, i4ImRegisterInterface2(plane.type, plane.id, IID_IVdp, &tables[tables_published],
                                        reinterpret_cast<void*>(plane.tag)));
    ++tables_published;
    board::trace::clear();
}

void SourceTest::planes_answer(UINT32 answer)
{
    colour_mode_answer = answer;
}

std::int64_t SourceTest::held(const Plane& plane)
{
    const board::Value state = board::state();
    for (const board::Value& interface : state.find("interface_manager.interfaces")->items())
    {
        if (interface.find("component_type")->as_number() == plane.type &&
            interface.find("component_id")->as_number() == plane.id)
            return interface.find("held")->as_number();
    }
    return -1;
}

void SourceTest::connect(const Plane& plane)
{
    if (held(plane) < 0)
        publish(plane);
    connect_without_table(plane);
}

void SourceTest::connect_without_table(const Plane& plane)
{
    EXPECT_EQ(0x71000000u, i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, plane.type, plane.id));
    board::trace::clear();
}

bool SourceTest::mutex_held()
{
    const board::Value state = board::state();
    for (const board::Value& mutex : state.find("os.mutexes")->items())
    {
        if (mutex.find("handle")->as_number() == record("MutexPMX"))
            return mutex.find("held")->as_number() != 0;
    }
    ADD_FAILURE() << "the mixer has no mutex";
    return false;
}

std::int64_t SourceTest::device(const std::string& path)
{
    const board::Value state = board::state();
    const board::Value* const value = state.find(path);
    return value == nullptr ? -1 : value->as_number();
}

void SourceTest::mix_second_video(bool mixed)
{
    if (mixed)
        vPmxMixPlane(0, 1);
    else
        vPmxNotMixPlane(0, 1);
    board::trace::clear();
}

namespace source_events
{

std::string log8(std::string text, int first, int second)
{
    for (const int number : { first, second })
    {
        if (const std::size_t place = text.find("%d"); place != text.npos)
            text.replace(place, 2, std::to_string(number));
    }
    return "LOG8 \"" + text + "\\n\"\n";
}

std::string port_field(unsigned port, const char* name)
{
    return "arPortInfo[" + std::to_string(port) + "]." + name;
}

std::string lock()
{
    return "x_sema_lock(" + std::to_string(SourceTest::record("MutexPMX")) + ", X_SEMA_OPTION_WAIT) = 0\n";
}

std::string unlock()
{
    return "x_sema_unlock(" + std::to_string(SourceTest::record("MutexPMX")) + ") = 0\n";
}

const char* const lock_failed =
    "Assert(\"x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK\", \"src/driver/pmx/pmx_port.cpp\")\n";
const char* const unlock_failed = "Assert(\"x_sema_unlock(MutexPMX) == OSR_OK\", \"src/driver/pmx/pmx_port.cpp\")\n";

std::string answered(const std::string& line, int answer)
{
    return line.substr(0, line.rfind('=')) + "= " + std::to_string(answer) + "\n";
}

std::string told(int colour_space, const SourceTest::Plane& plane)
{
    const std::string name = std::to_string(plane.type) + ", " + std::to_string(plane.id) + ", 6, ";
    const std::string tag = std::to_string(plane.tag);
    return log8("Inform Vdp CS(%d)", colour_space) + "i4ImQueryInterface(" + name + "*, " + tag + ") = 0\n" +
           "pu4SetColorMode(" + tag + ", " + std::to_string(colour_space) + ")\n" + "i4ImReleaseInterface(" + name +
           tag + ") = 0\n";
}

std::string inform(int colour_space, const SourceTest::Planes& connected)
{
    std::string lines = lock();
    for (const SourceTest::Plane& plane : connected)
        lines += told(colour_space, plane);
    return lines + unlock();
}

std::string announce(int colour_space, const SourceTest::Planes& connected, unsigned mode)
{
    const std::string number = std::to_string(colour_space);
    return "OSDSetColorSpace(" + number + ")\n" + inform(colour_space, connected) + "vPostChgInputCS(" + number +
           ")\n" + one_mode::colour_setup(mode, static_cast<std::uint32_t>(colour_space));
}

std::string change(int from, int to, const SourceTest::Planes& connected)
{
    return log8("[PMX] Master Color Space change from %d to %d.", from, to) + announce(to, connected);
}

constexpr INT32 lowest = std::numeric_limits<INT32>::min();
constexpr INT32 highest = std::numeric_limits<INT32>::max();

const std::vector<INT32> widths{ lowest, lowest + 1, -65536, -1920, -721, -720, -1,   0,     1,
                                 352,    576,        577,    719,   720,  721,  1920, 65536, highest };
const std::vector<INT32> heights{ lowest, lowest + 1, -65536, -1080, -577, -576, -1,    0,      1,
                                  480,    575,        576,    577,   720,  721,  65536, highest };

int colour_space_of(INT32 width, INT32 height)
{
    return width > 720 || height > 576 ? 1 : 0;
}

} // namespace source_events
