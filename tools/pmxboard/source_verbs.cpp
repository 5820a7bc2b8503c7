// Verbs for the sources of pictures, and for the delays of the planes that carry them.
#include <charconv>
#include <limits>

#include "board/mixer.h"
#include "board/sources.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_words.h"

namespace pmxboard
{
namespace
{

using board::Value;
using board::sources::Id;
using board::sources::Size;

/** `1920x1080`. */
Size read_size(const Line& line, const std::string& word)
{
    Size size{};
    const char* const end = word.data() + word.size();
    const auto width = std::from_chars(word.data(), end, size.width);
    if (width.ec != std::errc() || width.ptr == end || *width.ptr != 'x')
        wrong_usage(line);
    const auto height = std::from_chars(width.ptr + 1, end, size.height);
    if (height.ec != std::errc() || height.ptr != end)
        wrong_usage(line);
    return size;
}

Id read_source(const std::string& name)
{
    try
    {
        return board::sources::find(name);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what() + did_you_mean(name, board::sources::names()));
    }
}

/** `start 1920x1080 [luma N]` of a video plane, `start 1280x720 ycbcr|rgb` of an OSD plane. */
UINT32 start(Id id, const Line& line)
{
    if (id.type == Id::Type::VideoPlane)
    {
        if (line.size() != 4 && (line.size() != 6 || line.word(4) != "luma"))
            wrong_usage(line);
        const Size size = read_size(line, line.word(3));
        const auto luma_key =
            line.size() == 6 ? static_cast<UCHAR>(number_in(line.word(5), "the luma key", 0, 255)) : UCHAR{ 0 };
        return board::sources::start_video(id.number, size, luma_key);
    }
    if (line.size() != 5 || (line.word(4) != "ycbcr" && line.word(4) != "rgb"))
        wrong_usage(line);
    return board::sources::start_graphics(id.number, read_size(line, line.word(3)),
                                          line.word(4) == "ycbcr" ? DRV_GFX_COLOR_MODE_YCBCR : DRV_GFX_COLOR_MODE_RGB);
}

UINT32 resize(Id id, const Line& line)
{
    need_words(line, 4, 4);
    try
    {
        return board::sources::resize(id, read_size(line, line.word(3)));
    }
    catch (const std::invalid_argument& error)
    {
        throw StepFailed(error.what());
    }
}

UINT32 simple(Id id, const Line& line)
{
    need_words(line, 3, 3);
    const std::string& action = line.word(2);
    if (action == "connect")
        return board::sources::connect(id);
    if (action == "disconnect")
        return board::sources::disconnect(id);
    if (action != "stop")
        wrong_usage(line);
    return board::sources::stop(id);
}

} // namespace

void run_source(Session& session, const Line& line)
{
    need_words(line, 3, 6);
    const Id id = read_source(line.word(1));
    const std::string& action = line.word(2);
    if (action == "connects-back")
    {
        need_words(line, 4, 4);
        const bool connects_back = read_switch(line, line.word(3));
        if (id.type != Id::Type::VideoPlane)
            throw LineError("an OSD plane is told nothing, and so has no place to connect back from");
        board::sources::set_connects_back(id.number, connects_back);
        return;
    }
    const UINT32 answer = action == "start" ? start(id, line) : action == "size" ? resize(id, line) : simple(id, line);
    session.set_outcome("source",
                        { Value::number(answer, {}, answer > 0xFFFF ? Value::Base::Hex : Value::Base::Decimal), {} });
}

void run_plane_delay(Session&, const Line& line)
{
    const bool of_order = line.size() > 1 && line.word(1) == "order";
    const std::size_t first = of_order ? 3 : 1;
    board::mixer::Arrangement arrangement{};
    need_words(line, first + arrangement.delay.size(), first + arrangement.delay.size());
    for (std::size_t plane = 0; plane < arrangement.delay.size(); ++plane)
        arrangement.delay[plane] = static_cast<std::int32_t>(number_in(line.word(first + plane), "a plane's delay",
                                                                       std::numeric_limits<std::int32_t>::min(),
                                                                       std::numeric_limits<std::int32_t>::max()));
    if (!of_order)
    {
        board::mixer::set_plane_delay(arrangement.delay);
        return;
    }
    arrangement.order =
        static_cast<std::uint32_t>(number_in(line.word(2), "the order", 0, std::numeric_limits<std::uint32_t>::max()));
    try
    {
        board::mixer::set_arrangement(arrangement);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

} // namespace pmxboard
