// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs the product beside the layer that tells its reasons: they never differ, whoever is refused is told exactly one
 * reason, nobody is told one who was not, and every reason there is has been given. */
#include <algorithm>
#include <iostream>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "drv_pmx.h"
#include "pmx_reason.h"
#include "tests/lockstep/random_runs.h"

namespace
{

using namespace lockstep;

constexpr const char* usage =
    R"(usage: reasons [--count N] [--seed S] [--operation NAME] [--undisturbed] [--all] [--names FIRST SECOND]

Runs N random operations in both layers, and holds what each is told against what it answered.
  --count N            operations to run (1000000)
  --seed S             another seed, other operations (1)
  --operation NAME     this operation alone
  --undisturbed        no neighbour
  --all                show every kind of difference in full, not the first one alone
)";

std::vector<PMX_REASON_T> told_now;

bool is_note(PMX_REASON_T reason)
{
    return ePmxReasonClass(reason) == PMX_REASON_CLASS_NOTE;
}

/* What an operation answers when it refuses. Most answer 0. */
enum class Refusal
{
    Zero,
    Never,    // no result that would tell: nothing, a question's answer, or success in any case
    Negative, // the interface manager's result, or that of shutting down
    NoPort,
    NoLocalPort,
};

Refusal refusal_of(const Operation& operation)
{
    static const std::map<std::string_view, Refusal> others = {
        { "i4PMX_Uninit", Refusal::Negative },
        { "i4PmxRegisterIM", Refusal::Negative },
        { "i4PmxUnregisterIM", Refusal::Negative },
        { "i4Pmx_Connect", Refusal::NoPort },
        { "i4Pmx_Disconnect", Refusal::NoPort },
        { "u4PmxCompId2LocalId", Refusal::NoLocalPort },
        // Questions.
        { "PMX_IsForceMode", Refusal::Never },
        { "PMX_IsUnderDigestMode", Refusal::Never },
        { "PMX_ProgressiveOut", Refusal::Never },
        { "fgPmxFmtHDOutput", Refusal::Never },
        { "fgPMX_DisplayModeReady", Refusal::Never },
        // 0 is a mode, a plane, a ratio, or all that there is to answer.
        { "PMX_VdpGetPlanePosition", Refusal::Never },
        { "i4PmxGetPlanePosition", Refusal::Never },
        { "PMX_SetAspectRatioNext", Refusal::Never },
        { "PMX_GetHDMIDefaultRes", Refusal::Never },
        { "i4PMX_Suspend", Refusal::Never },
        { "i4PMX_Resume", Refusal::Never },
    };
    if (std::string_view(operation.function.result) == "void")
        return Refusal::Never;
    const auto found = others.find(operation.function.name);
    return found == others.end() ? Refusal::Zero : found->second;
}

bool has_refused(const Operation& operation, std::uint64_t result)
{
    switch (refusal_of(operation))
    {
    case Refusal::Zero: return result == 0;
    case Refusal::Negative: return static_cast<INT32>(result) < 0;
    case Refusal::NoPort: return static_cast<UINT32>(result) == PMX_NO_SUCH_PORT;
    case Refusal::NoLocalPort: return result == 8;
    case Refusal::Never: break;
    }
    return false;
}

/* Whether a reason may be the one for which an operation refused. A table that was not withdrawn keeps nobody from
 * shutting down: what fails there is the mutex. */
bool may_refuse(const Operation& operation, PMX_REASON_T reason)
{
    return !is_note(reason) &&
           (std::string_view(operation.function.name) != "i4PMX_Uninit" || reason != PMX_REASON_NOT_REGISTERED);
}

