// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/draw.h"

#include <cstring>
#include <utility>

#include "src/driver/pmx/pmx_if.h"
#include "tests/lockstep/agreement.h"

namespace lockstep
{
namespace
{

bool has(const std::string& name, const char* part)
{
    return name.find(part) != std::string::npos;
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

std::uint64_t draw_frequency(Random& random)
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

std::uint64_t draw_plane_order(Random& random)
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

std::uint64_t draw_capability(Random& random)
{
    switch (random.below(4))
    {
    case 0: return random.next();
    case 1: return 0x7FFBFFFF & ~(1ull << random.below(32));
    default: return 0x7FFBFFFF;
    }
}

std::uint64_t cut(std::uint64_t value, std::size_t size)
{
    return size < 8 ? value & ((1ull << 8 * size) - 1) : value;
}

std::size_t size_of(const Parameter& parameter)
{
    const std::string type = parameter.type;
    if (type == "UCHAR" || type == "UINT8" || type == "BYTE" || type == "BOOL")
        return 1;
    return type == "UINT16" ? 2 : type == "void*" ? 8 : 4;
}

std::uint64_t draw_argument(Random& random, const Parameter& parameter)
{
    static constexpr std::uint64_t ids[] = { 0, 0, 0, 0, 0, 0, 1, 2, 255 };
    static constexpr std::uint64_t tags[] = { 0, 0, 0, 0x100, 0xABCDEF00, 1, 255, 0x101 };
    static constexpr std::uint64_t sizes[] = { 0, 1, 719, 720, 721, 576, 577, 1920, 1080, 0xFFFFFFFF, 0x80000000 };
    static constexpr std::uint64_t component_ids[] = { 0, 0, 1, 2, 3, 4, 5, 6, 255, 256, 257 };
    static constexpr std::uint64_t frequencies[] = { 24, 25, 30, 50, 60, 59, 48, 0x13C };
    const std::string name = parameter.name;
    if (name == "ucPmxId")
        return random.one_of(ids);
    if (name == "pvTag")
        return random.one_of(tags);
    if (name == "u2VSyncFreq")
        return random.one_of(frequencies);
    if (name == "u4PlaneOrder")
        return draw_plane_order(random);
    if (name == "ucSwapMode" || name == "ucPlaneOrder")
        return random.below(10);
    if (name == "ucMediaType" || name == "eSrcColorMode" || name == "eSetType")
        return random.once_in(8) ? random.next() : random.below(17);
    if (name == "u4AspectRatio")
        return random.once_in(8) ? random.next() : random.below(12);
    if (name == "level")
        return random.once_in(8) ? 0 - random.below(3) : random.below(34);
    if (has(name, "Width") || has(name, "Height"))
        return random.one_of(sizes);
    if (name == "ucVdpId" || name == "ucOsdId" || name == "ucVdpHwId" || has(name, "CompId"))
        return random.one_of(component_ids);
    return draw_value(random, name, size_of(parameter));
}

} // namespace

std::uint64_t draw_value(Random& random, const std::string& name, std::size_t size)
{
    static constexpr std::uint64_t component_types[] = { 0x41, 0x41, 0xB0, 0xB0, 66, 0, 0x141 };
    if (has(name, "eDg") || has(name, "Color") || name == "rDrvExtScl")
        return random.once_in(16) ? random.next() : random.below(name.find("Fmt") != std::string::npos ? 11 : 4);
    if (has(name, "eResMode") || name == "ucMode" || has(name, "ResIndex") || has(name, "OutputMode") ||
        has(name, "ChkRes"))
        return size > 1 && random.once_in(16) ? random.next() : draw_mode(random);
    if (name == "ucVfreq" || name == "ucVFreq" || has(name, "u4VFreq"))
        return draw_frequency(random);
    if (name == "u4Capability")
        return draw_capability(random);
    if (name == "u4PlaneOrder")
        return draw_plane_order(random);
    if (has(name, "aucPlaneOrder"))
        return random.below(10);
    if (has(name, "CompType"))
        return random.one_of(component_types);
    if (has(name, "CompId"))
        return random.below(7);
    return draw_number(random, size);
}

namespace
{

/* Here, so that a comparison with a layer that loads another default record starts alike. */
Image make_started_state()
{
    Image state(image_size(), 0);
    const auto put = [&](const std::string& name, std::uint64_t value) { set(state, state_field(name), value); };
    put("ucMode", RES_480P);
    put("ucVfreq", 60);
    put("ucDigitalOut", 1);
    put("u4Phase", 2);
    put("ucDigitalBit", 24);
    for (const char* name : { "ucBrightness", "ucContrast", "ucHue", "ucSaturation" })
        put(name, 128);
    put("u4AspectRatio", 3);
    put("u4BgColor", 0x108080);
    put("u4Capability", 0x7FFBFFFF);
    static constexpr unsigned order[] = { 4, 3, 1, 0, 2, 5, 6, 7 };
    for (unsigned i = 0; i < 8; ++i)
    {
        put("aucPlaneOrder[" + std::to_string(i) + "]", order[i]);
        put("arPortInfo[" + std::to_string(i) + "].eInputColorMode", i < 2 ? 0 : 1);
        put("arPortInfo[" + std::to_string(i) + "].eSrcColorSpace", 1);
    }
    put("eMasterColorSpace", 1);
    for (unsigned i = 0; i < PMX_OUTPUT_NUM; ++i)
    {
        const std::string output = "arOutputConf[" + std::to_string(i) + "].";
        put(output + "fgOutputEnable", 1);
        put(output + "eResMode", i == PMX_OUTPUT_CVBS ? RES_480I : RES_1080P60HZ);
        put(output + "u4VFreq", 60);
    }
    put("u4AspNext", 3);
    put("u4PlaneOrder", 0x76543210);
    put("_arPmxDispPartStatus.hPMXTimer", 0x77);
    put("MutexPMX", 0x33);
    put("_PmxInitiated", 1);
    put("_fgBootUp", 1);
    return state;
}

} // namespace

const Image& started_state()
{
    static const Image state = make_started_state();
    return state;
}

void draw_state(Random& random, Image& state)
{
    const std::vector<Field>& fields = state_fields();
    const bool all = random.once_in(8);
    const std::uint64_t count = all ? fields.size() : 4 + random.below(24);
    for (std::uint64_t i = 0; i < count; ++i)
    {
        const Field& field = fields[all ? i : random.below(fields.size())];
        set(state, field, draw_value(random, field.name, field.size));
    }
}

Arguments caller_arguments(const Operation& operation)
{
    Arguments arguments{};
    std::size_t place = array_size;
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const std::string kind = operation.function.parameters[i].kind;
        if (kind == "data")
            arguments[i] = point(0);
        else if (kind == "place")
        {
            arguments[i] = point(place);
            place += place_size;
        }
    }
    return arguments;
}

Arguments draw_arguments(Random& random, const Operation& operation, Image& state)
{
    static constexpr const char* formats[] = { "text\n", "%d of %s\n", "%d%%\n", "%x" };
    Arguments arguments = caller_arguments(operation);
    for (std::size_t i = 0; i < caller_size; ++i)
        state[caller_offset() + i] = 0xC3;
    const bool all_off = random.once_in(32); // by chance alone four outputs hardly ever are
    for (const Field& field : array_fields(operation))
    {
        const bool is_off = all_off && field.name.ends_with("fgOutputEnable");
        set(state, field, is_off ? 0 : draw_value(random, field.name, field.size));
    }

    const bool one_place = random.once_in(16);
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const Parameter& parameter = operation.function.parameters[i];
        const std::string kind = parameter.kind;
        if (kind == "number" || kind == "tag")
            arguments[i] = cut(draw_argument(random, parameter), size_of(parameter));
        else if (kind == "text")
            arguments[i] = reinterpret_cast<std::uintptr_t>(random.one_of(formats));
        else if (kind == "values")
        {
            arguments[i] = random.below(1000);
            arguments[i + 1] = reinterpret_cast<std::uintptr_t>("word");
        }
        else if (operation.takes_null && random.once_in(16))
            arguments[i] = 0;
        else if (kind == "place" && one_place)
            arguments[i] = point(array_size);
    }
    if (random.once_in(2))
        agree(operation, arguments, state);
    if (random.once_in(2))
        disagree(random, state);
    return arguments;
}

Disturbance draw_disturbance(Random& random, const Operation& operation, unsigned call_count)
{
    const std::vector<Field>& array = array_fields(operation);
    const std::vector<Field>& state = state_fields();
    const bool in_array = !array.empty() && random.once_in(3);
    const Field& field = in_array ? array[random.below(array.size())] : state[random.below(state.size())];
    return { static_cast<unsigned>(random.below(call_count)), field.offset, field.size,
             cut(draw_value(random, field.name, field.size), field.size) };
}

} // namespace lockstep
