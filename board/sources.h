// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The sources of pictures: video planes vdp0 to vdp3 and OSD planes osd0 to osd5, each a component that connects to a
 *  port of the mixer, starts, changes its size, stops and disconnects, by the calls that its driver makes. A connected
 *  video plane has its IVdp table published, keeps what it is told, and checks that it is told by the rules. */
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "drv_if_pmx.h"
#include "x_typedef.h"

namespace board::picture
{
class Image;
}

namespace board::sources
{

/** Which one. */
struct Id
{
    enum class Type
    {
        VideoPlane, ///< 0 main video, 1 second video, 2 background picture, 3 a further one; 1 to 3 share a port
        OsdPlane
    };

    Type type;
    unsigned number;
};

struct Size
{
    INT32 width;
    INT32 height;
};

/** "vdp0" … "osd5", in this order. */
const std::vector<std::string_view>& names();
/** The source of a name. Throws std::invalid_argument when there is none. */
Id find(std::string_view name);
std::string name_of(Id id);

/** Connect to the mixer; a video plane publishes its table before.
 *  @return the mixer's answer: PMX_PORT_DONE or PMX_NO_SUCH_PORT */
UINT32 connect(Id id);
/** Disconnect; a video plane withdraws its table afterwards. Neither of the two has to have connected.
 *  @return the mixer's answer */
UINT32 disconnect(Id id);

/** Deliver pictures; a source that has not connected does so first. A video plane is enabled in its hardware as well.
 *  @return the mixer's answer: 1 the event was taken, 0 it was not */
UINT32 start_video(unsigned plane, Size size, UCHAR luma_key);
UINT32 start_graphics(unsigned plane, Size size, DRV_GFX_COLOR_MODE_T colour_mode);
/** Another size: the same event again. Throws std::invalid_argument when the source is stopped.
 *  @return the mixer's answer */
UINT32 resize(Id id, Size size);
/** Deliver no more pictures; the plane's hardware is disabled.
 *  @return the mixer's answer */
UINT32 stop(Id id);

/** What a source shows. */
struct Picture
{
    std::string name{};                            ///< a pattern's, or a file's; empty: a card that names the source
    std::shared_ptr<const picture::Image> image{}; ///< of a file
};
/** From now on, whatever its size is; it is scaled to that. Power-on takes it back. */
void set_picture(Id id, Picture picture);
const Picture& picture_of(Id id);

/** What a source does when the mixer has started. */
struct Start
{
    Id id;
    std::optional<Size> size{}; ///< of its pictures; nothing: it connects, and delivers none yet
    UCHAR luma_key = 0;         ///< of a video plane
    DRV_GFX_COLOR_MODE_T colour_mode = DRV_GFX_COLOR_MODE_RGB; ///< of an OSD plane
};
/** The mixer has started for the first time since power-on: the sources of the board's description come. */
void mixer_has_started();

/** Let a video plane break the rule that nobody connects from inside pu4SetColorMode. */
void set_connects_back(unsigned plane, bool connects_back);

} // namespace board::sources
