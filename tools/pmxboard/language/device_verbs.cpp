// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for what the devices of the board do by themselves: the sink, the display part, the video planes.
#include "board/display_part.h"
#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

void plug(Session&, const Words&)
{
    board::hdmi_av::plug(true);
}

void unplug(Session&, const Words&)
{
    board::hdmi_av::plug(false);
}

void request_resolution(Session&, const Words& words)
{
    board::hdmi_av::request_resolution(!words.has("off"));
}

void choose_resolution(Session&, const Words& words)
{
    const UINT32 mode = named_number(words.at("MODE"), "the resolution", Family::ResolutionMode);
    const auto frequency = static_cast<UINT16>(number_in(words.at("HZ"), "the frequency", 0, 65535));
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ mode, frequency });
}

void choose_asked(Session&, const Words&)
{
    board::hdmi_av::choose_resolution({});
}

void behave(Session&, const Words& words)
{
    board::display_part::behave(board::display_part::read_behaviour(words.line().word(1)));
}

void answer(Session&, const Words& words)
{
    board::display_part::behave({ true, read_time(words.at("TIME")) });
}

void wait_for_sync(Session&, const Words& words)
{
    if (words.has("on"))
        board::video_planes::set_waiting_for_sync(true);
    else
        board::video_planes::release_graphics();
}

void hw_enable(Session&, const Words& words)
{
    const auto plane = static_cast<unsigned>(number_in(words.at("PLANE"), "the video plane", 0, 255));
    const auto enable =
        static_cast<VDP_ENABLE_T>(named_number(words.at("STATE"), "the enable state", Family::VdpEnable));
    try
    {
        board::video_planes::set_hw_enable(plane, enable);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

} // namespace

std::vector<Verb> device_verbs()
{
    return {
        { "sink",
          { { "sink plug", "plug an HDMI sink in", plug },
            { "sink unplug", "pull it out", unplug },
            { "sink request-resolution [on|off]",
              "a hot plug wants the HDMI resolution sent again, until this is taken back", request_resolution },
            { "sink valid MODE HZ",
              "what the HDMI driver would choose whatever it is asked about (`PMX_ChkSupportedRes`)",
              choose_resolution },
            { "sink valid asked", "what it is asked about", choose_asked } } },
        { "display-part",
          { { "display-part off|never",
              "from now on, when it is given an HDMI resolution change, the display part takes no notice; or it raises "
              "the format-change flag for ever",
              behave },
            { "display-part answer TIME", "it raises the flag, and lowers it after TIME", answer },
            { "display-part raise", "raise the flag now, as the display part",
              [](Session&, const Words&) { board::display_part::raise(); } },
            { "display-part lower", "lower it", [](Session&, const Words&) { board::display_part::lower(); } } } },
        { "video-plane",
          { { "video-plane waiting on|off",
              "the video plane driver waits for its sync control; or it has it, and releases graphics by "
              "`PMX_SetOsdEnable`",
              wait_for_sync },
            { "video-plane hw-enable PLANE STATE",
              "what a plane reports as its hardware enable: `VDP_DISABLED`, `VDP_HIDDEN` or `VDP_ENABLED`",
              hw_enable } } },
    };
}

} // namespace pmxboard
