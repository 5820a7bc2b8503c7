// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for pictures: what sources show, and what is seen. A tool for another machine is built without the libraries
// that they take.
#include "tools/pmxboard/language/picture_verbs.h"

#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"

#ifdef PMX_HAS_PICTURES
#include <algorithm>
#include <array>
#include <filesystem>

#include "board/files.h"
#include "board/picture/compare.h"
#include "board/picture/content.h"
#include "board/picture/pixels.h"
#include "board/picture/preview.h"
#include "board/picture/shot.h"
#include "board/sources.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/text/suggest.h"
#endif

namespace pmxboard
{

#ifdef PMX_HAS_PICTURES

namespace
{

namespace picture = board::picture;

constexpr unsigned usual_tolerance = 2; ///< what conversions of eight bits leave, one behind the other
/** Enough for a Y4M's first frame, and for a PNG of sixteen bits that cannot be packed. */
constexpr std::size_t most_of_file = 160 * board::files::mebibyte;
constexpr std::string_view card = "card";
/** What a source shows without a file, but for one colour. */
constexpr std::array<std::string_view, 4> patterns = { "bars", "ramp", "checker", card };
constexpr int sheet_width = 960;
constexpr int sheet_height = 540;

/** Numbers with commas between them: "10,20,30". */
template <std::size_t Count>
std::array<unsigned, Count> numbers_in(const std::string& word, const std::string& what, unsigned highest)
{
    std::array<unsigned, Count> numbers{};
    std::string_view rest = word;
    for (std::size_t i = 0; i < Count; ++i)
    {
        const std::size_t comma = rest.find(',');
        if ((comma == rest.npos) != (i + 1 == Count))
            throw LineError(what + " is " + std::to_string(Count) + " numbers with commas between them, not " + word);
        numbers[i] = static_cast<unsigned>(number_in(std::string(rest.substr(0, comma)), what, 0, highest));
        rest.remove_prefix(std::min(rest.size(), comma == rest.npos ? rest.size() : comma + 1));
    }
    return numbers;
}

std::array<unsigned, 3> colour_in(const Words& words)
{
    return numbers_in<3>(words.at("R,G,B"), "a colour", 255);
}

picture::Image read_image(const std::filesystem::path& file)
try
{
    return picture::read_picture(board::files::read_start(file, most_of_file));
}
catch (const board::files::FileError& error)
{
    throw StepFailed(error.what());
}
catch (const picture::PictureError& error)
{
    throw StepFailed(file.string() + ": " + error.what());
}

void set_picture(const Words& words, board::sources::Picture shown)
{
    board::sources::set_picture(source_called(words.at("NAME")), std::move(shown));
}

/** Nothing for all outputs. */
std::optional<picture::OutputId> output_in(const Words& words)
{
    const std::string& name = words.at("OUTPUT");
    const std::string_view all = "all";
    // As the layer's calls have them, too.
    const std::string_view digital = "ccir";
    const std::string_view component = "cav";
    if (name == all)
        return std::nullopt;
    if (name == digital)
        return picture::OutputId::Digital;
    if (name == component)
        return picture::OutputId::Component;
    std::vector<std::string_view> known(output_words.begin(), output_words.end());
    if (std::find(known.begin(), known.end(), name) != known.end())
        return static_cast<picture::OutputId>(output_called(name));
    known.insert(known.end(), { all, digital, component });
    throw LineError("there is no output " + name + did_you_mean(name, known));
}

/** What is seen, and what is to be said of it. */
struct Seen
{
    picture::Image image;
    std::string description;
    bool is_enlarged = false; ///< it was smaller than asked for
};

std::string described(const picture::Shot& shot)
{
    const std::string name(picture::name_of(shot.output));
    if (!shot.why_dark.empty())
        return name + ": no signal, " + shot.why_dark;
    return name + ": " + std::to_string(shot.picture.width()) + "x" + std::to_string(shot.picture.height());
}

Seen seen_on(const std::optional<picture::OutputId>& output, int width, int height)
{
    const picture::Hardware hardware = picture::hardware_now();
    if (output)
    {
        picture::Shot shot = picture::shot_of(hardware, *output);
        std::string description = described(shot); // of the picture, before it goes
        return { std::move(shot.picture), std::move(description) };
    }
    const auto shots = picture::all_shots(hardware);
    std::string description;
    for (const picture::Shot& shot : shots)
        description += (description.empty() ? "" : "; ") + described(shot);
    return { picture::sheet_of(shots, width, height), description };
}

Seen seen_in_size(const Words& words, std::optional<std::pair<int, int>> size)
try
{
    const auto output = output_in(words);
    const auto [width, height] = size.value_or(std::pair(sheet_width, sheet_height));
    Seen seen = seen_on(output, width, height);
    if (size && (seen.image.width() != width || seen.image.height() != height))
    {
        seen.is_enlarged = width > seen.image.width() || height > seen.image.height();
        seen.image = picture::scaled(seen.image, width, height);
    }
    return seen;
}
catch (const picture::PictureError& error)
{
    throw LineError(error.what());
}

std::string colour_text(picture::Pixel pixel)
{
    const auto level = [pixel](unsigned index) { return std::to_string(picture::code(pixel, index)); };
    return level(0) + "," + level(1) + "," + level(2);
}

/** Nothing where nobody looks: a terminal would be asked for it. */
std::string drawn(const Output& output, const picture::Image& image)
{
    if (!output.for_people())
        return "";
    const Drawing& draw = output.drawing();
    return draw ? draw(image) : picture::preview(image, picture::preview_columns, output.look().colour);
}

/** Beside the picture that was expected, by a line that is carried out and not imagined; what cannot be written is no
 *  matter then. */
std::string keep_difference(const Session& session, const std::filesystem::path& file, const picture::Image& shown)
try
{
    if (session.imagines())
        return "";
    const std::filesystem::path kept = std::filesystem::path(file).replace_extension(".difference.png");
    write_file(kept.string(), picture::to_png(shown));
    return "; the difference is in " + kept.string();
}
catch (const board::files::FileError&)
{
    return "";
}

} // namespace

void show_file(Session& session, const Words& words)
{
    const std::filesystem::path file = session.file(words.at("FILE"));
    std::error_code error;
    if (!std::filesystem::exists(file, error))
    {
        const std::string meant = did_you_mean(words.at("FILE"), { patterns.begin(), patterns.end() });
        if (!meant.empty())
            throw StepFailed("there is no file " + file.string() + meant);
    }
    board::files::note_input(file);
    set_picture(words, { file.filename().string(), std::make_shared<const picture::Image>(read_image(file)) });
}

void show_pattern(Session&, const Words& words)
{
    for (const std::string_view pattern : patterns)
        if (words.has(pattern))
            set_picture(words, { pattern == card ? std::string() : std::string(pattern), {} });
}

void show_solid(Session&, const Words& words)
{
    const auto [red, green, blue] = colour_in(words);
    set_picture(words, { picture::solid_name(red, green, blue), {} });
}

void take_shot(Session& session, const Words& words)
{
    const bool to_file = words.has("FILE");
    if (to_file && read_size(words.at("FILE")))
        throw LineError("a size stands behind its file; write: shot OUTPUT FILE SIZE");
    if (to_file && session.imagines())
        throw LineError("shot writes a file, and what-if changes nothing");
    std::optional<std::pair<int, int>> size;
    if (words.has("SIZE"))
        size = read_size(words.at("SIZE"));
    const Seen seen = seen_in_size(words, size);
    if (!to_file)
    {
        session.output().text("  " + seen.description + "\n" + drawn(session.output(), seen.image));
        return;
    }
    const std::string name = file_name(words.at("FILE"));
    try
    {
        write_file(name, picture::to_png(seen.image));
    }
    catch (const board::files::FileError& error)
    {
        throw StepFailed(error.what());
    }
    session.output().text("  " + seen.description + "\n  written to " + printable(name) + "\n");
}

void expect_colour(Session&, const Words& words)
{
    const auto output = output_in(words);
    if (!output)
        throw LineError("a point is one of one output: digital, hdmi, component or composite");
    const auto [x, y] = numbers_in<2>(words.at("X,Y"), "a point", picture::longest_side);
    const auto [red, green, blue] = colour_in(words);
    const auto tolerance = words.has("TOLERANCE")
                               ? static_cast<unsigned>(number_in(words.at("TOLERANCE"), "the tolerance", 0, 255))
                               : usual_tolerance;
    const Seen seen = seen_on(output, 0, 0);
    if (x >= static_cast<unsigned>(seen.image.width()) || y >= static_cast<unsigned>(seen.image.height()))
        throw StepFailed("expected a point at " + words.at("X,Y") + ", found " + seen.description);
    const picture::Pixel found = seen.image.at(static_cast<int>(x), static_cast<int>(y));
    if (picture::distance(found, picture::opaque(red, green, blue)) > tolerance)
        throw StepFailed("expected " + words.at("R,G,B") + " at " + words.at("X,Y") + ", found " + colour_text(found) +
                         "; " + seen.description);
}

void expect_file(Session& session, const Words& words)
{
    const std::filesystem::path file = session.file(words.at("FILE"));
    const picture::Image expected = converted(read_image(file), picture::full_rgb);
    const Seen seen = seen_in_size(words, std::pair(expected.width(), expected.height()));
    if (seen.is_enlarged)
        throw StepFailed("expected a picture of " + std::to_string(expected.width()) + "x" +
                         std::to_string(expected.height()) + ", found " + seen.description);
    const auto found = picture::difference(expected, seen.image, usual_tolerance);
    if (!found)
        return;
    throw StepFailed("expected the picture " + words.at("FILE") + ", found " + std::to_string(found->pixels) +
                     " other pixels, at " + std::to_string(found->x) + "," + std::to_string(found->y) + " " +
                     colour_text(seen.image.at(found->x, found->y)) + " for " +
                     colour_text(expected.at(found->x, found->y)) + "; " + seen.description +
                     keep_difference(session, file, found->shown));
}

#else

namespace
{

[[noreturn]] void without_pictures()
{
    throw StepFailed("this pmxboard was built without pictures");
}

} // namespace

void show_file(Session&, const Words&)
{
    without_pictures();
}

void show_pattern(Session&, const Words&)
{
    without_pictures();
}

void show_solid(Session&, const Words&)
{
    without_pictures();
}

void take_shot(Session&, const Words&)
{
    without_pictures();
}

void expect_colour(Session&, const Words&)
{
    without_pictures();
}

void expect_file(Session&, const Words&)
{
    without_pictures();
}

#endif

std::vector<Verb> picture_verbs()
{
    return {
        { "shot",
          { { "shot OUTPUT",
              "show what a viewer sees on an output, which is also called `ccir`, `cav`, in characters where the "
              "terminal takes no pictures; `shot all` shows the four of them",
              take_shot, looks },
            { "shot OUTPUT FILE [SIZE]",
              "write it to a PNG, relative to where the tool runs, as large as it is, all four as 960x540, or in "
              "another size",
              take_shot, looks } } },
    };
}

} // namespace pmxboard
