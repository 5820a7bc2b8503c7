// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/content.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <map>

#include "board/picture/pattern.h"

namespace board::picture
{
namespace
{

constexpr std::string_view PHOTOGRAPH = "vdp2";
constexpr std::array<std::string_view, 2> SECOND_VIDEOS = { "vdp1", "vdp3" };

/** The card of a source: those of video planes fill the picture, those of graphics let it be seen. */
struct NamedStyle
{
    std::string_view name;
    CardStyle style;
};

constexpr std::array CARD_STYLES = {
    NamedStyle{ "vdp0", { { 0.10, 0.25, 0.55 } } },
    NamedStyle{ "vdp1", { { 0.75, 0.35, 0.05 }, 1, {}, 4 } },
    NamedStyle{ "vdp2", { { 0.10, 0.45, 0.20 } } },
    NamedStyle{ "vdp3", { { 0.45, 0.15, 0.50 }, 1, {}, 4 } },
    NamedStyle{ "osd0", { { 0.95, 0.85, 0.20 }, 0.85, { 0.03, 0.06, 0.33, 0.30 } } },
    NamedStyle{ "osd1", { { 0.20, 0.75, 0.85 }, 0.85, { 0.35, 0.06, 0.65, 0.30 } } },
    NamedStyle{ "osd2", { { 0.85, 0.30, 0.55 }, 0.85, { 0.67, 0.06, 0.97, 0.30 } } },
    NamedStyle{ "osd3", { { 0.55, 0.80, 0.30 }, 0.85, { 0.03, 0.70, 0.33, 0.94 } } },
    NamedStyle{ "osd4", { { 0.90, 0.90, 0.90 }, 0.85, { 0.35, 0.70, 0.65, 0.94 } } },
    NamedStyle{ "osd5", { { 0.85, 0.25, 0.20 }, 0.85, { 0.67, 0.70, 0.97, 0.94 } } },
};

Image card_of(const SourceState& source, const Space& space)
{
    const auto found = std::find_if(CARD_STYLES.begin(), CARD_STYLES.end(),
                                    [&](const NamedStyle& row) { return row.name == source.name; });
    const int width = source.delivery->width;
    const int height = source.delivery->height;
    return card(width, height, space, found == CARD_STYLES.end() ? CARD_STYLES.front().style : found->style,
                { source.name, std::to_string(width) + "x" + std::to_string(height) });
}

constexpr std::string_view SOLID = "solid ";

/** The colour in the name of a picture of one colour. */
std::optional<Signals> solid_colour(std::string_view name)
{
    if (!name.starts_with(SOLID))
        return std::nullopt;
    std::array<unsigned, 3> levels{};
    const char* next = name.data() + SOLID.size();
    const char* const end = name.data() + name.size();
    for (unsigned& level : levels)
    {
        next = std::from_chars(next, end, level).ptr;
        next += next != end ? 1 : 0; // the comma
    }
    return signals_of(levels[0], levels[1], levels[2]);
}

Image pattern_of(const SourceState& source, const Space& space)
{
    const int width = source.delivery->width;
    const int height = source.delivery->height;
    if (source.picture == "bars")
        return bars(width, height, space);
    if (source.picture == "ramp")
        return ramp(width, height, space);
    if (source.picture == "checker")
        return checker(width, height, space);
    if (const auto colour = solid_colour(source.picture))
        return solid(width, height, space, *colour);
    return card_of(source, space);
}

/** Patterns that were made: the same ones are seen again and again. */
std::shared_ptr<const Image> made_pattern(const SourceState& source, const Space& space)
{
    constexpr std::size_t most = 16;
    static std::map<std::string, std::shared_ptr<const Image>> made;
    const std::string key =
        source.name + " " + source.picture + " " + std::to_string(source.delivery->width) + "x" +
        std::to_string(source.delivery->height) + " " + std::to_string(static_cast<int>(space.kind)) +
        std::to_string(static_cast<int>(space.standard)) + std::to_string(static_cast<int>(space.range));
    const auto found = made.find(key);
    if (found != made.end())
        return found->second;
    if (made.size() >= most)
        made.clear();
    return made[key] = std::make_shared<const Image>(pattern_of(source, space));
}

} // namespace

bool is_second_video(const SourceState& source)
{
    return std::find(SECOND_VIDEOS.begin(), SECOND_VIDEOS.end(), source.name) != SECOND_VIDEOS.end();
}

Space own_space(const SourceState& source)
{
    if (!source.delivery->ycbcr)
        return full_rgb;
    if (source.name == PHOTOGRAPH)
        return ycbcr(Standard::Bt601, Range::Full);
    return ycbcr(standard_of(source.delivery->width, source.delivery->height));
}

std::shared_ptr<const Image> content_of(const SourceState& source)
{
    if (!source.delivery || !is_picture_size(source.delivery->width, source.delivery->height))
        return nullptr;
    if (source.image != nullptr)
        return source.image;
    return made_pattern(source, own_space(source));
}

std::string solid_name(unsigned red, unsigned green, unsigned blue)
{
    return std::string(SOLID) + std::to_string(red) + "," + std::to_string(green) + "," + std::to_string(blue);
}

} // namespace board::picture
