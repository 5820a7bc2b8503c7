// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/sources.h"

#include <algorithm>
#include <array>
#include <optional>
#include <stdexcept>
#include <utility>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/threads.h"
#include "board/trace.h"
#include "board/video_planes.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_pmx.h"
#include "u_os.h"

namespace
{

using board::Value;
using board::names::Family;
using board::sources::Id;
using board::sources::Size;

constexpr unsigned VIDEO_PLANES = 4;
constexpr unsigned OSD_PLANES = 6;
constexpr unsigned HARDWARE_VIDEO_PLANES = 3; ///< the last video component has no hardware of its own
constexpr std::uintptr_t FIRST_TAG = 10;      ///< vdp0 has 10, vdp1 has 11, …: none is null, or a plane's number

struct Source
{
    bool connected = false;
    std::optional<Size> size;  ///< of the pictures that it delivers; nothing: it is stopped
    std::optional<bool> taken; ///< whether the mixer took its last start or change of size
    board::sources::Picture picture;
};

struct VideoPlane : Source
{
    bool published = false;
    UCHAR luma_key = 0;
    std::optional<DRV_PMX_COLOR_SPACE_T> colour_space; ///< as it was told last
    unsigned times_told = 0;
    bool connects_back = false;
};

struct OsdPlane : Source
{
    std::optional<DRV_GFX_COLOR_MODE_T> colour_mode;
};

struct Sources
{
    std::array<VideoPlane, VIDEO_PLANES> video;
    std::array<OsdPlane, OSD_PLANES> osd;
    bool came = false;            ///< those of the board's description
    std::optional<Id> being_told; ///< a video plane whose pu4SetColorMode runs
    unsigned told_in = 0;         ///< in this thread
};

Sources sources_state;

constexpr Id video_plane(unsigned number)
{
    return { Id::Type::VideoPlane, number };
}

constexpr Id osd_plane(unsigned number)
{
    return { Id::Type::OsdPlane, number };
}

VideoPlane& video_at(unsigned number)
{
    if (number >= VIDEO_PLANES)
        throw std::invalid_argument("there is no video plane " + std::to_string(number) + " among the sources");
    return sources_state.video[number];
}

OsdPlane& osd_at(unsigned number)
{
    if (number >= OSD_PLANES)
        throw std::invalid_argument("there is no OSD plane " + std::to_string(number) + " among the sources");
    return sources_state.osd[number];
}

Source& source_at(Id id)
{
    if (id.type == Id::Type::VideoPlane)
        return video_at(id.number);
    return osd_at(id.number);
}

UINT16 type_of(Id id)
{
    return id.type == Id::Type::VideoPlane ? PMX_COMP_TYPE_VDP : PMX_COMP_TYPE_OSD;
}

void* tag_of(unsigned plane)
{
    return reinterpret_cast<void*>(FIRST_TAG + plane);
}

std::string to_text(Size size)
{
    return std::to_string(size.width) + "x" + std::to_string(size.height);
}

void notice(Id id, const std::string& what)
{
    board::trace::notice("source", board::sources::name_of(id) + " " + what);
}

/** What a source may not do while a video plane is told the colour space: the mixer holds its mutex meanwhile. The call
 *  is made all the same, and what comes of it is reported where it comes. */
void check_nobody_is_told(Id id, const char* what)
{
    if (sources_state.being_told && sources_state.told_in == board::threads::context().number)
        board::report_misuse("pu4SetColorMode of " + board::sources::name_of(*sources_state.being_told) + ": " +
                             board::sources::name_of(id) + " " + what +
                             " from inside it, and waits for MutexPMX for ever");
}

/** The mixer goes on when it is refused its mutex. */
bool lock_was_refused()
{
    const auto& entries = board::trace::entries();
    const auto last = std::find_if(entries.rbegin(), entries.rend(),
                                   [](const board::TraceEntry& entry) { return entry.function == "x_sema_lock"; });
    return last != entries.rend() && last->result && last->result->as_number() != OSR_OK;
}

void check_mutex(const std::string& name)
{
    if (board::os::mutex_held(MutexPMX))
        return;
    if (lock_was_refused())
        board::trace::notice("source", name + " is told without MutexPMX held, which was refused, by design");
    else
        board::report_misuse("pu4SetColorMode of " + name + ": called without MutexPMX held");
}

UINT32 set_color_mode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    const std::uintptr_t number = reinterpret_cast<std::uintptr_t>(pvTag) - FIRST_TAG;
    if (number >= VIDEO_PLANES)
    {
        board::report_misuse("pu4SetColorMode: no video plane has the tag " +
                             std::to_string(reinterpret_cast<std::uintptr_t>(pvTag)));
        return 0;
    }
    const Id id = video_plane(static_cast<unsigned>(number));
    const std::string name = board::sources::name_of(id);
    if (!board::interface_manager::held(PMX_COMP_TYPE_VDP, static_cast<UINT16>(id.number), IID_IVdp))
        board::report_misuse("pu4SetColorMode of " + name + ": called through a table that nobody holds");
    check_mutex(name);

