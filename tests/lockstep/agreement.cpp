// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/agreement.h"

#include <cstring>
#include <string_view>

#include "drv_if_pmx.h"
#include "tests/lockstep/draw.h"

namespace lockstep
{
namespace
{

/* The mixer's format: that of the first output that is on, HDMI's if none is. */
UINT32 format_of(const PMX_RESOLUTION_T* outputs)
{
    for (unsigned output = 0; output < PMX_OUTPUT_NUM; ++output)
    {
        if (outputs[output].fgOutputEnable != 0)
            return outputs[output].eResMode;
    }
    return outputs[PMX_OUTPUT_HDMI].eResMode;
}

void agree_on_outputs(Image& state)
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM];
    std::memcpy(outputs, &state[caller_offset()], sizeof outputs);
    static const Field& first = state_field("arOutputConf[0].fgOutputEnable");
    static const Field& mode = state_field("ucMode");
    std::memcpy(&state[first.offset], outputs, sizeof outputs);
    set(state, mode, format_of(outputs));
}

} // namespace

void agree(const Operation& operation, const Arguments& arguments, Image& state)
{
    // Looked up once: what is drawn agrees half of the time.
    static const Field& mode = state_field("ucMode");
    static const Field& frequency = state_field("ucVfreq");
    static const Field& external_scaler = state_field("rDrvExtScl");
    static const Field& osd5 = state_field("fgOSD5");
    static const Field& mode_was_set = state_field("fgSetModeCalled");
    static const Field& boots = state_field("_fgBootUp");
    bool sets_mode = false;
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const std::string_view name = operation.function.parameters[i].name;
        sets_mode = sets_mode || name == "ucVFreq";
        if (name == "ucMode")
            set(state, mode, arguments[i]);
        else if (name == "ucVFreq")
            set(state, frequency, arguments[i]);
        else if (name == "rDrvExtScl")
            set(state, external_scaler, arguments[i]);
        else if (name == "fgOSD5")
            set(state, osd5, arguments[i]);
        else if (name == "prOutConf")
            agree_on_outputs(state);
    }
    if (sets_mode)
    {
        set(state, mode_was_set, 1);
        set(state, boots, 0);
    }
}

void disagree(Random& random, Image& state)
{
    static const Field* const fields[] = { &state_field("ucMode"),
                                           &state_field("ucVfreq"),
                                           &state_field("rDrvExtScl"),
                                           &state_field("fgOSD5"),
                                           &state_field("fgSetModeCalled"),
                                           &state_field("_fgBootUp"),
                                           &state_field("arOutputConf[1].fgOutputEnable"),
                                           &state_field("arOutputConf[1].eResMode"),
                                           &state_field("arOutputConf[2].fgOutputEnable"),
                                           &state_field("arOutputConf[2].eResMode"),
                                           &state_field("arOutputConf[3].fgOutputEnable"),
                                           &state_field("arOutputConf[3].eResMode") };
    const Field& field = *random.one_of(fields);
    set(state, field, random.once_in(2) ? get(state, field) ^ 1 : draw_value(random, field));
}

} // namespace lockstep
