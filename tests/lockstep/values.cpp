// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/values.h"

#include <utility>

#include "src/driver/pmx/pmx_if.h"

namespace lockstep
{
namespace
{

bool has(std::string_view name, std::string_view part)
{
    return name.find(part) != std::string_view::npos;
}

std::uint64_t draw_mode(Random& random)
{
    static constexpr std::uint64_t common[] = { RES_480I,      RES_576I,      RES_480P,         RES_576P,
                                                RES_720P60HZ,  RES_720P50HZ,  RES_1080I60HZ,    RES_1080P60HZ,
                                                RES_1080P50HZ, RES_1080P24HZ, RES_1080P29_97HZ, RES_2D_576I50HZ };
    static constexpr std::uint64_t odd[] = { 47, 50, 51, 52, 53, 127, 128, 254, 255 };
    switch (random.below(8))
    {
    case 0: return random.one_of(odd);
    case 1:
    case 2:
    case 3: return random.one_of(common);
    default: return random.below(RES_MODE_NUM);
    }
}

std::uint64_t draw_frequency(Random& random, std::size_t /*size*/)
{
    static constexpr std::uint64_t values[] = { 60, 60, 50, 50, 30, 29, 25, 24, 23, 0, 59, 255 };
    return random.one_of(values);
}

std::uint64_t draw_number(Random& random, std::size_t size)
{
    static constexpr std::uint64_t edges[] = { 0, 1, 2, 3, 128, 255 };
    static constexpr std::uint64_t wide[] = { 0x100, 0x101, 0x80000000, 0xFFFFFFFF, 0x7FFFFFFF, 0x1234 };
    switch (random.below(8))
    {
    case 0: return random.next();
    case 1: return random.below(16);
    case 2: return size > 1 ? random.one_of(wide) : random.one_of(edges);
    default: return random.one_of(edges);
    }
}

std::uint64_t draw_plane_order(Random& random, std::size_t /*size*/)
{
    unsigned planes[8] = { 0, 1, 2, 3, 4, 5, 6, 7 };
    for (unsigned i = 8; i > 1; --i)
        std::swap(planes[i - 1], planes[random.below(i)]);
    if (random.once_in(4))
        planes[random.below(8)] = static_cast<unsigned>(random.below(8));
    std::uint64_t order = 0;
    for (unsigned i = 0; i < 8; ++i)
        order |= static_cast<std::uint64_t>(planes[i] | (random.once_in(16) ? 8u : 0u)) << (4 * i);
    return order;
}

std::uint64_t draw_capability(Random& random, std::size_t /*size*/)
{
    switch (random.below(4))
    {
    case 0: return random.next();
    case 1: return 0x7FFBFFFF & ~(1ull << random.below(32));
    default: return 0x7FFBFFFF;
    }
}

/* Few values are meant; now and then it is any other. */
template <std::uint64_t count, std::uint64_t times>
std::uint64_t draw_choice(Random& random, std::size_t /*size*/)
{
    return random.once_in(times) ? random.next() : random.below(count);
}

std::uint64_t draw_place(Random& random, std::size_t /*size*/)
{
    return random.below(10);
}

} // namespace

Draw draw_for_argument(std::string_view name)
{
    static constexpr std::uint64_t ids[] = { 0, 0, 0, 0, 0, 0, 1, 2, 255 };
    static constexpr std::uint64_t tags[] = { 0, 0, 0, 0x100, 0xABCDEF00, 1, 255, 0x101 };
    static constexpr std::uint64_t sizes[] = { 0, 1, 719, 720, 721, 576, 577, 1920, 1080, 0xFFFFFFFF, 0x80000000 };
    static constexpr std::uint64_t component_ids[] = { 0, 0, 1, 2, 3, 4, 5, 6, 255, 256, 257 };
    static constexpr std::uint64_t frequencies[] = { 24, 25, 30, 50, 60, 59, 48, 0x13C };
    if (name == "ucPmxId")
        return [](Random& random, std::size_t) { return random.one_of(ids); };
    if (name == "pvTag")
        return [](Random& random, std::size_t) { return random.one_of(tags); };
    if (name == "u2VSyncFreq")
        return [](Random& random, std::size_t) { return random.one_of(frequencies); };
    if (name == "u4PlaneOrder")
        return draw_plane_order;
    if (name == "ucSwapMode" || name == "ucPlaneOrder")
        return draw_place;
    if (name == "ucMediaType" || name == "eSrcColorMode" || name == "eSetType")
        return draw_choice<17, 8>;
    if (name == "u4AspectRatio")
        return draw_choice<12, 8>;
    if (name == "level")
        return [](Random& random, std::size_t) { return random.once_in(8) ? 0 - random.below(3) : random.below(34); };
    if (has(name, "Width") || has(name, "Height"))
        return [](Random& random, std::size_t) { return random.one_of(sizes); };
    if (name == "ucVdpId" || name == "ucOsdId" || name == "ucVdpHwId" || has(name, "CompId"))
        return [](Random& random, std::size_t) { return random.one_of(component_ids); };
    return draw_for_field(name);
}

Draw draw_for_field(std::string_view name)
{
    static constexpr std::uint64_t component_types[] = { 0x41, 0x41, 0xB0, 0xB0, 66, 0, 0x141 };
    if (has(name, "eDg") || has(name, "Color") || name == "rDrvExtScl")
        return has(name, "Fmt") ? draw_choice<11, 16> : draw_choice<4, 16>;
    if (has(name, "eResMode") || name == "ucMode" || has(name, "ResIndex") || has(name, "OutputMode") ||
        has(name, "ChkRes"))
        return [](Random& random, std::size_t size) {
            return size > 1 && random.once_in(16) ? random.next() : draw_mode(random);
        };
    if (name == "ucVfreq" || name == "ucVFreq" || has(name, "u4VFreq"))
        return draw_frequency;
    if (name == "u4Capability")
        return draw_capability;
    if (name == "u4PlaneOrder")
        return draw_plane_order;
    if (has(name, "aucPlaneOrder"))
        return draw_place;
    if (has(name, "CompType"))
        return [](Random& random, std::size_t) { return random.one_of(component_types); };
    if (has(name, "CompId"))
        return [](Random& random, std::size_t) { return random.below(7); };
    return draw_number;
}

} // namespace lockstep
