// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/disturbed/ground.h"

#include <algorithm>
#include <cstdlib>
#include <map>
#include <stdexcept>

#include "board/devices.h"
#include "board/video_planes.h"
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/functions/operation_examples.h"
#include "tools/pmxboard/language/line.h"
#include "tools/record_view/record_view.h"

namespace disturbed
{
namespace
{

const std::string start = "PMX_Init";
const std::string first_mode = "PMX_SetModeEx 0 [[0], [1, RES_1080P60HZ], [1, RES_1080P60HZ], [1, RES_480I]] 60 0 0";
const std::string other_mode = "PMX_SetModeEx 0 [[1, RES_720P50HZ], [1, RES_720P50HZ], [1, RES_480P], [1, RES_576I]] ";
const std::string next_mode =
    "PMX_SetModeEx 0 [[1, RES_1080I50HZ], [1, RES_1080I50HZ], [1, RES_480P], [1, RES_576I]] 50 0 0";
const std::string raised = "PMX_SetFormatChangeFlag TRUE";

/** Where an example takes one way and the operation has others that call something. */
const std::vector<Path> other_ways{
    { first_mode, { start } },
    { first_mode, { start, first_mode } },
    { first_mode, { start, first_mode, raised } },
    { other_mode + "50 0 1", { start, first_mode, raised } },
    { other_mode + "60 1 2", { start, first_mode } },
    { "PMX_SetModeEx 0 [[0], [1, RES_2160P], [0], [0]] 60 0 0", { start, first_mode, raised } },
    { "PMX_SetModeEx 0 [[0], [0, RES_480P], [0], [0]] 60 0 0", { start } },
    { "PMX_SetMode 0 RES_720P60HZ 60 0", { start, "PMX_SetMode 0 RES_720P60HZ 60 0" } },
    { "PMX_Reset 0", { start, first_mode } },
    { "PMX_Init", { start } },
    { "PMX_Init", { start, "PMX_Uninit" } },
    { "PMX_SetEnable 0 0", { start, "PMX_SetEnable 0 1" } },
    { "PMX_SetDigitalOutEnable 0 1", { start, "PMX_SetEnable 0 1" } },
    { "PMX_SetCBEnable 0 1", { start, "PMX_SetOrderVdpComp0 0 1" } },
    { "PMX_SetMuteEnable 0 0", { start, "PMX_SetCBEnable 0 1", "PMX_SetMuteEnable 0 1" } },
    { "PMX_SetOsdEnable", { start, "PMX_SetOsdEnableFlag TRUE" } },
    { "PMX_VdpEnabled 0 0 720 480 0", { start, "source vdp0 connect", "source vdp1 connect" } },
    { "PMX_VdpEnabled 0 2 1920 1080 9", { start, "source vdp2 connect" } },
    { "PMX_OsdEnabled 0 2 720 480 DRV_GFX_COLOR_MODE_YCBCR", { start, "source vdp0 connect" } },
    { "PMX_OsdDisabled 0 2", { start, "source vdp0 start 720x480", "source osd2 start 1920x1080 ycbcr" } },
    { "PMX_SetBrightness 0 140 FALSE", { start } },
    { "PMX_SetAspectRatioEx 0 ASP_4_3 FALSE", { start } },
    { "PMX_SetDigestAspectRatioEx 0 ASP_4_3 FALSE", { start } },
    { "PMX_ColorSpaceSetup DRV_PMX_CS_RGB RES_480P", { start } },
    { "PMX_VdpGetPlanePosition 0 2", { start } },
    { "i4Pmx_Connect PMX_COMP_TYPE_PMX 0 PMX_COMP_TYPE_OSD 9", { start } },
};

/** The lines of examples that are no operations. */
void run_verb(const pmxboard::Line& line)
{
    if (line.word(0) == "poke")
        return record_view::set(line.word(1), std::stoll(line.word(2).substr(2), nullptr, 2));
    if (line.word(0) != "source")
        throw std::invalid_argument("nobody here knows how to " + line.from(0));
    const board::sources::Id id = board::sources::find(line.word(1));
    if (line.word(2) == "connect")
    {
        board::sources::connect(id);
        return;
    }
    const std::string& size = line.word(3);
    const board::sources::Size picture{ std::stoi(size), std::stoi(size.substr(size.find('x') + 1)) };
    if (id.type == board::sources::Id::Type::VideoPlane)
        board::sources::start_video(id.number, picture, 0);
    else
        board::sources::start_graphics(id.number, picture,
                                       line.word(4) == "rgb" ? DRV_GFX_COLOR_MODE_RGB : DRV_GFX_COLOR_MODE_YCBCR);
}

struct Call
{
    const pmxboard::Operation* operation;
    pmxboard::Values values;
};

/** The operation of a line, its arguments read; no operation for another verb. */
const Call& call_of(const std::string& text)
{
    static std::map<std::string, Call> calls;
    if (const auto found = calls.find(text); found != calls.end())
        return found->second;
    const pmxboard::Line line(text);
    const pmxboard::Operation* const operation = pmxboard::find(pmxboard::operations(), line.word(0));
    pmxboard::Values values;
    if (operation != nullptr)
        values = pmxboard::read_arguments(*operation, std::span(line.words()).subspan(1));
    return calls.emplace(text, Call{ operation, std::move(values) }).first->second;
}

std::string call(const std::string& text)
{
    const Call& known = call_of(text);
    if (known.operation == nullptr)
    {
        run_verb(pmxboard::Line(text));
        return {};
    }
    return pmxboard::to_json(known.operation->run(known.values));
}

/** As it is told, without what was answered. */
std::string told(const board::TraceEntry& entry)
{
    if (entry.kind == board::TraceEntry::Kind::Log)
        return entry.text;
    std::string line = entry.function + "(";
    for (const board::TraceArgument& argument : entry.arguments)
        line += argument.value.to_text() + ", ";
    return line + ")";
}

bool is_call(const board::TraceEntry& entry)
{
    using Kind = board::TraceEntry::Kind;
    return entry.kind == Kind::Call || entry.kind == Kind::Log || entry.kind == Kind::Assert;
}

void gather(Played& run)
{
    std::map<std::string, unsigned> calls;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (!is_call(entry))
            continue;
        if (entry.kind == board::TraceEntry::Kind::Assert)
            run.asserts.push_back(entry.arguments.at(0).value.string());
        else if (entry.result)
            run.points.push_back(
                { entry.function, ++calls[entry.function], run.calls - run.asserts.size(), entry.result->as_number() });
        ++run.calls;
        run.prints_alone = run.prints_alone && entry.kind == board::TraceEntry::Kind::Log;
    }
}

std::vector<Path> all_paths()
{
    std::vector<Path> paths;
    for (const pmxboard::Operation& operation : pmxboard::operations())
    {
        const pmxboard::OperationExample* const example = pmxboard::example_of(operation.name);
        if (example == nullptr)
            throw std::logic_error(operation.name + " has no example");
        paths.push_back({ std::string(example->line), { example->before.begin(), example->before.end() } });
    }
    paths.insert(paths.end(), other_ways.begin(), other_ways.end());
    return paths;
}

bool timer_runs()
{
    const board::Value timers = board::timers::state();
    return std::any_of(timers.items().begin(), timers.items().end(),
                       [](const board::Value& timer) { return timer.find("running")->as_number() != 0; });
}

} // namespace

