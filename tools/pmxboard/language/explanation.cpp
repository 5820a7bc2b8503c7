// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/explanation.h"

#include <algorithm>
#include <functional>
#include <ostream>
#include <span>
#include <utility>

#include "board/board.h"
#include "board/json.h"
#include "board/threads.h"
#include "drv_pmx.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/reasons/twin.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/record_view/store_watch.h"

namespace pmxboard
{
namespace
{

using board::Json;

/** What became of a command, on its way from one process to another. */
Json packed(const std::string& kind, const std::string& message, const Session& session)
{
    Json reasons = Json::array();
    for (const Reason& reason : told_reasons())
        reasons.push_back({ reason.number, reason.a, reason.b, reason.file, reason.line, reason.function });
    const Outcome& outcome = session.last_outcome();
    return { { "kind", kind },
             { "message", message },
             { "operation", session.last_operation() },
             { "outcome", to_json(outcome) },
             { "result", outcome.result ? Json(outcome.result->as_number()) : Json() },
             { "answer", outcome.result ? outcome.result->to_text() : std::string() },
             { "reasons", reasons } };
}

Json carried_out(Session& session, const std::string& command, std::ostream& shown)
{
    forget_told_reasons();
    session.forget_outcome();
    try
    {
        session.imagine(command, shown);
        return packed("done", {}, session);
    }
    catch (const LineError& error)
    {
        return packed("wrong line", error.what(), session);
    }
    catch (const std::exception& error)
    {
        return packed("failed", error.what(), session);
    }
}

/** Nobody reads it. */
class Nowhere : public std::streambuf
{
protected:
    int_type overflow(int_type c) override { return traits_type::not_eof(c); }
};

/** Carry commands out, one after the other, and tell what the last one did. */
Json carried_out(Session& session, const std::vector<std::string>& commands)
{
    static Nowhere nowhere;
    static std::ostream shown(&nowhere);
    Json last;
    for (const std::string& command : commands)
        last = carried_out(session, command, shown);
    return last;
}

/** What a copy tells of commands that it has carried out; they may have ended it. */
Json told_by(const Apart& apart)
{
    if (apart.death.empty() && !apart.answer.empty())
        return Json::parse(apart.answer);
    return { { "kind", "failed" },        { "message", "it would end the program: " + apart.death },
             { "operation", "" },         { "outcome", "null" },
             { "result", nullptr },       { "answer", "" },
             { "reasons", Json::array() } };
}

Explanation unpacked(const std::string& command, const Json& json)
{
    Explanation explanation;
    explanation.command = command;
    explanation.operation = json.at("operation");
    explanation.outcome = json.at("outcome");
    explanation.answer = json.at("answer");
    if (json.at("result").is_number())
        explanation.result = json.at("result").get<std::int64_t>();
    for (const Json& reason : json.at("reasons"))
        explanation.reasons.push_back({ static_cast<PMX_REASON_T>(reason.at(0).get<int>()), reason.at(1), reason.at(2),
                                        reason.at(3), reason.at(4), reason.at(5) });
    if (json.at("kind") == "failed")
        explanation.failure = json.at("message");
    return explanation;
}

bool is_accepted(const std::string& command, const Json& json)
{
    return json.at("kind") == "done" && unpacked(command, json).refusal() == nullptr;
}

/** Carry something out in a copy that the twin is led into. Throws StepFailed when it cannot be. */
Apart run_with_twin(Session& session, const std::function<Json(std::ostream& shown)>& function)
{
    session.output().flush();
    find_twin();
    Apart apart = run_apart([&](std::ostream& shown) {
        try
        {
            lead_in_twin();
            board::at_every_call({}); // nobody stops there
            session.watch_stores(session.watches_stores());
            return board::written(function(shown));
        }
        catch (const std::exception& error)
        {
            return board::written(Json{ { "impossible", error.what() } });
        }
    });
    if (apart.answer.starts_with("{\"impossible\""))
        throw StepFailed(Json::parse(apart.answer).at("impossible").get<std::string>());
    return apart;
}

using Requests = std::vector<std::vector<std::string>>;

/** Whether neither the platform was called nor anything stored since the trace had so many entries. */
bool nothing_has_changed(std::size_t entries)
{
    board::trace::look();
    const auto& all = board::trace::entries();
    return all.size() >= entries &&
           std::all_of(all.begin() + static_cast<std::ptrdiff_t>(entries), all.end(),
                       [](const board::TraceEntry& entry) { return entry.kind == board::TraceEntry::Kind::Log; });
}

/** Try requests in a copy, from the first on, as long as they are refused and leave everything as it was: how many were
 *  tried, and whether the last of them was accepted. */
std::pair<std::size_t, bool> try_some(Session& session, const std::string& command,
                                      std::span<const Requests::value_type> near,
                                      std::chrono::steady_clock::time_point end)
{
    const Apart apart = run_with_twin(session, [&](std::ostream& begun) {
        record_view::watch_stores(true);
        bool is_good = false;
        for (const auto& request : near)
        {
            begun << '.';
            const std::size_t entries = board::trace::entries().size();
            is_good = is_accepted(command, carried_out(session, request));
            if (is_good || !nothing_has_changed(entries) || std::chrono::steady_clock::now() >= end)
                break;
        }
        return Json(is_good);
    });
    return { std::max<std::size_t>(apart.shown.size(), 1), apart.death.empty() && apart.answer == "true" };
}

/** The first of the requests near one that was refused that is accepted; empty when none is. */
std::vector<std::string> first_accepted(Session& session, const Explanation& refused, const Search& search)
{
    const Requests near = search.tries == 0 ? Requests() : requests_near(refused);
    const auto end = std::chrono::steady_clock::now() + search.time;
    const auto all = std::span(near).first(std::min(near.size(), search.tries));
    for (std::size_t next = 0; next < all.size() && std::chrono::steady_clock::now() < end;)
    {
        const auto [tried, is_good] = try_some(session, refused.command, all.subspan(next), end);
        next += tried;
        if (is_good)
            return all[next - 1];
    }
    return {};
}

std::string line_of(const std::string& begin, const std::string& text, const Look& look)
{
    constexpr unsigned column = 11;
    std::string line = "  " + begin;
    line.append(column > line.size() ? column - line.size() : 1, ' ');
    return wrapped(line + printable(text), look.width, 0, column);
}

} // namespace

/** Who finds that the layer is not started wants to end it. */
static bool is_so_already(const Reason& refusal)
{
    return refusal.number == PMX_REASON_NOT_STARTED || row_of(refusal.number).class_of == PMX_REASON_CLASS_SAME;
}

static std::string advice_of(const Reason& refusal)
{
    return std::string(row_of(is_so_already(refusal) ? PMX_REASON_STARTED_ALREADY : refusal.number).advice);
}

/** The operation with its answer, or a verb's line, for a verb's name alone would tell less. */
static std::string name_of(const Explanation& explanation)
{
    const std::string& operation = explanation.operation;
    const std::string& answer = explanation.answer;
    const bool is_verb = find(operations(), operation) == nullptr && Line(explanation.command).word(0) == operation;
    if (operation.empty() || is_verb)
        return explanation.command + (answer.empty() ? "" : " (answer: " + answer + ")");
    return operation + (answer.empty() ? "" : " = " + answer);
}

/** Whether an operation gives a reason itself. */
static bool is_own(const std::string& operation, const Reason& reason)
{
    const auto places = reasons_of(operation);
    return std::any_of(places.begin(), places.end(), [&](const ReasonPlace& place) {
        return place.number == reason.number && place.function == reason.function && place.own;
    });
}

const Reason* Explanation::refusal() const
{
    // What another operation was refused on the way stopped nothing, unless it was handed on.
    const bool handed_on = result && operation != "i4PMX_Uninit" && (*result <= 0 || *result == PMX_NO_SUCH_PORT);
    // A failure on the way stands before the one that did.
    const auto found = std::find_if(reasons.rbegin(), reasons.rend(), [&](const Reason& reason) {
        return is_refusal(reason) && (handed_on || is_own(operation, reason));
    });
    return found == reasons.rend() ? nullptr : &*found;
}

Explanation explain(Session& session, const std::string& command, const Search& search)
{
    if (const auto waiting = board::threads::waiting(); !waiting.empty())
        throw StepFailed("explain copies the process, and a thread that waits cannot be copied: " + waiting.front());
    const Json answer =
        told_by(run_with_twin(session, [&](std::ostream&) { return carried_out(session, std::vector{ command }); }));
    if (answer.at("kind") == "wrong line")
        throw LineError(answer.at("message").get<std::string>());
    Explanation explanation = unpacked(command, answer);
    explanation.accepted = first_accepted(session, explanation, search);
    return explanation;
}

std::string verdict_of(const Explanation& explanation)
{
    if (!explanation.failure.empty())
        return "failed";
    const Reason* const refusal = explanation.refusal();
    if (refusal == nullptr)
        return "done";
    return is_so_already(*refusal) ? "nothing" : "refused";
}

std::string to_text(const Explanation& explanation, const Look& look)
{
    const Reason* const refusal = explanation.refusal();
    std::string text = explanation.headline.empty() ? line_of(verdict_of(explanation) + ":", name_of(explanation), look)
                                                    : line_of(explanation.headline + ":", explanation.answer, look);
    std::string begin = "because";
    for (const Reason& reason : explanation.reasons)
    {
        text += line_of(begin, sentence_of(reason) + (&reason == refusal ? "" : "  (" + place_of(reason) + ")"), look);
        begin = refusal != nullptr && &reason >= refusal ? "then" : "and";
        if (&reason == refusal)
        {
            text += line_of("at", place_of(reason), look);
            text += line_of("so", advice_of(reason), look);
        }
    }
    if (!explanation.failure.empty())
        text += line_of("but", explanation.failure, look);
    for (const std::string& command : explanation.accepted)
        text += line_of(&command == explanation.accepted.data() ? "accepted:" : "", command, look);
    return text;
}

std::string to_json_line(const Explanation& explanation)
{
    const Reason* const refusal = explanation.refusal();
    Json reasons = Json::array();
    for (const Reason& reason : explanation.reasons)
        reasons.push_back(board::json_of(json_of(reason)));
    const Json line = { { "kind", "explanation" },
                        { "command", printable(explanation.command) },
                        { "operation", explanation.operation },
                        { "outcome", Json::parse(explanation.outcome) },
                        { "verdict", verdict_of(explanation) },
                        { "reason", refusal != nullptr ? board::json_of(json_of(*refusal)) : Json() },
                        { "advice", refusal != nullptr ? Json(advice_of(*refusal)) : Json() },
                        { "reasons", reasons },
                        { "accepted", explanation.accepted },
                        { "failure", explanation.failure.empty() ? Json() : Json(printable(explanation.failure)) } };
    return board::written(line);
}

} // namespace pmxboard
