// SPDX-License-Identifier: MIT OR GPL-2.0-only
// `outputs`: what each output is to show, in short.
#include <algorithm>
#include <array>
#include <span>
#include <utility>

#include "board/names.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

/** By output; nothing for one that is off. */
using Modes = std::array<std::optional<unsigned>, 4>;

void read_setting(const std::string& setting, Modes& modes, std::array<bool, 4>& given)
{
    const std::size_t equals = setting.find('=');
    const std::size_t output = output_called(setting.substr(0, equals));
    if (std::exchange(given[output], true))
        throw LineError(setting.substr(0, equals) + " is given twice");
    const std::string mode = setting.substr(equals + 1);
    if (mode != "off")
        modes[output] = read_mode(mode);
}

/** The mixer runs what the first output runs that is on; the layer is told whole pictures a second. */
std::string frequency_of(const Modes& modes)
{
    for (const auto& mode : modes)
    {
        const std::string refresh = mode ? refresh_of(full_name_of(*mode)) : std::string();
        if (mode && refresh.empty())
            throw LineError("the name of " + full_name_of(*mode) +
                            " does not tell its frequency; PMX_SetModeEx takes both");
        if (mode)
            return refresh.substr(0, refresh.find('.'));
    }
    return "60";
}

/** The call as one would write it. */
std::string call_for(const Modes& modes)
{
    std::string outputs;
    for (const auto& mode : modes)
        outputs += (outputs.empty() ? "[" : ", [") + (mode ? "1, " + full_name_of(*mode) : std::string("0")) + "]";
    return "PMX_SetModeEx 0 [ " + outputs + " ] " + frequency_of(modes) + " DRV_NON_EXT_CHIP 0";
}

void set_outputs(Session& session, const Words& words)
{
    Modes modes;
    std::array<bool, 4> given{};
    for (const std::string& setting : words.all("SETTING"))
        read_setting(setting, modes, given);
    const Line call(call_for(modes));
    const Operation& operation = *find_command(call.word(0)).operation;
    const Values values = read_arguments(operation, std::span(call.words()).subspan(1));
    session.output().text("  " + call.from(0) + "\n");
    session.run(operation, values);
}

} // namespace

std::size_t output_called(const std::string& name)
{
    const auto found = std::find(output_words.begin(), output_words.end(), name);
    if (found == output_words.end())
        throw LineError("there is no output " + name +
                        did_you_mean(name, { output_words.begin(), output_words.end() }));
    return std::min(static_cast<std::size_t>(found - output_words.begin()), output_words.size() - 2);
}

std::vector<Verb> output_verbs()
{
    return {
        { "outputs",
          { { "outputs SETTING [SETTING…]",
              "set what each output shows, the others off: `outputs hdmi=720p50 cvbs=576i`; the call of "
              "`PMX_SetModeEx` "
              "that this is, at the frequency of the first output that is on, is shown",
              set_outputs } } },
    };
}

} // namespace pmxboard
