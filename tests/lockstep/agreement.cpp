// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/agreement.h"

#include <cstring>
#include <string>

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
    std::memcpy(&state[state_field("arOutputConf[0].fgOutputEnable").offset], outputs, sizeof outputs);
    set(state, state_field("ucMode"), format_of(outputs));
}

} // namespace

void agree(const Operation& operation, const Arguments& arguments, Image& state)
{
    bool sets_mode = false;
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const std::string name = operation.function.parameters[i].name;
        sets_mode = sets_mode || name == "ucVFreq";
        if (name == "ucMode")
            set(state, state_field("ucMode"), arguments[i]);
        else if (name == "ucVFreq")
            set(state, state_field("ucVfreq"), arguments[i]);
        else if (name == "rDrvExtScl")
            set(state, state_field("rDrvExtScl"), arguments[i]);
        else if (name == "fgOSD5")
            set(state, state_field("fgOSD5"), arguments[i]);
        else if (name == "prOutConf")
            agree_on_outputs(state);
    }
    if (sets_mode)
    {
        set(state, state_field("fgSetModeCalled"), 1);
        set(state, state_field("_fgBootUp"), 0);
    }
}

void disagree(Random& random, Image& state)
{
    static constexpr const char* fields[] = { "ucMode",
                                              "ucVfreq",
                                              "rDrvExtScl",
                                              "fgOSD5",
                                              "fgSetModeCalled",
                                              "_fgBootUp",
                                              "arOutputConf[1].fgOutputEnable",
                                              "arOutputConf[1].eResMode",
                                              "arOutputConf[2].fgOutputEnable",
                                              "arOutputConf[2].eResMode",
                                              "arOutputConf[3].fgOutputEnable",
                                              "arOutputConf[3].eResMode" };
    const Field& field = state_field(random.one_of(fields));
    set(state, field, random.once_in(2) ? get(state, field) ^ 1 : draw_value(random, field.name, field.size));
}

} // namespace lockstep
