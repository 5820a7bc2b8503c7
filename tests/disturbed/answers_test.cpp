// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Each call of each operation answers whatever its contract lets it answer, and two of them at once. Nearly all of it
 *  changes nothing but that answer; what changes more stands in a list. After each the next mode change is right. */
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>

#include "tests/disturbed/ground.h"

using disturbed::Path;
using disturbed::Played;
using disturbed::Point;

namespace
{

struct Answer
{
    Point point;
    std::int64_t answer;
};

/** What a function can answer besides what it does. A query that succeeds yields a table, and a text that was formatted
 *  is there: of those a failure alone is possible. */
std::vector<std::int64_t> answers_of(const std::string& function)
{
    if (function.starts_with("fg"))
        return { 0, 1, 2, 255 };
    if (function == "TVE_SetFmtEx" || function == "VDP_GetHwEnable")
        return { 0, 1, 2, 0xFFFFFFFF };
    if (function == "x_reg_read32")
        return { 0, 0xFFFFFFFF };
    if (function == "i4ImQueryInterface")
        return { -1, -0x80000000LL };
    if (function == "x_vsnprintf")
        return {};
    return { -0x80000000LL, -1, 0, 1, 0x7FFFFFFF };
}

std::vector<Answer> answers_in(const Played& clean)
{
    std::vector<Answer> answers;
    for (const Point& point : clean.points)
    {
        for (const std::int64_t answer : answers_of(point.function))
        {
            if (answer != point.answer)
                answers.push_back({ point, answer });
        }
    }
    return answers;
}

void script(const Answer& answer)
{
    board::faults::set({ answer.point.function, answer.answer, board::Fault::When::On, answer.point.n });
}

/** Two at once. There is one script for a function at a time: that for a later call of the same one comes behind the
 *  first. */
void script(const Answer& first, const Answer& second)
{
    script(first);
    if (first.point.function != second.point.function)
        return script(second);
    board::at_every_call([second, left = second.point.n - first.point.n](const board::TraceEntry& entry) {
        if (entry.function == second.point.function && entry.faulted)
            board::faults::set({ second.point.function, second.answer, board::Fault::When::On, left });
    });
}

/** How a run differs: 'c' in calls and console lines, 'r' in result or outputs, 's' in what is stored, 'a' in
 *  assertions, 'n' in the next mode change, 'f' in that graphics are out and nobody is to bring them back. */
using Differences = std::set<char>;

struct Recovered
{
    Played run;
    std::vector<std::string> lines;
    std::string record;
    bool forgotten;
    std::vector<std::string> next;
};

/** A run and what comes after it. */
Recovered run_and_recover(const Path& path, const std::function<void()>& disturb)
{
    disturbed::prepare(path);
    Recovered all{ disturbed::run(path, disturb), disturbed::lines(), disturbed::record(), disturbed::forgotten(), {} };
    std::vector<std::string> wrong;
    EXPECT_FALSE(all.run.lock_held) << "a mutex is held";
    all.next = disturbed::recover(wrong);
    EXPECT_EQ(std::vector<std::string>{}, wrong);
    return all;
}

/** Lines of the calls that were answered otherwise are the same by their function alone: an output was not written. */
std::vector<std::string> but(std::vector<std::string> lines, const std::vector<Answer>& answers)
{
    for (const Answer& answer : answers)
    {
        if (answer.point.at < lines.size())
            lines[answer.point.at].resize(std::min(lines[answer.point.at].size(), answer.point.function.size()));
    }
    return lines;
}

Differences differences(const Recovered& clean, const Recovered& now, const std::vector<Answer>& answers)
{
    Differences found;
    if (but(clean.lines, answers) != but(now.lines, answers))
        found.insert('c');
    if (clean.run.outcome != now.run.outcome)
        found.insert('r');
    if (clean.record != now.record)
        found.insert('s');
    if (clean.run.asserts != now.run.asserts)
        found.insert('a');
    if (clean.next != now.next)
        found.insert('n');
    if (now.forgotten && !clean.forgotten)
        found.insert('f');
    return found;
}

/** The one misuse that a false answer brings about: a mutex that was not taken is given back. */
unsigned misuses_of(const std::vector<Answer>& answers)
{
    return static_cast<unsigned>(std::count_if(
        answers.begin(), answers.end(), [](const Answer& answer) { return answer.point.function == "x_sema_lock"; }));
}

/** What depends on an answer, and how: all else goes on as if nothing had happened. */
struct Dependence
{
    const char* function;
    const char* differences; ///< as in Differences
    std::set<std::string> operations;
};

const std::vector<Dependence> dependences{
    // The handshake asks; so does the second video, for its place.
    { "fgVdpIsWaitforSyncCtrl", "cs", { "PMX_SetFormatChangeFlag", "PMX_SetModeEx", "_PMX_TmrIsr" } },
    { "fgIsHotPlugChgRes", "cs", { "PMX_SetModeEx" } },
    { "i4GetHotPlugStatus", "cs", { "PMX_SetModeEx" } },
    { "fgPmxHalMixPlane", "cns", { "PMX_VdpEnabled" } },
    { "fgPmxHalSwapPlane1_2",
      "c",
      { "PMX_DisableVideoPlane", "PMX_EnableVideoPlane", "PMX_Init", "PMX_Reset", "i4PmxDisableVideoPlane",
        "i4PmxEnableVideoPlane" } },
    { "fgPmxHalSwapPlane1_2", "r", { "PMX_VdpGetPlanePosition", "i4PmxGetPlanePosition" } },
    { "VDP_GetHwEnable", "c", { "PMX_SetOrderVdpComp0", "d_PMX_SetOrderVdpComp0" } },
    // What is read decides.
    { "get_part_id_by_name", "cr", { "PMX_GetHDMIDefaultRes" } },
    { "get_part_id_by_name", "cs", { "PMX_Init", "PMX_Reset" } },
    { "i4NFBPartitionRead", "cr", { "PMX_GetHDMIDefaultRes" } },
    { "i4NFBPartitionRead", "cs", { "PMX_Init", "PMX_Reset" } },
    { "x_reg_read32", "c", { "PMX_SetModeEx" } },
    { "x_reg_read32", "cn", { "PMX_Init", "PMX_Reset", "vSetPLLGP_HDMIDDS" } },
    { "fgPmxDrvGetAvdInfo", "r", { "PMX_ChkSupportedRes" } },
    { "fgPmxHalSwapPlane4_7", "r", { "PMX_GetSwapEnable" } },
    // A refusal is handed on, and what would follow is left out.
    { "fgPmxDrvSetAvd", "cr", { "PMX_SetAspectRatio", "PMX_SetAspectRatioEx", "PMX_SetAspectRatioNext" } },
    { "fgPmxDrvSetAvd", "r", { "PMX_SetHdmiDeepColor" } },
    { "PMX_HalGetPlaneOrder", "cr", { "PMX_GetArbPlaneOrder" } },
    { "PMX_HalSetPlaneOrder", "cr", { "PMX_SetArbPlaneOrder" } },
    { "x_sema_delete", "crs", { "i4PMX_Uninit" } },
    // A refusal is printed.
    { "i4ImRegisterInterface2", "c", { "PMX_Init" } },
    { "i4ImRegisterInterface2", "cr", { "i4PmxRegisterIM" } },
    { "i4ImUnregisterInterface2", "c", { "PMX_Uninit", "i4PMX_Uninit" } },
    { "i4ImUnregisterInterface2", "cr", { "i4PmxUnregisterIM" } },
    // A refusal is reported as a failed assertion. Handles that were not given, or not taken back, stay what they were.
    { "TVE_SetFmtEx", "a", { "PMX_SetModeEx" } },
    { "i4ImQueryInterface",
      "ac",
      { "PMX_InformVdpColorSpace", "PMX_OsdDisabled", "PMX_OsdEnabled", "PMX_VdpEnabled" } },
    { "x_sema_lock",
      "a",
      { "PMX_InformVdpColorSpace", "PMX_OsdDisabled", "PMX_OsdEnabled", "PMX_VdpEnabled", "i4Pmx_Connect",
        "i4Pmx_Disconnect" } },
    { "x_sema_unlock",
      "a",
      { "PMX_InformVdpColorSpace", "PMX_OsdDisabled", "PMX_OsdEnabled", "PMX_VdpEnabled", "i4Pmx_Connect",
        "i4Pmx_Disconnect" } },
    { "x_sema_create", "acns", { "PMX_Init" } },
    { "x_sema_delete", "a", { "PMX_Uninit" } },
    { "x_timer_create", "ans", { "PMX_Init" } },
    { "x_timer_delete", "an", { "PMX_Uninit", "i4PMX_Uninit" } },
    { "x_timer_start", "a", { "PMX_SetFormatChangeTimer" } },
    { "x_timer_start", "af", { "PMX_SetModeEx" } }, // the display part alone brings them back
    { "x_timer_stop", "a", { "PMX_SetFormatChangeTimer", "PMX_SetModeEx" } },
};

/** Operation, function and how: of those that depend on an answer at all. */
using Found = std::map<std::string, std::string>;

Found listed()
{
    Found found;
    for (const Dependence& one : dependences)
    {
        for (const std::string& operation : one.operations)
            found[operation + " " + one.function] = one.differences;
    }
    return found;
}

/** Whether an assertion can be about an answer of this function. */
bool is_about(const std::string& text, const std::string& function)
{
    if (function == "x_sema_create")
        return text == "i4Ret == OSR_OK";
    if (function == "i4ImQueryInterface")
        return text == "0";
    // What was not taken cannot be given back.
    return text.starts_with(function) || (function == "x_sema_lock" && text.starts_with("x_sema_unlock"));
}

/** Assertions that a run has besides those of the clean one are about one of the answers. */
void expect_asserts(const Played& clean, const Played& now, const std::vector<Answer>& answers)
{
    std::multiset<std::string> added(now.asserts.begin(), now.asserts.end());
    for (const std::string& text : clean.asserts)
    {
        const auto found = added.find(text);
        ASSERT_NE(added.end(), found) << text << " is not reported";
        added.erase(found);
    }
    for (const std::string& text : added)
        EXPECT_TRUE(std::any_of(answers.begin(), answers.end(), [&](const Answer& answer) {
            return is_about(text, answer.point.function);
        })) << text;
}

std::string text_of(const Answer& answer)
{
    return answer.point.function + " call " + std::to_string(answer.point.n) + " answers " +
           std::to_string(answer.answer);
}

std::string text_of(const Path& path)
{
    std::string text = path.line + ", after";
    for (const std::string& line : path.before)
        text += " " + line + ";";
    return text;
}

} // namespace

