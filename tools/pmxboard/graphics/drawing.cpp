// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/graphics/drawing.h"

#ifdef PMX_HAS_PICTURES
#include <sixel.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <memory>
#include <stdexcept>
#include <string_view>
#include <vector>

#include "board/picture/pixels.h"
#include "board/picture/preview.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/graphics/terminal.h"
#include "tools/pmxboard/report/base64.h"
#include "tools/pmxboard/text/printable.h"
#endif

namespace pmxboard
{

const std::vector<std::string>& ways_to_draw()
{
    static const std::vector<std::string> ways = { "auto", "none", "blocks", "sixel", "kitty" };
    return ways;
}

#ifdef PMX_HAS_PICTURES

namespace
{

namespace picture = board::picture;

constexpr int widest_drawn = 960; ///< some terminals take no picture of more than 1000 pixels
constexpr int most_colours = 256;
constexpr std::size_t longest_told = 60;

/** What a C library hands over, piece by piece. */
struct Collected
{
    std::string text;
    bool is_whole = true;
};

/** The library that calls it is no C++. */
int collect(char* data, int size, void* to)
{
    Collected& collected = *static_cast<Collected*>(to);
    try
    {
        collected.text.append(data, static_cast<std::size_t>(size));
    }
    catch (const std::exception&)
    {
        collected.is_whole = false;
    }
    return size;
}

void need(SIXELSTATUS status)
{
    if (SIXEL_FAILED(status))
        throw std::runtime_error(std::string("no sixels can be made of it: ") + sixel_helper_format_error(status));
}

/** As wide as the same picture in characters is. */
picture::Image fitted_to_terminal(const picture::Image& image)
{
    const int width = std::clamp(pixels_of_columns(picture::preview_columns), 1, std::min(widest_drawn, image.width()));
    const int height = std::max(1, (image.height() * width + image.width() / 2) / image.width());
    return picture::scaled(image, width, height);
}

std::string_view variable(const char* name)
{
    const char* const value = std::getenv(name);
    return value == nullptr ? std::string_view() : value;
}

std::string way_of_surroundings()
{
    const std::string_view way = variable("PMXBOARD_GRAPHICS");
    return way.empty() ? "auto" : std::string(way);
}

/** "one, two or three" */
std::string all_ways()
{
    std::string all;
    for (const std::string& way : ways_to_draw())
        all += (all.empty() ? "" : &way == &ways_to_draw().back() ? " or " : ", ") + way;
    return all;
}

/** What the terminal can: a word of --graphics. */
std::string best_of_terminal(const GiveBack& give_back)
{
    const std::string_view terminal = variable("TERM");
    // One terminal within another: what is known of the outer one does not hold for it.
    const bool is_inner = terminal.starts_with("screen") || terminal.starts_with("tmux");
    if (isatty(STDOUT_FILENO) != 1)
        return "blocks";
    if (terminal == "xterm-kitty" || (!is_inner && !variable("KITTY_WINDOW_ID").empty()))
        return "kitty";
    // The console of Linux shows no pictures, and old ones would show the question.
    if (!give_back || terminal == "linux" || isatty(STDIN_FILENO) != 1)
        return "blocks";
    const TerminalAnswer answer = ask_terminal(!is_inner);
    if (!answer.typed.empty())
        give_back(answer.typed);
    return answer.kitty ? "kitty" : answer.sixel ? "sixel" : "blocks";
}

std::string drawn_as(std::string_view how, const picture::Image& image)
{
    if (how == "kitty")
        return as_kitty_takes_it(fitted_to_terminal(image)) + "\n";
    if (how == "sixel")
        return as_sixels(fitted_to_terminal(image)) + "\n";
    return picture::preview(image, picture::preview_columns, how == "blocks");
}

} // namespace

std::string as_kitty_takes_it(const picture::Image& image)
{
    constexpr std::size_t longest_piece = 4096;
    const std::string letters = base64(picture::to_png(image));
    std::string text;
    for (std::size_t begin = 0; begin < letters.size(); begin += longest_piece)
    {
        // To be shown, a PNG, and not to be answered: nobody would read that but the prompt.
        text += begin == 0 ? "\x1b_Ga=T,f=100,q=2," : "\x1b_G";
        text += begin + longest_piece < letters.size() ? "m=1;" : "m=0;";
        text.append(letters, begin, longest_piece).append("\x1b\\");
    }
    return text;
}

std::string as_sixels(const picture::Image& image)
{
    const picture::Image rgb = converted(image, picture::full_rgb);
    std::vector<unsigned char> samples;
    samples.reserve(rgb.pixels().size() * 3);
    for (const picture::Pixel pixel : rgb.pixels())
        for (unsigned index = 0; index < 3; ++index)
            samples.push_back(static_cast<unsigned char>(picture::code(pixel, index)));

    Collected collected;
    sixel_output_t* output = nullptr;
    need(sixel_output_new(&output, collect, &collected, nullptr));
    const std::unique_ptr<sixel_output_t, decltype(&sixel_output_unref)> output_owner(output, sixel_output_unref);
    sixel_dither_t* dither = nullptr;
    need(sixel_dither_new(&dither, most_colours, nullptr));
    const std::unique_ptr<sixel_dither_t, decltype(&sixel_dither_unref)> dither_owner(dither, sixel_dither_unref);
    need(sixel_dither_initialize(dither, samples.data(), rgb.width(), rgb.height(), SIXEL_PIXELFORMAT_RGB888,
                                 SIXEL_LARGE_AUTO, SIXEL_REP_AUTO, SIXEL_QUALITY_HIGH));
    constexpr int bytes_of_pixel = 3;
    need(sixel_encode(samples.data(), rgb.width(), rgb.height(), bytes_of_pixel, dither, output));
    if (!collected.is_whole)
        throw std::bad_alloc();
    return collected.text;
}

Drawing drawing(const std::string& said, bool colour, const GiveBack& give_back)
{
    const std::string how = said.empty() ? way_of_surroundings() : said;
    if (std::find(ways_to_draw().begin(), ways_to_draw().end(), how) == ways_to_draw().end())
        return [how](const picture::Image&) -> std::string {
            throw StepFailed("PMXBOARD_GRAPHICS is " + printable(how, longest_told) + "; it may be " + all_ways());
        };
    if (how != "auto")
        return [how](const picture::Image& image) { return drawn_as(how, image); };
    if (!colour)
        return {};
    return [best = std::string(), give_back](const picture::Image& image) mutable {
        if (best.empty())
            best = best_of_terminal(give_back);
        return drawn_as(best, image);
    };
}

#else

Drawing drawing(const std::string&, bool, const GiveBack&)
{
    return {}; // nobody draws
}

#endif

} // namespace pmxboard
