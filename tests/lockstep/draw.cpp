// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/draw.h"

#include <array>
#include <string>
#include <string_view>
#include <vector>

#include "src/driver/pmx/pmx_if.h"
#include "tests/lockstep/agreement.h"

namespace lockstep
{
namespace
{

std::uint64_t cut(std::uint64_t value, std::size_t size)
{
    return size < 8 ? value & ((1ull << 8 * size) - 1) : value;
}

std::size_t size_of(std::string_view type)
{
    if (type == "UCHAR" || type == "UINT8" || type == "BYTE" || type == "BOOL")
        return 1;
    return type == "UINT16" ? 2 : type == "void*" ? 8 : 4;
}

/* An argument, as its parameter says by name and type. */
struct DrawnArgument
{
    Draw draw = nullptr;
    std::size_t size = 0;
};
using DrawnArguments = std::array<DrawnArgument, argument_limit>;

std::vector<DrawnArguments> make_drawn_arguments()
{
    std::vector<DrawnArguments> made(operation_count);
    for (unsigned i = 0; i < operation_count; ++i)
    {
        const Function& function = operations[i].function;
        for (unsigned k = 0; k < function.count; ++k)
        {
            const Parameter& parameter = function.parameters[k];
            made[i].at(k) = { draw_for_argument(parameter.name), size_of(parameter.type) };
        }
    }
    return made;
}

const DrawnArguments& drawn_arguments(const Operation& operation)
{
    static const std::vector<DrawnArguments> made = make_drawn_arguments();
    return made[static_cast<std::size_t>(&operation - operations)];
}

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
        set(state, field, draw_value(random, field));
    }
}

Arguments caller_arguments(const Operation& operation)
{
    Arguments arguments{};
    std::size_t place = array_size;
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const Kind kind = operation.function.parameters[i].kind;
        if (kind == Kind::data)
            arguments[i] = point(0);
        else if (kind == Kind::place)
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
        set(state, field, is_off ? 0 : draw_value(random, field));
    }

    const DrawnArguments& drawn = drawn_arguments(operation);
    const bool one_place = random.once_in(16);
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const Kind kind = operation.function.parameters[i].kind;
        if (kind == Kind::number || kind == Kind::tag)
            arguments[i] = cut(drawn[i].draw(random, drawn[i].size), drawn[i].size);
        else if (kind == Kind::text)
            arguments[i] = reinterpret_cast<std::uintptr_t>(random.one_of(formats));
        else if (kind == Kind::values)
        {
            arguments[i] = random.below(1000);
            arguments[i + 1] = reinterpret_cast<std::uintptr_t>("word");
        }
        else if (operation.takes_null && random.once_in(16))
            arguments[i] = 0;
        else if (kind == Kind::place && one_place)
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
             cut(draw_value(random, field), field.size) };
}

} // namespace lockstep
