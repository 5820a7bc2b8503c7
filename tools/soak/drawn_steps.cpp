// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/soak/drawn_steps.h"

#include <span>
#include <stdexcept>

#include "board/board.h"
#include "board/video_planes.h"
#include "tools/record_view/record_view.h"
#include "tools/soak/drawn_values.h"

namespace soak
{
namespace
{

using board::names::Family;
using pmxboard::Operation;

Step call(Choices& choices, const Operation& operation)
{
    const pmxboard::Values values = draw_arguments(choices, operation);
    const board::trace::Operation scope(operation.name);
    return { operation.name, true, operation.run(values) };
}

bool is_begun()
{
    static const record_view::Field begun("_PmxInitiated");
    return begun.number() != 0;
}

/** A mixer that is shut down has no timer, and whoever lets it hold graphics back then finds that out: nobody does so
 *  who keeps the contracts. */
Step operation_of_a_begun_mixer(Choices& choices)
{
    static const Operation& first = *find(pmxboard::operations(), "PMX_Init");
    return call(choices, is_begun() ? choices.one_of(pmxboard::operations()) : first);
}

/** Of what is not begun there is little to see. */
Step any_operation(Choices& choices)
{
    return choices.once_in(4) ? operation_of_a_begun_mixer(choices)
                              : call(choices, choices.one_of(pmxboard::operations()));
}

Step neighbour(Choices& choices)
{
    Step step = call(choices, choices.one_of(pmxboard::neighbours()));
    step.is_operation = false;
    return step;
}

board::sources::Size draw_size(Choices& choices)
{
    static constexpr board::sources::Size sizes[] = { { 720, 480 }, { 1920, 1080 }, { 1, 1 }, { 720, 576 } };
    if (!choices.once_in(8))
        return choices.one_of(sizes);
    return { static_cast<INT32>(choices.any()), static_cast<INT32>(choices.any()) };
}

void start(Choices& choices, board::sources::Id id)
{
    const board::sources::Size size = draw_size(choices);
    if (id.type == board::sources::Id::Type::VideoPlane)
        board::sources::start_video(id.number, size, static_cast<UCHAR>(choices.below(256)));
    else
        board::sources::start_graphics(
            id.number, size, static_cast<DRV_GFX_COLOR_MODE_T>(draw_number(choices, Family::GfxColorMode, 8)));
}

Step source(Choices& choices)
{
    const std::string name(choices.one_of(board::sources::names()));
    const board::sources::Id id = board::sources::find(name);
    switch (choices.below(5))
    {
    case 0: board::sources::connect(id); break;
    case 1: board::sources::disconnect(id); break;
    case 2: board::sources::resize(id, draw_size(choices)); break;
    case 3: board::sources::stop(id); break;
    default: start(choices, id); break;
    }
    return { name };
}

Step sink(Choices& choices)
{
    using namespace board::hdmi_av;
    switch (choices.below(4))
    {
    case 0: request_resolution(choices.once_in(2)); break;
    case 1: choose_resolution({}); break;
    case 2:
        choose_resolution(Resolution{ static_cast<UINT32>(draw_number(choices, Family::ResolutionMode, 8)),
                                      static_cast<UINT16>(draw_number(choices, Family::None, 8)) });
        break;
    default: plug(choices.once_in(2)); break;
    }
    return { "sink" };
}

std::chrono::microseconds draw_time(Choices& choices)
{
    static constexpr std::uint64_t most[] = { 10, 10'000, 100'000, 3'000'000 };
    return std::chrono::microseconds(choices.below(choices.one_of(most)));
}

Step display_part(Choices& choices)
{
    using namespace board::display_part;
    switch (choices.below(5))
    {
    case 0: behave({}); break;
    case 1: behave({ true, {} }); break;
    case 2: behave({ true, draw_time(choices) }); break;
    case 3: raise(); break;
    default: lower(); break;
    }
    return { "display-part" };
}

Step video_plane(Choices& choices)
{
    if (choices.once_in(2))
        board::video_planes::release_graphics();
    else
        board::video_planes::set_waiting_for_sync(choices.once_in(2));
    return { "video-plane" };
}

Step power(Choices& choices)
{
    if (choices.once_in(2))
        board::suspend();
    else
        board::resume();
    return { "power" };
}

Step time(Choices& choices)
{
    board::advance(draw_time(choices));
    return { "advance" };
}

std::vector<board::PlatformFunction> functions_with_answers()
{
    std::vector<board::PlatformFunction> found;
    for (const board::PlatformFunction& function : board::platform_functions())
    {
        if (function.has_result)
            found.push_back(function);
    }
    return found;
}

Step fault(Choices& choices)
{
    static const std::vector<board::PlatformFunction> functions = functions_with_answers();
    if (choices.once_in(4))
    {
        board::faults::clear_all();
        return { "no faults" };
    }
    using When = board::Fault::When;
    static constexpr When whens[] = { When::On, When::On, When::On, When::From, When::Always, When::For };
    const board::PlatformFunction& function = choices.one_of(functions);
    board::Fault fault{ std::string(function.name) };
    fault.answer = draw_number(choices, board::names::family_of(function.name, "result"), 32);
    fault.when = choices.one_of(whens);
    fault.n = 1 + static_cast<unsigned>(choices.below(8));
    fault.time = std::chrono::microseconds(1) + draw_time(choices);
    for (const board::PlatformParameter& parameter : function.parameters)
    {
        if (parameter.is_output && choices.once_in(2))
            fault.outputs.push_back({ std::string(parameter.name), std::to_string(choices.below(256)) });
    }
    board::faults::set(fault);
    return { fault.function };
}

struct StepKind
{
    unsigned weight;
    Step (*draw)(Choices&);
};

using StepKinds = std::span<const StepKind>;

constexpr StepKind calm[] = {
    { 44, operation_of_a_begun_mixer },
    { 4, source },
    { 4, time },
    { 1, sink },
    { 1, display_part },
    { 1, video_plane },
    { 1, power },
};
constexpr StepKind unruly[] = {
    { 44, any_operation }, { 4, source }, { 4, time },      { 1, sink },  { 1, display_part },
    { 1, video_plane },    { 1, power },  { 6, neighbour }, { 2, fault },
};

unsigned all_weights(StepKinds kinds)
{
    unsigned sum = 0;
    for (const StepKind& kind : kinds)
        sum += kind.weight;
    return sum;
}

const StepKind& draw_kind(Choices& choices, StepKinds kinds)
{
    std::uint64_t place = choices.below(all_weights(kinds));
    const StepKind* kind = kinds.data();
    for (; place >= kind->weight; ++kind)
        place -= kind->weight;
    return *kind;
}

} // namespace

void begin_life(Choices& choices)
{
    board::Description description;
    description.console_level = static_cast<int>(choices.below(10));
    description.flash_words["fast_init_param"] =
        static_cast<std::uint32_t>(draw_number(choices, Family::ResolutionMode, 32));
    board::power_on(description);
}

Step draw_step(Choices& choices, Life life)
try
{
    return draw_kind(choices, life == Life::Calm ? StepKinds(calm) : StepKinds(unruly)).draw(choices);
}
catch (const std::invalid_argument&)
{
    return { "refused" }; // a source that does not run cannot change its size, nor can every output be set
}

} // namespace soak
