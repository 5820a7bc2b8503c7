// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/seen_pictures.h"

#ifdef PMX_HAS_PICTURES
#include <algorithm>
#include <cmath>
#include <functional>
#include <iterator>

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

bool SeenPictures::can_look()
{
    return true;
}

std::size_t SeenPictures::place_of(std::string png)
{
    std::vector<std::size_t>& same_hash = m_places[std::hash<std::string>()(png)];
    for (const std::size_t place : same_hash)
    {
        if (m_all[place] == png)
            return place;
    }
    same_hash.push_back(m_all.size());
    m_all.push_back(std::move(png));
    return same_hash.back();
}

std::vector<SeenOutput> SeenPictures::look()
{
    constexpr std::size_t most_known = 16; // a run goes to and fro between few of them
    const auto now = std::make_shared<const picture::Hardware>(picture::hardware_now());
    const auto known =
        std::find_if(m_looked.begin(), m_looked.end(), [&](const Looked& looked) { return *looked.hardware == *now; });
    if (known != m_looked.end())
    {
        std::rotate(m_looked.begin(), known, std::next(known));
        return m_looked.front().seen;
    }
    ++m_looks;
    std::vector<SeenOutput> seen;
    for (const picture::Shot& shot : picture::all_shots(*now))
        seen.push_back({ std::string(picture::name_of(shot.output)), description_of(shot),
                         place_of(picture::to_png(fitted(shot.picture))) });
    m_looked.push_front({ now, seen });
    if (m_looked.size() > most_known)
        m_looked.pop_back();
    return seen;
}

#else

bool SeenPictures::can_look()
{
    return false;
}

std::vector<SeenOutput> SeenPictures::look()
{
    return {};
}

#endif

} // namespace pmxboard