/* What may be told of a call that was not refused: that it did nothing, or a part of what it was to do. */
bool may_accompany_success(const Operation& operation, PMX_REASON_T reason)
{
    static const std::map<PMX_REASON_T, std::set<std::string_view>> known = {
        { PMX_REASON_MIXER_ID, { "PMX_Reset", "PMX_SetHdmiDeepColor", "PMX_SetClosedCaptionOnOff" } },
        { PMX_REASON_SAME_VALUE, { "PMX_SetEnable", "PMX_SetCBEnable", "PMX_SetMuteEnable" } },
        { PMX_REASON_STARTED_ALREADY, { "PMX_Init" } },
        { PMX_REASON_NOT_STARTED, { "PMX_Uninit", "i4PMX_Uninit", "PMX_Stop" } },
        { PMX_REASON_NOT_IN_SECOND,
          { "PMX_EnableVideoPlane", "PMX_DisableVideoPlane", "i4PmxEnableVideoPlane", "i4PmxDisableVideoPlane",
            "PMX_Init", "PMX_Reset" } },
        { PMX_REASON_SWAP_MODE, { "PMX_SetSwapEnable", "PMX_GetSwapEnable" } },
        { PMX_REASON_INERT, { "i4PmxOsdEnabled", "i4PmxOsdDisabled", "i4PmxVdpEnabled", "i4PmxVdpDisabled" } },
        { PMX_REASON_NOTHING_WAITS, { "PMX_SetAspectRatioNext" } },
        { PMX_REASON_HDMI_REFUSED, { "PMX_SetAspectRatioNext" } },
        { PMX_REASON_NO_VIDEO_PLANE, { "PMX_VdpGetPlanePosition", "i4PmxGetPlanePosition" } },
        { PMX_REASON_NOTHING_OWED, { "PMX_SetOsdEnable" } },
        { PMX_REASON_PRINT_LEVEL, { "PMX_Printf" } },
        // The mode is set all the same.
        { PMX_REASON_NO_STANDARD, { "PMX_ColorSpaceSetup", "PMX_SetMode", "i4PmxSetMode", "PMX_SetModeEx" } },
        { PMX_REASON_NO_TIMER, { "PMX_SetFormatChangeTimer", "PMX_SetModeEx" } },
    };
    // What is told of the colour space and of tables goes with every decision of it.
    static const std::set<PMX_REASON_T> anywhere = { PMX_REASON_COLOUR_SPACE, PMX_REASON_NO_TABLE,
                                                     PMX_REASON_NO_STANDARD, PMX_REASON_NOT_REGISTERED };
    const auto found = known.find(reason);
    return anywhere.contains(reason) || std::string_view(operation.function.result) == "void" ||
           (found != known.end() && found->second.contains(operation.function.name));
}

class Told
{
public:
    explicit Told(const Findings& findings) : m_findings(findings) {}

    void look(const Trial& trial)
    {
        const std::vector<PMX_REASON_T> told = std::move(told_now);
        told_now.clear();
        m_given.insert(told.begin(), told.end());
        if (trial.surroundings.disturbance.call != never)
            return; // what a neighbour changes meanwhile may be a reason of its own
        const Operation& operation = *trial.operation;
        const auto reasons = std::count_if(told.begin(), told.end(),
                                           [&operation](auto reason) { return may_refuse(operation, reason); });
        if (has_refused(operation, m_findings.trace(1).result))
        {
            ++m_refusals;
            if (reasons != 1)
                complain(trial, "was refused with " + std::to_string(reasons) + " reasons");
            return;
        }
        for (const PMX_REASON_T reason : told)
        {
            if (!is_note(reason) && !may_accompany_success(operation, reason))
                complain(trial, "was not refused, and told: " + std::string(szPmxReason(reason)));
        }
    }

    /** Whether everything was as it should be; what was not is told. */
    bool report(bool of_all) const
    {
        std::cout << m_refusals << " refusals, " << m_given.size() << " reasons given\n";
        for (const auto& [text, count] : m_complaints)
            std::cout << count << " times: " << text << '\n';
        bool complete = true;
#define PMX_REASON_ROW(Number, Name, Class, A, B, Sentence)       \
    if (of_all && !m_given.contains(PMX_REASON_##Name))           \
    {                                                             \
        std::cout << "nobody was told " #Name ": " Sentence "\n"; \
        complete = false;                                         \
    }
        PMX_REASONS_KNOWN(PMX_REASON_ROW)
#undef PMX_REASON_ROW
        return m_complaints.empty() && complete && m_refusals != 0;
    }

private:
    void complain(const Trial& trial, const std::string& what)
    {
        ++m_complaints[std::string(trial.operation->function.name) + " " + what];
    }

    const Findings& m_findings;
    std::set<PMX_REASON_T> m_given;
    std::map<std::string, std::uint64_t> m_complaints;
    std::uint64_t m_refusals = 0;
};

} // namespace

/* The layer's hook, as it is compiled for the tool. */
extern "C" void pmx_twin_reason(PMX_REASON_T eReason, UINT32, UINT32, const CHAR*, INT32, const CHAR*)
{
    told_now.push_back(eReason);
}

int main(int count, char** words)
{
    const Options options = options_of(count, words, usage);
    const std::vector<unsigned> offered = common_operations(options.operation);
    if (offered.empty() || options.count == 0)
    {
        std::cerr << "nothing to compare\n";
        return 2;
    }
    Findings findings(options.comparison);
    Told told(findings);
    run_random(options, offered, findings, [&told](const Trial& trial) { told.look(trial); });
    std::cout << options.count << " operations, " << findings.disturbed() << " of them again with a neighbour; "
              << findings.calls() << " calls compared\n"
              << findings.report(options.all);
    const bool as_it_should = told.report(options.operation.empty());
    return findings.empty() && as_it_should ? 0 : 1;
}
