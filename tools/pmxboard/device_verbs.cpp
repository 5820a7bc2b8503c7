// Verbs for what the devices of the board do by themselves: the sink, the display part, the video planes.
#include "board/display_part.h"
#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_words.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

/** `sink valid asked`, or `sink valid RES_720P60HZ 60`. */
void set_valid_resolution(const Line& line)
{
    if (line.size() == 3 && line.word(2) == "asked")
    {
        board::hdmi_av::choose_resolution({});
        return;
    }
    need_words(line, 4, 4);
    const Kind mode{ .bits = 32, .family = Family::ResolutionMode, .names = {}, .members = {} };
    const auto number = static_cast<UINT32>(read_value(mode, line.word(2), "the resolution").as_number());
    const auto frequency = static_cast<UINT16>(number_in(line.word(3), "the frequency", 0, 65535));
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ number, frequency });
}

void hw_enable(const Line& line)
{
    need_words(line, 4, 4);
    const auto plane = static_cast<unsigned>(number_in(line.word(2), "the video plane", 0, 255));
    const Kind state{ .bits = 32, .family = Family::VdpEnable, .names = {}, .members = {} };
    const auto enable = static_cast<VDP_ENABLE_T>(read_value(state, line.word(3), "the enable state").as_number());
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

void run_sink(Session&, const Line& line)
{
    need_words(line, 2, 4);
    const std::string& word = line.word(1);
    if ((word == "plug" || word == "unplug") && line.size() == 2)
        board::hdmi_av::plug(word == "plug");
    else if (word == "request-resolution" && line.size() <= 3)
        board::hdmi_av::request_resolution(line.size() == 2 || read_switch(line, line.word(2)));
    else if (word == "valid")
        set_valid_resolution(line);
    else
        wrong_usage(line);
}

void run_display_part(Session&, const Line& line)
{
    need_words(line, 2, 3);
    const std::string& word = line.word(1);
    if ((word == "answer") != (line.size() == 3))
        wrong_usage(line);
    if (word == "answer")
        board::display_part::behave({ true, read_time(line, line.word(2)) });
    else if (word == "off" || word == "never")
        board::display_part::behave(board::display_part::read_behaviour(word));
    else if (word == "raise")
        board::display_part::raise();
    else if (word == "lower")
        board::display_part::lower();
    else
        wrong_usage(line);
}

void run_video_plane(Session&, const Line& line)
{
    need_words(line, 2, 4);
    if (line.word(1) == "hw-enable")
    {
        hw_enable(line);
        return;
    }
    if (line.word(1) != "waiting")
        wrong_usage(line);
    need_words(line, 3, 3);
    if (read_switch(line, line.word(2)))
        board::video_planes::set_waiting_for_sync(true);
    else
        board::video_planes::release_graphics();
}

} // namespace pmxboard
