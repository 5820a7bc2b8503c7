// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What tests of sources share: video planes that stand in for the driver's, published at the board's interface
 *  manager, and the lines that a change of the master colour space leaves in the trace. */
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tests/support/layer_fixture.h"

/** A started mixer in RES_1080P60HZ, nothing connected, master colour space BT.709. */
class SourceTest : public LayerTest
{
public:
    /** A component with an IVdp table. */
    struct Plane
    {
        UINT16 type;
        UINT16 id;
        std::uintptr_t tag;
    };

    /** The driver's video planes, each with a tag of its own. */
    static constexpr Plane main_video{ PMX_COMP_TYPE_VDP, 0, 0x5100 };
    static constexpr Plane second_video{ PMX_COMP_TYPE_VDP, 1, 0x5201 };
    static constexpr Plane background{ PMX_COMP_TYPE_VDP, 2, 0x5302 };
    static constexpr Plane fourth_video{ PMX_COMP_TYPE_VDP, 3, 0x5403 };

    using Planes = std::vector<Plane>;

protected:
    void SetUp() override;

    /** Publish a complete table of the plane's own. Its pu4SetColorMode is in the trace like a platform function, with
     *  tag and colour space; another function of the table, or a call with another plane's tag, is a failure. */
    static void publish(const Plane& plane);
    /** What every pu4SetColorMode answers from now on. */
    static void planes_answer(UINT32 answer);
    /** How often the interface manager has the plane's table lent out; -1 when it is not published. */
    static std::int64_t held(const Plane& plane);

    /** Connect a plane, which is published unless it has been. */
    static void connect(const Plane& plane);
    /** Connect one whose driver publishes no table. */
    static void connect_without_table(const Plane& plane);

    /** Whether the mixer's mutex is held at this moment. */
    static bool mutex_held();

    /** An item of a device's state by its path: "osd_planes.full_range_conversion". */
    static std::int64_t device(const std::string& path);

    /** The hardware mixes plane 1, or not. */
    static void mix_second_video(bool mixed);
};

namespace source_events
{

/** What connecting and disconnecting answer. */
constexpr UINT32 done = 0x71000000;
constexpr UINT32 no_such_port = 0xF1000002;

/** A field of a port in the record: "arPortInfo[3].eSrcColorSpace". */
std::string port_field(unsigned port, const char* name);

/** A line of the trace from a text with numbers, without its end of line: log8("VDP_%d Enabled", 2). */
std::string log8(std::string text, int first = 0, int second = 0);

/** How the planes are told a colour space: all that is connected is given, in the order of the ports. */
std::string lock();
std::string unlock();
/** What a call of the mutex that fails leaves on the console, and such a call: the line of one that worked, with
 *  another answer. */
extern const char* const lock_failed;
extern const char* const unlock_failed;
std::string answered(const std::string& line, int answer);
std::string told(int colour_space, const SourceTest::Plane& plane);
std::string inform(int colour_space, const SourceTest::Planes& connected);

/** All that follows once the new master colour space is stored. */
std::string announce(int colour_space, const SourceTest::Planes& connected = {}, unsigned mode = RES_1080P60HZ);

/** The message of a decision and the announcement. */
std::string change(int from, int to, const SourceTest::Planes& connected = {});

/** Sizes around the border between the colour spaces, and the ends of the range. */
extern const std::vector<INT32> widths;
extern const std::vector<INT32> heights;
/** BT.709 (1) above 720 x 576 in either direction, else BT.601 (0). */
int colour_space_of(INT32 width, INT32 height);

} // namespace source_events
