// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/to_scenario.h"

#include <algorithm>
#include <array>
#include <ostream>
#include <set>
#include <vector>

#include "tools/pmxboard/decode/calls.h"
#include "tools/pmxboard/decode/words.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard::decode
{
namespace
{

constexpr int whole_level = 9;
constexpr std::string_view idle_port = "CCIR(0, 0, 0, 0)";

/** Calls that one line gives away: its beginning, and the command. */
struct Command
{
    std::string_view begin;
    std::string_view command;
};

constexpr Command commands[] = {
    { "PMX_Stop", "PMX_Stop" },
    { "Fail to register", "i4PmxRegisterIM PMX_COMP_TYPE_PMX {u2CompId:raw}" },
    { "Set Osd Enable :", "PMX_SetOsdEnableFlag {fgPmxEnabeOsdFlag:raw}" },
    { "PMX_SetOsdEnable.", "PMX_SetOsdEnable" },
    { "[PMX] fgPMX_DisplayModeReady", "fgPMX_DisplayModeReady" },
    { "Mode(%d), ", "PMX_ColorSpaceSetup {eColorSpace:raw} {ucMode:raw}" },
    { "VDP_%d Disabled", "PMX_VdpDisabled 0 {ucVdpId:raw}" },
    { "OSD_%d Disabled", "PMX_OsdDisabled 0 {ucOsdId:raw}" },
    { "[PMX] VDP_COMP_", "PMX_DecideMasterColorSpace 0" },
    { "[PMX] Gfx enabled", "PMX_DecideMasterColorSpace 0" },
    { "[PMX] Master Color", "PMX_DecideMasterColorSpace 0" },
    { "Invalid VDP Id", "PMX_VdpGetPlanePosition 0 9" },
    { "[PMX] Seting Brightness:", "PMX_SetBrightness 0 {ucValue:raw} {bSetTVE:raw}" },
    { "[PMX] Seting Contrast:", "PMX_SetContrast 0 {ucValue:raw} {bSetTVE:raw}" },
    { "[PMX] Seting Hue:", "PMX_SetHue 0 {ucValue:raw} {bSetTVE:raw}" },
    { "[PMX] Seting Saturation:", "PMX_SetSaturation 0 {ucValue:raw} {bSetTVE:raw}" },
    { "[PMX] Seting Sharpness:", "PMX_SetSharpness 0 {ucValue:raw} {bSetTVE:raw}" },
    { "TVE Set Black Lv", "PMX_SetBlackLv 0 {ucCAVEn:raw} {ucCVBSEn:raw}" },
    { "TVE Get Black Lv", "PMX_GetBlackLv 0" },
    { "SetCVBSSetup", "PMX_SetCVBSSetup {fgEnable:raw}" },
    { "TVE_CVBSPal60_En", "PMX_SetCVBSPal60 {fgEnable:raw}" },
    { "PMX_ID(%d), Aspect", "PMX_SetAspectRatio {ucPmxId:raw} {u4AspectRatio:raw}" },
    { "[EX] PMX_ID(%d), Aspect", "PMX_SetAspectRatioEx {ucPmxId:raw} {u4AspectRatio:raw} {fgApplyOnNext:raw}" },
    { "[EX] PMX_ID(%d), Digest", "PMX_SetDigestAspectRatioEx {ucPmxId:raw} {u4AspectRatio:raw} {fgDigestEnable:raw}" },
    { "COMP ID to LOCAL", "u4PmxCompId2LocalId {u2CompType:raw} {u2CompId:raw}" },
    { "Mute Enable", "PMX_SetMuteEnable 0 1" },
    { "Mute Disable", "PMX_SetMuteEnable 0 0" },
    { "Mode(%d) CS(", "PMX_QueryStatus" },
};

/** Failures that assertions and texts tell of: what must answer so for them. */
struct Failure
{
    std::string_view begin;
    std::string_view fault;
};

constexpr Failure failures[] = {
    { "i4Ret == OSR_OK", "fault x_sema_create -1" },  { "x_timer_create", "fault x_timer_create -1" },
    { "x_timer_delete", "fault x_timer_delete -1" },  { "x_sema_delete", "fault x_sema_delete -1" },
    { "x_timer_stop", "fault x_timer_stop -1" },      { "x_timer_start", "fault x_timer_start -1" },
    { "x_sema_lock", "fault x_sema_lock -1" },        { "x_sema_unlock", "fault x_sema_unlock -1" },
    { "TVE_SetFmtEx(TVE_1", "fault TVE_SetFmtEx 1" }, { "TVE_SetFmtEx(TVE_2", "fault TVE_SetFmtEx 1 on 2" },
};

/** The lines of a call. */
using Lines = std::vector<const Item*>;

const Item* line_in(const Lines& call, std::string_view begin)
{
    const auto found =
        std::find_if(call.begin(), call.end(), [&](const Item* one) { return one->text->format.starts_with(begin); });
    return found == call.end() ? nullptr : *found;
}

bool is_start(const Lines& call)
{
    return line_in(call, "PMX_Init") != nullptr || line_in(call, "[PMX] create a timer") != nullptr;
}

std::size_t count_in(const Lines& call, std::string_view begin)
{
    return static_cast<std::size_t>(
        std::count_if(call.begin(), call.end(), [&](const Item* one) { return one->text->format.starts_with(begin); }));
}

std::string filled(std::string_view command, const Item& item)
{
    return sentence(command, [&](std::string_view name) { return item.value(name); });
}

/** What the layer and the board hold, as far as the next commands hang on it. */
struct Held
{
    bool started = false;
    bool registered = false;   ///< although the layer has shut down
    bool no_partition = false; ///< with the boot mode
    bool sink = true;
    bool raises = false;   ///< the display part, when it is given a resolution
    bool requests = false; ///< a hot plug wants the resolution sent again
    bool timer = false;    ///< runs
    bool first = true;     ///< no mode was set
    std::string format;    ///< of the mixer
    std::string hdmi;      ///< what was asked for
    std::int64_t frequency = 60;
    bool external = false;
    bool on_top = false;
    int bar = 0;
    bool second_plane = false;
    std::set<std::string> sources; ///< that have connected
    std::array<bool, 2> video{};   ///< ports of video planes that are connected
};

/** Turns one call after the other into commands. */
class Writer
{
public:
    Writer(std::ostream& out, const Log& log) : m_out(out), m_log(log), m_calls(read_calls(log)) {}
    void write();

private:
    struct Call
    {
        Lines lines;
        std::size_t begin = 0;
        std::size_t end = 0;
    };

    std::vector<Call> calls() const;
    void say(std::string_view command) { m_out << command << '\n'; }
    void power_on();
    void one(const Call& call);
    void faults(const Lines& call);
    bool needs_power(const Lines& call) const;
    bool start(const Lines& call);
    bool handshake(const Lines& call);
    bool lower(const Lines& call);
    bool ports(const Lines& call);
    bool sources(const Lines& call);
    bool order(const Lines& call);
    bool one_mode(const Lines& call);
    bool mode_change(const Call& call);
    void display_part(const Call& call, bool sends_hdmi, bool is_full);
    std::string requested(const Lines& call, std::string& format, std::string& hdmi) const;

    std::ostream& m_out;
    const Log& m_log;
    Calls m_calls;
    Held m_held;
    std::size_t m_boot = 0;
};

/** Lines that no order is known of go with the call before, when they are of its operation, or are a call each. */
std::vector<Writer::Call> Writer::calls() const
{
    std::vector<Call> made;
    std::vector<std::size_t> call_of(m_log.order.size());
    for (std::size_t place = 0; place < m_log.order.size(); ++place)
    {
        const Item& item = m_log.items[m_log.order[place]];
        const std::size_t begin = m_calls.begins[place];
        const bool goes_on =
            !m_calls.is_known[place] && (item.text->rule == rules::goes_on || item.text->is_assertion() ||
                                         (item.text->rule == rules::report && !item.text->format.starts_with("Mode(")));
        if (begin != place)
        {
            call_of[place] = call_of[begin];
        }
        else if (goes_on && !made.empty())
        {
            call_of[place] = made.size() - 1;
        }
        else
        {
            call_of[place] = made.size();
            made.push_back({ {}, place, place });
        }
        Call& call = made[call_of[place]];
        call.lines.push_back(&item);
        call.end = place;
    }
    return made;
}

void Writer::power_on()
{
    say("\npower-on\nloglevel 9");
    m_held = {};
}

void Writer::write()
{
    power_on();
    const std::vector<Call> all = calls();
    const Call* outer = nullptr; ///< the call that ends last of those before
    for (const Call& call : all)
    {
        const Item& first = *call.lines.front();
        if (first.boot != m_boot)
        {
            m_boot = first.boot;
            power_on();
        }
        const bool is_within = outer != nullptr && call.begin < outer->end;
        const bool is_told = is_within && first.text->rule == rules::flag && first.values.front() != "0" &&
                             outer->lines.front()->text->rule == rules::mode_ex;
        if (is_told) // by how the display part is set
            continue;
        if (is_within)
            say("# from within the call above, between its lines");
        one(call);
        outer = is_within ? outer : &call;
    }
}

void Writer::faults(const Lines& call)
{
    for (const Failure& failure : failures)
    {
        if (line_in(call, failure.begin) != nullptr)
            say(failure.fault);
    }
    // The video planes are told one after the other.
    std::vector<std::size_t> failed;
    std::size_t told = 0;
    for (const Item* const item : call)
    {
        told += item->text->format.starts_with("Inform Vdp") ? 1 : 0;
        if (item->text->format.starts_with("Query VDP"))
            failed.push_back(std::max<std::size_t>(told, 1)); // the line before may be lost
    }
    if (failed.size() == 1)
        say("fault i4ImQueryInterface -1 on " + std::to_string(failed.front()));
    else if (!failed.empty())
        say("fault i4ImQueryInterface -1 from 1");
}

void Writer::one(const Call& call)
{
    if (needs_power(call.lines))
        power_on();
    faults(call.lines);
    const Item& first = *call.lines.front();
    if (start(call.lines) || handshake(call.lines) || ports(call.lines) || sources(call.lines) || order(call.lines) ||
        one_mode(call.lines) || mode_change(call))
        return;
    const auto found = std::find_if(std::begin(commands), std::end(commands),
                                    [&](const Command& one) { return first.text->format.starts_with(one.begin); });
    if (found == std::end(commands))
        say("# line " + std::to_string(first.line) +
            " belongs to a call that the log does not show: " + printable(first.shown, 400));
    else
        say(filled(found->command, first));
}

/** Whether the system must have begun anew: the layer that runs would do nothing, what is registered would be refused,
 *  and a partition does not come back. */
bool Writer::needs_power(const Lines& call) const
{
    const Item* const partition = line_in(call, "TESTPMX: Get pard");
    if (partition == nullptr)
        return false;
    const bool is_refused = m_held.registered && line_in(call, "Fail to register") == nullptr;
    return (m_held.no_partition && partition->number("i4_id").value_or(0) >= 0) ||
           (is_start(call) && (m_held.started || is_refused));
}

/** Start-up, reset, shut-down. */
bool Writer::start(const Lines& call)
{
    const Item* const boot = line_in(call, "TESTPMX: Get Test");
    const Item* const reset = line_in(call, "[PMX]_arPmxConf[ucPmxId].ucMode=");
    const Item* const partition = line_in(call, "TESTPMX: Get pard");
    const bool inits = is_start(call);
    const bool ends = line_in(call, "PMX_Uninit") != nullptr;
    const Item* const ends_so = line_in(call, "i4PMX_Uninit u4Case");
    const bool no_partition = partition != nullptr && partition->number("i4_id").value_or(0) < 0;
    if (no_partition && !m_held.no_partition)
        say("flash fast_init_param off");
    m_held.no_partition = m_held.no_partition || no_partition;
    if (boot != nullptr && !m_held.no_partition)
        say("flash fast_init_param word 0x" + boot->value("u4TestData"));
    const bool fails = line_in(call, "Fail to register") != nullptr;
    m_held.registered = (m_held.registered || fails) && !inits;
    if (fails)
        say(ends || ends_so != nullptr ? "fault i4ImUnregisterInterface2 -1" : "fault i4ImRegisterInterface2 -1");
    if (const Item* const result = line_in(call, "i4PMX_Uninit return");
        result != nullptr && result->number("i4Ret") != 0)
        say("fault x_sema_delete -1");
    m_held.started = (m_held.started || (inits && boot != nullptr)) && !ends && ends_so == nullptr &&
                     line_in(call, "PMX_Stop") == nullptr;
    if (inits)
        say("PMX_Init");
    else if (boot != nullptr)
        say(reset != nullptr ? "PMX_Reset 0" : "PMX_GetHDMIDefaultRes");
    else if (ends)
        say("PMX_Uninit");
    else if (ends_so != nullptr)
        say(filled("i4PMX_Uninit {u4Case:raw}", *ends_so));
    return inits || boot != nullptr || ends || ends_so != nullptr;
}

/** The lines of a lowered flag, for which the video plane driver may wait. */
bool Writer::lower(const Lines& call)
{
    const Item* const flag = line_in(call, "Display Format Change :");
    if (flag == nullptr || line_in(call, "Set Osd Enable :") == nullptr)
        return false;
    if (line_in(call, "PMX_SetOsdEnable.") == nullptr)
        say("fault fgVdpIsWaitforSyncCtrl 1");
    return true;
}

bool Writer::handshake(const Lines& call)
{
    const std::string_view first = call.front()->text->format;
    if (first.starts_with("PMX timeout"))
    {
        lower(call);
        say(m_held.timer ? "advance 10s" : "_PMX_TmrIsr 0 0");
        m_held.timer = false;
        return true;
    }
    if (first.starts_with("Display Format Change :"))
    {
        lower(call);
        say(filled("PMX_SetFormatChangeFlag {fgPmxFormatChangeFlag:raw}", *call.front()));
        return true;
    }
    if (!first.starts_with("Display Format Change Timer"))
        return false;
    say("PMX_SetFormatChangeTimer 10000");
    m_held.timer = true;
    return true;
}

/** Sources of the board publish what the layer tells them by; others connect by the call alone. */
bool Writer::ports(const Lines& call)
{
    const Item* const who = line_in(call, "Tp,Id=");
    const Item* const port = line_in(call, "Comp(%d)");
    if (who == nullptr || port == nullptr)
        return false;
    const bool connects = port->text->format.ends_with(" connect\n");
    const bool is_video = value_words("u2CompType", who->value("u2CompType")) == "video plane";
    const std::int64_t number = port->number("port").value_or(8);
    constexpr std::int64_t none = 8;
    const std::string source = (is_video ? "vdp" : "osd") + who->value("u2CompId");
    if (number == 0 || number == 1)
        m_held.video[static_cast<std::size_t>(number)] = connects;
    if (connects && number != none && m_held.sources.insert(source).second)
        say("source " + source + " connect");
    else
        say(filled(connects ? "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 {u2CompType:raw} {u2CompId:raw}"
                            : "i4Pmx_Disconnect PMX_COMP_TYPE_PMX 0 {u2CompType:raw} {u2CompId:raw}",
                   *who));
    return true;
}

/** Their sizes stand in no line; their colour spaces tell whether they are large. */
bool Writer::sources(const Lines& call)
{
    const std::string_view first = call.front()->text->format;
    const auto is_large = [&](std::string_view begin) { return line_in(call, begin) != nullptr; };
    if (first.starts_with("VDP_%d Enabled"))
    {
        const bool keyed = line_in(call, "[PMX] VDP_COMP_2") != nullptr;
        if (keyed && !m_held.second_plane)
            say("PMX_EnableVideoPlane 0 1");
        m_held.second_plane = m_held.second_plane || keyed;
        const bool large = is_large("VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709");
        say(filled("PMX_VdpEnabled 0 {ucVdpId:raw} ", *call.front()) + (large ? "1920 1080 " : "720 480 ") +
            (keyed ? "1" : "0"));
        return true;
    }
    if (first.starts_with("OSD_%d Enabled"))
    {
        const bool rgb = line_in(call, "OSD_%d's Src Color Space = DRV_PMX_CS_RGB") != nullptr;
        const bool large = is_large("OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709");
        say(filled("PMX_OsdEnabled 0 {ucOsdId:raw} ", *call.front()) + (large || rgb ? "1920 1080 " : "720 480 ") +
            (rgb ? "DRV_GFX_COLOR_MODE_RGB" : "DRV_GFX_COLOR_MODE_YCBCR"));
        return true;
    }
    if (!first.starts_with("Inform Vdp"))
        return false;
    const std::size_t told = count_in(call, "Inform Vdp");
    const auto planes = static_cast<std::size_t>(std::count(m_held.video.begin(), m_held.video.end(), true));
    for (std::size_t said = 0; said < told; said += std::max<std::size_t>(planes, 1))
        say("PMX_InformVdpColorSpace 0");
    return true;
}

/** Plane orders, swaps, and what the colour bar shows of them. */
bool Writer::order(const Lines& call)
{
    const Item& first = *call.front();
    if (first.text->format.starts_with("[PMX%d] Set PlaneOrder"))
    {
        std::string delays;
        for (const Item* const item : call)
        {
            if (item->text->format.starts_with("Plane %d ofst"))
                delays += " " + item->value("i4Delay");
        }
        const std::string order = "0x" + first.value("u4PlaneOrder");
        const auto packed = static_cast<std::uint32_t>(number_of(first.value("u4PlaneOrder"), 16).value_or(0));
        if (!delays.empty()) // of each plane three bits are looked at
            say("plane-delay order " + std::to_string(packed & 0x77777777) + delays);
        else if (line_in(call, "Plane[%d] and") == nullptr)
            say("fault PMX_HalSetPlaneOrder 1");
        say(filled("PMX_SetArbPlaneOrder {ucPmxId:raw} ", first) + order);
        return true;
    }
    if (first.text->format.starts_with("[PMX%d] Start to Get"))
    {
        if (line_in(call, "Get PlaneOrder") == nullptr)
            say("fault PMX_HalGetPlaneOrder -1");
        say(filled("PMX_GetArbPlaneOrder {ucPmxId:raw}", first));
        return true;
    }
    constexpr std::array<std::string_view, 6> swaps = { "Plane 1_2", "Plane 3_4", "Plane 6_7",
                                                        "Plane 4_7", "Plane 1_3", "Plane 5_8" };
    for (std::size_t swap = 0; swap < swaps.size(); ++swap)
    {
        if (!first.text->format.starts_with(swaps[swap]))
            continue;
        say("# whether swapped or swapped back stands in no line\nPMX_SetSwapEnable 0 1 " + std::to_string(swap + 1));
        return true;
    }
    const bool bar = first.text->format.starts_with("ColorBar");
    const bool swapped = line_in(call, "Temporarily") != nullptr || line_in(call, "Resume Plane") != nullptr;
    if (bar && swapped != m_held.on_top)
        say(swapped ? "PMX_SetOrderVdpComp0 0 1" : "PMX_SetOrderVdpComp0 0 0");
    m_held.on_top = bar ? swapped : m_held.on_top;
    if (bar) // once more with another number, when it is shown already
    {
        m_held.bar = first.text->format.starts_with("ColorBar Disable") ? 0 : m_held.bar == 1 ? 2 : 1;
        say("PMX_SetCBEnable 0 " + std::to_string(m_held.bar));
        return true;
    }
    const bool asks =
        first.text->format.starts_with("PMX_ID(") ||
        (first.text->format.starts_with("[EX] PMX_ID(%d), Aspect") && first.value("fgApplyOnNext") == "0");
    if (asks && count_in(call, "VDP_GlobalOutputChange") + count_in(call, "[EX] VDP_GlobalOutputChange") == 0)
        say("fault fgPmxDrvSetAvd FALSE");
    return false;
}

/** The frequency of a mode's name, which a caller mostly asks for. */
std::int64_t frequency_of(const std::string& mode, std::int64_t usual)
{
    const std::string refresh = refresh_of(mode);
    return number_of(std::string_view(refresh).substr(0, refresh.find('.'))).value_or(usual);
}

bool Writer::one_mode(const Lines& call)
{
    if (!call.front()->text->format.starts_with("SetMode, "))
        return false;
    const std::string mode = call.front()->value("eResMode");
    const bool is_set = line_in(call, "Mode(%d), ") != nullptr;
    std::int64_t frequency = frequency_of(mode, m_held.frequency);
    if (is_set && !m_held.first && mode == m_held.format && frequency == m_held.frequency)
        frequency = frequency == 60 ? 59 : 60;
    say(mode.starts_with("RES_") ? "PMX_SetMode 0 " + mode + " " + std::to_string(frequency) + " 0"
                                 : "# a mode whose name is not printed\nPMX_SetMode 0 RES_2160P 30 0");
    if (is_set)
    {
        m_held.first = false;
        m_held.format = mode;
        m_held.frequency = frequency;
    }
    return true;
}

std::string Writer::requested(const Lines& call, std::string& format, std::string& hdmi) const
{
    constexpr std::string_view begins[] = { "CCIR(%d, %s", "HDMI(", "CAV (", "CVBS(" };
    std::string outputs;
    for (const std::string_view begin : begins)
    {
        const Item* const item = line_in(call, begin);
        const std::string on = item == nullptr ? "0" : item->value("fgOutputEnable");
        std::string mode = item == nullptr ? "RES_480I" : item->value("eResMode");
        mode = mode.starts_with("RES_") ? mode : "RES_2160P";
        if (begin == begins[1])
            hdmi = on + " " + mode;
        if (format.empty() && on != "0")
            format = mode;
        outputs += outputs.empty() ? "" : ", ";
        const Item* const port = line_in(call, "CCIR(%d, %d");
        if (begin == begins[0] && port != nullptr && port->shown != idle_port)
            outputs += "{fgOutputEnable=" + on + ", eResMode=" + mode + ", eCcirDrvInfo={" +
                       filled("{eDgoMode:raw}, {eDgoFmt:raw}, {eDgiMode:raw}, {eDgiFmt:raw}", *port) + "}}";
        else
            outputs += "[" + on + ", " + mode + "]";
    }
    if (format.empty())
        format = hdmi.substr(hdmi.find(' ') + 1);
    return "[ " + outputs + " ]";
}

/** Brings sink and display part to what the call shows of them. */
void Writer::display_part(const Call& call, bool sends_hdmi, bool is_full)
{
    const Item* const nobody = line_in(call.lines, "[PMX] fgHdmiExist");
    const bool plugged = nobody == nullptr || (nobody->value("fgHdmiExist") == "0" && !m_held.timer && m_held.sink);
    if (plugged != m_held.sink)
        say(plugged ? "sink plug" : "sink unplug");
    m_held.sink = plugged;
    bool raises = false;
    for (std::size_t place = call.begin + 1; place < call.end; ++place)
    {
        const Item& item = m_log.items[m_log.order[place]];
        raises = raises || (item.text->rule == rules::flag && item.values.front() != "0");
    }
    const bool exists =
        nobody == nullptr ? is_full || sends_hdmi || raises || !m_held.timer : nobody->value("fgHdmiExist") != "0";
    const bool requests = exists && !is_full && !sends_hdmi;
    if (requests != m_held.requests)
        say(requests ? "sink request-resolution on" : "sink request-resolution off");
    m_held.requests = requests;
    if (exists && raises != m_held.raises)
    {
        say(raises ? "display-part never" : "display-part off");
        m_held.raises = raises;
    }
}

bool Writer::mode_change(const Call& call)
{
    if (!call.lines.front()->text->format.starts_with("SetModeEx"))
        return false;
    std::string format;
    std::string hdmi;
    const std::string outputs = requested(call.lines, format, hdmi);
    const bool is_full = line_in(call.lines, "Adjust PMX") != nullptr;
    const bool is_refused = line_in(call.lines, "[PMX] PMX_SetModeEx, PMX_CheckCap") != nullptr;
    std::int64_t frequency = is_full || is_refused ? frequency_of(format, m_held.frequency) : m_held.frequency;
    bool external = m_held.external;
    if (is_full && !m_held.first && format == m_held.format && frequency == m_held.frequency)
    {
        say("# the frequency or the external chip is another one: which, stands in no line");
        external = !external;
    }
    if (!is_refused)
        display_part(call, hdmi != m_held.hdmi, is_full);
    lower(call.lines);
    const Item* const fifth = line_in(call.lines, "OSD5(");
    say("PMX_SetModeEx 0 " + outputs + " " + std::to_string(frequency) + " " +
        (external ? "DRV_EXT_SCL_EXT_TX" : "DRV_NON_EXT_CHIP") + " " +
        (fifth == nullptr ? "0" : fifth->value("fgOSD5")));
    if (is_refused)
        return true;
    m_held.first = false;
    m_held.format = format;
    m_held.hdmi = hdmi;
    m_held.frequency = frequency;
    m_held.external = external;
    m_held.timer = m_held.timer || line_in(call.lines, "Display Format Change Timer") != nullptr;
    return true;
}

} // namespace

void write_scenario(std::ostream& out, const Log& log, const std::string& name)
{
    out << "# What " << printable(name, name.size() * 4) << " shows.\n"
        << "# In no line stand frequencies, sizes, luma keys and external chips: those that go with the rest are "
           "taken.\n";
    if (log.level.value_or(level_plain) < whole_level)
        out << "# The log has no line of level 9: what is printed there alone is left out.\n";
    Writer(out, log).write();
}

} // namespace pmxboard::decode
