// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for the sources of pictures, and for the delays of the planes that carry them.
#include <limits>

#include "board/mixer.h"
#include "board/sources.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/picture_verbs.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

using board::sources::Id;

Id source_in(const Words& words, std::string_view place)
{
    return source_called(words.at(place));
}

board::sources::Size size_in(const Words& words)
{
    const auto [width, height] = read_size(words.at("SIZE")).value();
    return { width, height };
}

void answer(Session& session, UINT32 result)
{
    session.set_outcome("source", { yielded(board::names::Family::None, result), {} });
}

void connect(Session& session, const Words& words)
{
    answer(session, board::sources::connect(source_in(words, "NAME")));
}

void disconnect(Session& session, const Words& words)
{
    answer(session, board::sources::disconnect(source_in(words, "NAME")));
}

void stop(Session& session, const Words& words)
{
    answer(session, board::sources::stop(source_in(words, "NAME")));
}

void start_video(Session& session, const Words& words)
{
    const Id id = source_in(words, "VDP");
    const auto luma_key =
        words.has("N") ? static_cast<UCHAR>(number_in(words.at("N"), "the luma key", 0, 255)) : UCHAR{ 0 };
    answer(session, board::sources::start_video(id.number, size_in(words), luma_key));
}

void start_graphics(Session& session, const Words& words)
{
    const Id id = source_in(words, "OSD");
    answer(session,
           board::sources::start_graphics(id.number, size_in(words),
                                          words.has("ycbcr") ? DRV_GFX_COLOR_MODE_YCBCR : DRV_GFX_COLOR_MODE_RGB));
}

void resize(Session& session, const Words& words)
{
    const Id id = source_in(words, "NAME");
    try
    {
        answer(session, board::sources::resize(id, size_in(words)));
    }
    catch (const std::invalid_argument& error)
    {
        throw StepFailed(error.what());
    }
}

void connect_back(Session&, const Words& words)
{
    const Id id = source_in(words, "NAME");
    if (id.type != Id::Type::VideoPlane)
        throw LineError("an OSD plane is told nothing, and so has no place to connect back from");
    board::sources::set_connects_back(id.number, words.has("on"));
}

void set_delays(Session&, const Words& words)
{
    board::mixer::Arrangement arrangement{};
    const std::vector<std::string> delays = words.all("D");
    for (std::size_t plane = 0; plane < arrangement.delay.size(); ++plane)
        arrangement.delay[plane] = static_cast<std::int32_t>(number_in(delays[plane], "a plane's delay",
                                                                       std::numeric_limits<std::int32_t>::min(),
                                                                       std::numeric_limits<std::int32_t>::max()));
    if (!words.has("ORDER"))
    {
        board::mixer::set_plane_delay(arrangement.delay);
        return;
    }
    arrangement.order = static_cast<std::uint32_t>(
        number_in(words.at("ORDER"), "the order", 0, std::numeric_limits<std::uint32_t>::max()));
    try
    {
        board::mixer::set_arrangement(arrangement);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

} // namespace

board::sources::Id source_called(const std::string& name)
try
{
    return board::sources::find(name);
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what() + did_you_mean(name, board::sources::names()));
}

std::vector<Verb> source_verbs()
{
    return {
        { "source",
          { { "source NAME connect",
              "a source of pictures, `vdp0` to `vdp3` or `osd0` to `osd5`, connects to its port of the mixer. The "
              "result "
              "is the mixer's answer, as with all of `source`",
              connect },
            { "source NAME disconnect", "it leaves its port", disconnect },
            { "source VDP start SIZE [luma N]",
              "a video plane delivers pictures of this size, such as `1920x1080`, with luma key N, else 0; it connects "
              "first when it has not",
              start_video },
            { "source OSD start SIZE ycbcr|rgb", "the same for an OSD plane, with its colour mode", start_graphics },
            { "source NAME size SIZE", "its pictures have another size from now on", resize },
            { "source NAME stop", "it delivers no more", stop },
            { "source NAME picture FILE",
              "its pictures are those of a file from now on, a PNG or the first frame of a Y4M, relative to the "
              "scenario",
              show_file },
            { "source NAME picture bars|ramp|checker|card",
              "they are colour bars, a ramp, squares, or the card that names it, as in the beginning", show_pattern },
            { "source NAME picture solid R,G,B", "they have one colour", show_solid },
            { "source NAME connects-back on|off",
              "a video plane's driver that connects from inside `pu4SetColorMode`, which nobody may",
              connect_back } } },
        { "plane-delay",
          { { "plane-delay D D D D D D D D",
              "delays that the mixer reports from the next plane order on, plane 1 first", set_delays },
            { "plane-delay order ORDER D D D D D D D D", "the same for that arrangement alone, such as `0x76543210`",
              set_delays } } },
    };
}

} // namespace pmxboard