class Answers : public testing::Test
{
protected:
    std::size_t runs = 0;

    Differences differences_of(const Path& path, const Recovered& clean, const std::vector<Answer>& answers)
    {
        ++runs;
        const Recovered now = run_and_recover(path, [&] {
            if (answers.size() == 1)
                script(answers[0]);
            else
                script(answers[0], answers[1]);
        });
        EXPECT_EQ(clean.run.misuses + misuses_of(answers), now.run.misuses);
        expect_asserts(clean.run, now.run, answers);
        return differences(clean, now, answers);
    }
};

TEST_F(Answers, EachCallOfEachOperation_ChangesWhatTheListSaysAndNothingElse)
{
    std::map<std::string, Differences> seen;
    for (const Path& path : disturbed::every_path())
    {
        SCOPED_TRACE(text_of(path));
        const Recovered clean = run_and_recover(path, {});
        for (const Answer& answer : answers_in(clean.run))
        {
            SCOPED_TRACE(text_of(answer));
            seen[path.operation() + " " + answer.point.function].merge(differences_of(path, clean, { answer }));
        }
    }
    Found found;
    for (const auto& [call, differs] : seen)
    {
        if (!differs.empty())
            found[call] = std::string(differs.begin(), differs.end());
    }
    EXPECT_EQ(listed(), found);
    EXPECT_LE(84u, seen.size());
    RecordProperty("runs", static_cast<int>(runs));
    EXPECT_LE(550u, runs);
}