    VideoPlane& plane = sources_state.video[id.number];
    plane.colour_space = eColorSpace;
    ++plane.times_told;
    const std::optional<Id> outer = sources_state.being_told;
    sources_state.being_told = id;
    sources_state.told_in = board::threads::context().number;
    notice(id, "is told " + board::named(Family::ColorSpace, eColorSpace).to_text());
    if (plane.connects_back)
        board::sources::connect(id);
    sources_state.being_told = outer;
    return 1;
}

UINT32 not_for_the_mixer(void*)
{
    board::report_misuse("IVdp: the mixer calls pu4SetColorMode alone");
    return 0;
}

const IVdp video_plane_interface = {
    .pu4SetPlaybackMode = not_for_the_mixer,
    .pu4AssignSyncCtrl = not_for_the_mixer,
    .pu4StcIsValid = not_for_the_mixer,
    .pu4SetFrameAccurateStartPts = not_for_the_mixer,
    .pu4SetFrameAccurateEndPts = not_for_the_mixer,
    .pu4Flush = not_for_the_mixer,
    .pu4AssignVdecCallback = not_for_the_mixer,
    .pu4DesiredResolution = not_for_the_mixer,
    .pu4SetColorMode = set_color_mode,
    .pu4GetCurrPictureInfo = not_for_the_mixer,
    .pu4PictureSent = not_for_the_mixer,
};

/** A plane whose table cannot be published connects without: the mixer will not find it. */
void publish(unsigned number)
{
    VideoPlane& plane = sources_state.video[number];
    if (plane.published)
        return;
    plane.published = i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, static_cast<UINT16>(number), IID_IVdp,
                                             &video_plane_interface, tag_of(number)) >= 0;
    if (!plane.published)
        notice(video_plane(number), "cannot publish its interface");
}

void withdraw(unsigned number)
{
    VideoPlane& plane = sources_state.video[number];
    if (plane.published && i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, static_cast<UINT16>(number), IID_IVdp) >= 0)
        plane.published = false;
}

void set_hardware(Id id, VDP_ENABLE_T enable)
{
    if (id.type == Id::Type::VideoPlane && id.number < HARDWARE_VIDEO_PLANES)
        board::video_planes::set_hw_enable(id.number, enable);
}

UINT32 tell_video_enabled(unsigned number)
{
    const VideoPlane& plane = sources_state.video[number];
    const board::trace::Operation scope("PMX_VdpEnabled");
    return PMX_VdpEnabled(0, static_cast<UCHAR>(number), plane.size->width, plane.size->height, plane.luma_key);
}

UINT32 tell_osd_enabled(unsigned number)
{
    const OsdPlane& plane = sources_state.osd[number];
    const board::trace::Operation scope("PMX_OsdEnabled");
    return PMX_OsdEnabled(0, static_cast<UCHAR>(number), plane.size->width, plane.size->height, *plane.colour_mode);
}

/** Tell the mixer that the source delivers pictures of this size. */
UINT32 deliver(Id id, Size size, const std::string& what)
{
    Source& source = source_at(id);
    source.size = size;
    notice(id, what);
    const UINT32 answer = id.type == Id::Type::VideoPlane ? tell_video_enabled(id.number) : tell_osd_enabled(id.number);
    source.taken = answer != 0;
    return answer;
}

const char* colour_mode_text(DRV_GFX_COLOR_MODE_T mode)
{
    return mode == DRV_GFX_COLOR_MODE_YCBCR ? "YCbCr" : "RGB";
}

void report_common(const Source& source, Value& value)
{
    value.add("connected", board::flag(source.connected));
    value.add("size", !source.size ? Value::null()
                                   : Value::record({ { "width", Value::number(source.size->width) },
                                                     { "height", Value::number(source.size->height) } }));
    value.add("taken", source.taken ? board::flag(*source.taken) : Value::null());
    if (!source.picture.name.empty())
        value.add("picture", Value::text(source.picture.name));
}

Value reported(const VideoPlane& plane, unsigned number)
{
    Value value;
    report_common(plane, value);
    value.add("luma_key", Value::number(plane.luma_key));
    value.add("published", board::flag(plane.published));
    value.add("tag", board::trace_arguments::tag(tag_of(number)).value);
    value.add("colour_space", board::setting(plane.colour_space, Family::ColorSpace));
    value.add("times_told", Value::number(plane.times_told));
    value.add("connects_back", board::flag(plane.connects_back));
    return value;
}

Value reported(const OsdPlane& plane)
{
    Value value;
    report_common(plane, value);
    value.add("colour_mode", board::setting(plane.colour_mode, Family::GfxColorMode));
    return value;
}

} // namespace

