// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/seen_pictures.h"

#ifdef PMX_HAS_PICTURES
#include <algorithm>
#include <cmath>

#include "board/picture/pixels.h"
#include "board/picture/shot.h"
#endif

namespace pmxboard
{

#ifdef PMX_HAS_PICTURES

namespace
{

namespace picture = board::picture;

// What fills a page of 1280 pixels well enough to be read; four times as many would fill the file instead.
constexpr int widest = 640;
constexpr int tallest = 360;

picture::Image fitted(const picture::Image& image)
{
    const double scale =
        std::min({ 1.0, static_cast<double>(widest) / image.width(), static_cast<double>(tallest) / image.height() });
    const auto side = [scale](int pixels) { return std::max(1, static_cast<int>(std::lround(pixels * scale))); };
    return picture::scaled(image, side(image.width()), side(image.height()));
}

std::string description_of(const picture::Shot& shot)
{
    if (!shot.why_dark.empty())
        return "no signal, " + shot.why_dark;
    return std::to_string(shot.picture.width()) + "x" + std::to_string(shot.picture.height());
}

} // namespace

std::size_t SeenPictures::place_of(std::string png)
{
    const auto [found, is_new] = m_places.try_emplace(png, m_all.size());
    if (is_new)
        m_all.push_back(std::move(png));
    return found->second;
}

std::vector<SeenOutput> SeenPictures::look()
{
    std::vector<SeenOutput> seen;
    for (const picture::Shot& shot : picture::all_shots(picture::hardware_now()))
        seen.push_back({ std::string(picture::name_of(shot.output)), description_of(shot),
                         place_of(picture::to_png(fitted(shot.picture))) });
    return seen;
}

#else

std::vector<SeenOutput> SeenPictures::look()
{
    return {};
}

#endif

} // namespace pmxboard
