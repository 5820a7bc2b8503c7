// SPDX-License-Identifier: MIT OR GPL-2.0-only
// `explain` and `why`: the reasons of a command, of the last one, and of what is seen.
#include <algorithm>
#include <initializer_list>

#include "drv_if_pmx.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/language/explanation.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

void show(Session& session, const Explanation& explanation)
{
    session.output().shown(to_json_line(explanation), to_text(explanation, session.output().look()));
}

void explain_command(Session& session, const Words& words)
{
    if (words.at("COMMAND") == "expect")
        throw LineError("explain takes a command; an expectation looks at what a command did");
    show(session, explain(session, words.from("COMMAND")));
}

void why_last(Session& session, const Words&)
{
    if (!session.explanation())
        throw LineError("nothing is kept of the last command: why is for the shell and for run --explain; "
                        "explain COMMAND tells everywhere");
    show(session, *session.explanation());
}

std::string stored(const char* field)
{
    return record_view::get(field).to_text();
}

/** The outputs as `outputs` takes them. */
std::string outputs_in_short()
{
    std::string text = "outputs";
    for (std::size_t i = 0; i < PMX_OUTPUT_NUM; ++i)
    {
        const std::string output = "arOutputConf[" + std::to_string(i) + "].";
        const bool is_on = record_view::get(output + "fgOutputEnable").as_number() != 0;
        const auto mode = static_cast<unsigned>(record_view::get(output + "eResMode").as_number());
        text += " " + std::string(output_words[i]) + "=" + (is_on ? short_name_of(full_name_of(mode)) : "off");
    }
    return text;
}

void why_graphics(Session& session, const Words&)
{
    const Status status = status_of(whole_state(), {});
    const Look look = session.output().look();
    std::string text = to_text(status, StatusPart::Graphics, look);
    if (status.graphics.state == GraphicsStatus::State::Held)
        text += wrapped("Record     " + outputs_in_short() + " at " + stored("ucVfreq") + " Hz", look.width, 0, 11);
    session.output().shown(to_json_line(status), text);
}

/** What the layer would decide now, told as the reason of what it has decided. The twin tells the steps of what it
 *  does besides, too. */
Explanation decided_anew(Session& session, const std::string& question, const std::string& command,
                         std::initializer_list<PMX_REASON_T> wanted)
{
    Explanation explanation = explain(session, command, none);
    explanation.command = question; // nobody has made that call, and it has no outcome
    explanation.operation.clear();
    explanation.result.reset();
    explanation.outcome = "null";
    std::erase_if(explanation.reasons, [&](const Reason& reason) {
        return std::find(wanted.begin(), wanted.end(), reason.number) == wanted.end();
    });
    return explanation;
}

void why_mode(Session& session, const Words&)
{
    Explanation explanation = decided_anew(
        session, "why mode",
        "PMX_SetModeEx 0 " + stored("arOutputConf") + " " + stored("ucVfreq") + " " + stored("rDrvExtScl") + " " +
            stored("fgOSD5"),
        { PMX_REASON_FORMAT_FROM_OUTPUT, PMX_REASON_FORMAT_FROM_OFF, PMX_REASON_MODE_BIT, PMX_REASON_MODE_NEVER });
    const Status status = status_of(whole_state(), {});
    explanation.headline = "mode";
    explanation.answer = status.mode.to_text() + " at " + status.frequency.to_text() + " Hz";
    for (const Reason& reason : explanation.reasons)
    {
        const bool is_choice =
            reason.number == PMX_REASON_FORMAT_FROM_OUTPUT || reason.number == PMX_REASON_FORMAT_FROM_OFF;
        const std::uint32_t chosen = reason.number == PMX_REASON_FORMAT_FROM_OUTPUT ? reason.b : reason.a;
        if (is_choice && chosen != status.mode.as_number())
            explanation.failure = "not the outputs decided: PMX_SetMode did since, or start-up";
    }
    const Look look = session.output().look();
    session.output().shown(to_json_line(explanation),
                           to_text(explanation, look) + to_text(status, StatusPart::Outputs, look));
}

void why_colour_space(Session& session, const Words&)
{
    Explanation explanation = decided_anew(session, "why colour-space", "PMX_DecideMasterColorSpace 0",
                                           { PMX_REASON_MASTER_FROM_PORT, PMX_REASON_SECOND_NOT_COUNTED,
                                             PMX_REASON_RGB_NOT_COUNTED, PMX_REASON_MASTER_CHANGES });
    explanation.headline = "master";
    explanation.answer = stored("eMasterColorSpace");
    if (explanation.reasons.empty())
        explanation.failure = "nothing delivers pictures: it stays as it was decided last";
    else if (explanation.reasons.back().number == PMX_REASON_MASTER_CHANGES)
        explanation.failure = "that is what the next decision yields; until then it stays";
    show(session, explanation);
}

} // namespace

std::vector<Verb> why_verbs()
{
    return {
        { "explain",
          { { "explain COMMAND",
              "tell why a command would do what it does, and what would be accepted instead of what "
              "is refused; changes nothing",
              explain_command, looks } } },
        { "why",
          { { "why", "explain the last command", why_last, looks },
            { "why osd", "tell who holds graphics back, since when, and what ends it; or who forgot them", why_graphics,
              looks },
            { "why mode", "tell why the mixer runs the mode that it runs", why_mode, looks },
            { "why colour-space", "tell why the master colour space is what it is", why_colour_space, looks } } },
    };
}

} // namespace pmxboard