namespace board::sources
{

void power_on(const Description&)
{
    sources_state = {};
}

Value state()
{
    Value value;
    for (unsigned i = 0; i < VIDEO_PLANES; ++i)
        value.add(name_of(video_plane(i)), reported(sources_state.video[i], i));
    for (unsigned i = 0; i < OSD_PLANES; ++i)
        value.add(name_of(osd_plane(i)), reported(sources_state.osd[i]));
    return value;
}

const std::vector<std::string_view>& names()
{
    static const std::vector<std::string_view> all = { "vdp0", "vdp1", "vdp2", "vdp3", "osd0",
                                                       "osd1", "osd2", "osd3", "osd4", "osd5" };
    return all;
}

Id find(std::string_view name)
{
    const auto found = std::find(names().begin(), names().end(), name);
    if (found == names().end())
        throw std::invalid_argument("there is no source " + std::string(name));
    const auto index = static_cast<unsigned>(found - names().begin());
    return index < VIDEO_PLANES ? video_plane(index) : osd_plane(index - VIDEO_PLANES);
}

std::string name_of(Id id)
{
    return (id.type == Id::Type::VideoPlane ? "vdp" : "osd") + std::to_string(id.number);
}

UINT32 connect(Id id)
{
    Source& source = source_at(id);
    check_nobody_is_told(id, "connects");
    notice(id, "connects");
    if (id.type == Id::Type::VideoPlane)
        publish(id.number);
    const trace::Operation scope("i4Pmx_Connect");
    const UINT32 answer = i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, type_of(id), static_cast<UINT16>(id.number));
    source.connected = answer == PMX_PORT_DONE;
    return answer;
}

UINT32 disconnect(Id id)
{
    Source& source = source_at(id);
    check_nobody_is_told(id, "disconnects");
    notice(id, "disconnects");
    UINT32 answer = 0;
    {
        const trace::Operation scope("i4Pmx_Disconnect");
        answer = i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, type_of(id), static_cast<UINT16>(id.number));
    }
    source.connected = false;
    if (id.type == Id::Type::VideoPlane)
        withdraw(id.number);
    return answer;
}

UINT32 start_video(unsigned plane, Size size, UCHAR luma_key)
{
    VideoPlane& source = video_at(plane);
    const Id id = video_plane(plane);
    check_nobody_is_told(id, "starts");
    if (!source.connected)
        connect(id);
    source.luma_key = luma_key;
    set_hardware(id, VDP_ENABLED);
    return deliver(id, size, "starts, " + to_text(size) + ", luma key " + std::to_string(luma_key));
}

UINT32 start_graphics(unsigned plane, Size size, DRV_GFX_COLOR_MODE_T colour_mode)
{
    OsdPlane& source = osd_at(plane);
    const Id id = osd_plane(plane);
    check_nobody_is_told(id, "starts");
    if (!source.connected)
        connect(id);
    source.colour_mode = colour_mode;
    return deliver(id, size, "starts, " + to_text(size) + ", " + colour_mode_text(colour_mode));
}

UINT32 resize(Id id, Size size)
{
    if (!source_at(id).size)
        throw std::invalid_argument(name_of(id) + " is stopped: its size comes when it starts");
    check_nobody_is_told(id, "changes its size");
    return deliver(id, size, "is " + to_text(size) + " from now on");
}

UINT32 stop(Id id)
{
    Source& source = source_at(id);
    if (id.type == Id::Type::OsdPlane) // the end of a video plane decides nothing
        check_nobody_is_told(id, "stops");
    notice(id, "stops");
    source.size = {};
    UINT32 answer = 0;
    if (id.type == Id::Type::VideoPlane)
    {
        const trace::Operation scope("PMX_VdpDisabled");
        answer = PMX_VdpDisabled(0, static_cast<UCHAR>(id.number));
    }
    else
    {
        const trace::Operation scope("PMX_OsdDisabled");
        answer = PMX_OsdDisabled(0, static_cast<UCHAR>(id.number));
    }
    set_hardware(id, VDP_DISABLED);
    return answer;
}

void set_picture(Id id, Picture picture)
{
    source_at(id).picture = std::move(picture);
}

const Picture& picture_of(Id id)
{
    return source_at(id).picture;
}

void mixer_has_started()
{
    if (std::exchange(sources_state.came, true))
        return;
    for (const Start& start : description().sources)
    {
        if (!start.size)
            connect(start.id);
        else if (start.id.type == Id::Type::VideoPlane)
            start_video(start.id.number, *start.size, start.luma_key);
        else
            start_graphics(start.id.number, *start.size, start.colour_mode);
    }
}

void set_connects_back(unsigned plane, bool connects_back)
{
    video_at(plane).connects_back = connects_back;
}

} // namespace board::sources