/** Two that change nothing do so together, too. */
class TwoAnswers : public Answers
{
protected:
    std::set<std::string> taken; ///< path, and both functions

    bool is_wanted(const Path& path, const Answer& first, const Answer& second, std::size_t number)
    {
        if (first.point.at == second.point.at)
            return false;
        const std::string functions = text_of(path) + first.point.function + " " + second.point.function;
        return taken.insert(functions).second || number % 5 == 0 || disturbed::all_of_it();
    }

    void walk(const Path& path)
    {
        const Recovered clean = run_and_recover(path, {});
        const std::vector<Answer> answers = answers_in(clean.run);
        std::vector<Differences> alone;
        for (const Answer& answer : answers)
            alone.push_back(differences_of(path, clean, { answer }));
        for (std::size_t i = 0; i < answers.size(); ++i)
        {
            for (std::size_t k = i + 1; k < answers.size(); ++k)
            {
                if (is_wanted(path, answers[i], answers[k], 7 * i + k))
                    check(path, clean, { answers[i], answers[k] }, alone[i], alone[k]);
            }
        }
    }

private:
    void check(const Path& path, const Recovered& clean, const std::vector<Answer>& answers, Differences allowed,
               const Differences& allowed_too)
    {
        SCOPED_TRACE(text_of(answers[0]) + ", " + text_of(answers[1]));
        allowed.insert(allowed_too.begin(), allowed_too.end());
        // What false reads of a register have put there stays, unless the next read is a true one.
        if (answers[0].point.function == "x_reg_read32" && answers[1].point.function == "x_reg_read32")
            allowed.insert('n');
        const Differences found = differences_of(path, clean, answers);
        EXPECT_TRUE(std::includes(allowed.begin(), allowed.end(), found.begin(), found.end()))
            << std::string(found.begin(), found.end());
    }
};

TEST_F(TwoAnswers, OfEachOperation_ChangeWhatEachOfThemChanges)
{
    for (const Path& path : disturbed::every_path())
    {
        SCOPED_TRACE(text_of(path));
        walk(path);
    }
    RecordProperty("runs", static_cast<int>(runs));
    EXPECT_LE(1500u, runs);
}