const std::vector<Path>& every_path()
{
    static const std::vector<Path> paths = all_paths();
    return paths;
}

bool all_of_it()
{
    const char* const wanted = std::getenv("PMX_DISTURBED");
    return wanted != nullptr && std::string_view(wanted) == "all";
}

void prepare(const Path& path)
{
    board::at_every_call({});
    board::Description description;
    description.flash_words["fast_init_param"] = RES_1080P60HZ;
    board::power_on(description);
    for (const std::string& line : path.before)
        call(line);
    board::trace::clear();
}

Played run(const Path& path, const std::function<void()>& disturb)
{
    Played run;
    if (disturb)
        disturb();
    run.outcome = call(path.line);
    board::at_every_call({});
    gather(run);
    run.misuses = board::misuses();
    run.lock_held = lock_held();
    return run;
}

std::vector<std::string> lines()
{
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (is_call(entry) && entry.kind != board::TraceEntry::Kind::Assert)
            lines.push_back(told(entry));
    }
    return lines;
}

std::string record()
{
    return record_view::state().to_text();
}

bool lock_held()
{
    return board::os::mutex_held(MutexPMX);
}

std::string planes_out()
{
    std::string planes;
    for (UCHAR plane = DRV_PMX_PLANE_3; plane <= DRV_PMX_PLANE_7; ++plane)
        planes += fgPmxHalMixPlane(0, plane) == FALSE ? std::to_string(plane) + " " : "";
    return planes;
}

bool forgotten()
{
    const PMX_DISPLAY_PART_STATUS_T& status = _arPmxDispPartStatus;
    return !planes_out().empty() && status.fgPmxEnabeOsdFlag == FALSE &&
           (status.fgPmxFormatChangeFlag == FALSE || !timer_runs());
}

std::vector<std::string> recover(std::vector<std::string>& wrong)
{
    board::at_every_call({});
    board::faults::clear_all();
    board::hdmi_av::plug(true);
    board::trace::clear();
    call(raised);
    const std::string outcome = call(next_mode);
    Played mode;
    gather(mode);
    std::vector<std::string> called = lines();
    called.insert(called.end(), mode.asserts.begin(), mode.asserts.end());
    called.push_back(outcome);
    if (planes_out() != "2 3 4 5 6 ")
        wrong.push_back("the next mode change does not hold graphics back: " + planes_out());
    for (std::string& what : release())
        wrong.push_back(std::move(what));
    return called;
}

std::vector<std::string> release()
{
    std::vector<std::string> wrong;
    board::display_part::lower();
    board::video_planes::release_graphics();
    if (const std::string planes = planes_out(); !planes.empty())
        wrong.push_back("graphics stay out: " + planes);
    if (lock_held())
        wrong.push_back("a mutex is held");
    return wrong;
}

} // namespace disturbed
