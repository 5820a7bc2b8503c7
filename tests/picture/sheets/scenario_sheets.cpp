// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Of each scenario one sheet of what is seen, beside the one that somebody has looked at: the four outputs at the end,
// and wherever the picture has become another one, with the digital port and HDMI above, component and composite below.
//
// A scenario without sources gets some, and HDMI and component show the mixer's picture when nobody told them anything.
//
// usage: scenario_sheets SCENARIOS SHEETS DIFFERENCES [--renew]
//
// SHEETS has the sheets, and a manifest that tells behind which command each of their cells is seen. What differs is
// written to DIFFERENCES, with the sheet as it is now. With --renew SHEETS is written anew.
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "board/board.h"
#include "board/files.h"
#include "board/picture/compare.h"
#include "board/picture/pixels.h"
#include "board/picture/shot.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace
{

namespace fs = std::filesystem;
namespace picture = board::picture;

constexpr picture::Effort effort{ 1, 8 }; ///< outputs of 1920x1080 are 240x135 then
constexpr int cell_width = 160;
constexpr int cell_height = 90;
constexpr int cells_in_row = 3;
constexpr int gap = 4;
constexpr std::size_t most_cells = 6;
constexpr unsigned other_colour = 24; ///< in a code of eight bits
/** In so many pixels another colour makes another picture: a twelfth of an output. */
constexpr std::size_t other_picture = std::size_t{ cell_width } * cell_height / 48;
constexpr unsigned tolerance = 2;
/** Everybody who takes the project takes them. */
constexpr std::uintmax_t most_bytes = 600'000;
const std::string manifest_name = "manifest.txt";

void write(const fs::path& name, std::string_view content)
{
    pmxboard::NewFile file(name, pmxboard::NewFile::Over::Anything); // a sheet that was read is renewed
    file.stream() << content;
    file.commit();
}

struct Cell
{
    std::string behind; ///< a command
    picture::Image image;
};

std::size_t pixels_apart(const picture::Image& one, const picture::Image& other, unsigned more_than)
{
    const auto found = picture::difference(one, other, more_than);
    return found ? found->pixels : 0;
}

/** With HDMI and component in the mixer's mode where nobody has told them anything, as a boot loader leaves them: few
 *  scenarios are about outputs, and of the others nothing would be seen. Composite has a converter of its own, which
 *  nobody has told anything either. */
picture::Hardware with_outputs(picture::Hardware hardware)
{
    if (!hardware.mixer.mode)
        return hardware;
    if (!hardware.hdmi)
        hardware.hdmi = { true, *hardware.mixer.mode };
    if (!hardware.encoders[0].mode)
        hardware.encoders[0] = { true, *hardware.mixer.mode };
    return hardware;
}

/** With a film, a small second one and a menu: it is seen then how planes lie over each other, and which of them are
 *  held back. */
picture::Hardware with_sources(picture::Hardware hardware)
{
    hardware.sources[0].delivery = { 1920, 1080 };
    hardware.sources[1].delivery = { 720, 480 };
    for (const std::size_t plane : { 0, 1 })
        hardware.video_planes[plane].shown = true;
    hardware.sources[picture::video_source_count].delivery = { .width = 1280, .height = 720, .ycbcr = false };
    return hardware;
}

/** Looks at the outputs behind each command. */
class Viewer : public pmxboard::TraceSink
{
public:
    /** @param has_sources  without any of its own a run is given some */
    explicit Viewer(bool has_sources) : m_has_sources(has_sources) {}

    void powered_on() override { m_is_powered = true; }
    void command(std::string_view line) override
    {
        look();
        m_command = line;
    }
    std::string entry(const board::TraceEntry&, bool) override { return {}; }

    /** What is worth being kept: at least the end. */
    std::vector<Cell> seen()
    {
        look();
        if (!m_is_powered)
            return {};
        if (m_kept.empty() || pixels_apart(m_kept.back().image, m_last.image, 0) != 0)
            m_kept.push_back(m_last);
        while (m_kept.size() > most_cells)
            m_kept.erase(least_different());
        return std::move(m_kept);
    }

private:
    void look()
    {
        if (!m_is_powered)
            return;
        picture::Hardware hardware = with_outputs(picture::hardware_now());
        if (!m_has_sources)
            hardware = with_sources(std::move(hardware));
        if (is_as_before(hardware))
        {
            m_last.behind = m_command;
            return;
        }
        const bool is_first = m_last.image.empty();
        m_last = { m_command, sheet_of(all_shots(hardware, effort), cell_width, cell_height) };
        if (is_first)
            m_known = m_last.image; // a board that has just got its power: it is the same in all scenarios
        if (pixels_apart(m_known, m_last.image, other_colour) < other_picture)
            return;
        m_known = m_last.image;
        m_kept.push_back(m_last);
    }

    /** Whether nothing was told since the last look that makes a difference: most commands are about other things. */
    bool is_as_before(const picture::Hardware& hardware)
    {
        const board::Value state = board::state();
        std::vector<board::Value> told;
        for (const char* const device : { "mixer", "tv_encoder", "video_planes", "osd_planes", "sources", "hdmi_av" })
            told.push_back(*state.find(device));
        told.push_back(board::Value::number(hardware.aspect));
        // What was cleared shows pictures again when a little time has gone by.
        for (const picture::VideoPlaneState& plane : hardware.video_planes)
            told.push_back(board::Value::number(plane.cleared ? 1 : 0));
        return std::exchange(m_told, told) == told;
    }

    /** From the one in front of it; the first and the last stay. */
    std::vector<Cell>::iterator least_different()
    {
        const auto change = [](const Cell& cell) {
            return pixels_apart(std::prev(&cell)->image, cell.image, other_colour);
        };
        return std::min_element(std::next(m_kept.begin()), std::prev(m_kept.end()),
                                [&](const Cell& one, const Cell& other) { return change(one) < change(other); });
    }

    bool m_has_sources;
    bool m_is_powered = false;
    std::string m_command;
    std::vector<board::Value> m_told;
    Cell m_last;
    picture::Image m_known; ///< what the next one has to differ from
    std::vector<Cell> m_kept;
};

/** Throws std::runtime_error when the scenario does not do what it says. */
std::vector<Cell> cells_of(const fs::path& scenario)
{
    Viewer viewer(("\n" + board::files::read(scenario)).find("\nsource ") != std::string::npos);
    pmxboard::OutputOptions output;
    output.quiet = true;
    output.trace = &viewer;
    const auto lines = board::files::open_lines(scenario);
    if (!pmxboard::run_scenario(*lines, { .name = scenario, .board = "default", .repeat = "", .failures = nullptr },
                                output, std::cerr))
        throw std::runtime_error(scenario.string() + " failed");
    std::vector<Cell> cells = viewer.seen();
    if (cells.empty())
        throw std::runtime_error(scenario.string() + " powers no board on");
    return cells;
}

picture::Image sheet_with(const std::vector<Cell>& cells)
{
    const int count = static_cast<int>(cells.size());
    const int columns = std::min(count, cells_in_row);
    const int rows = (count + cells_in_row - 1) / cells_in_row;
    picture::Image sheet(columns * (cell_width + gap) - gap, rows * (cell_height + gap) - gap, picture::full_rgb,
                         picture::opaque(255, 255, 255));
    for (int i = 0; i < count; ++i)
    {
        const picture::Image& cell = cells[static_cast<std::size_t>(i)].image;
        const int left = i % cells_in_row * (cell_width + gap);
        const int top = i / cells_in_row * (cell_height + gap);
        for (int y = 0; y < cell_height; ++y)
            std::copy(cell.row(y).begin(), cell.row(y).end(), sheet.row(top + y).begin() + left);
    }
    return sheet;
}

std::string manifest_lines(const std::string& sheet, const std::vector<Cell>& cells)
{
    std::string lines = sheet + "\n";
    for (const Cell& cell : cells)
        lines += "    " + cell.behind + "\n";
    return lines;
}

/** What is wrong with a sheet; empty when nothing is. */
std::string complaint(const picture::Image& found, const fs::path& expected, const fs::path& differences)
{
    if (!fs::exists(expected))
        return "there is none";
    const picture::Image wanted = picture::read_picture(board::files::read(expected));
    const fs::path kept = differences / expected.filename();
    if (wanted.width() != found.width() || wanted.height() != found.height())
    {
        write(kept, picture::to_png(found));
        return "it has another number of cells; now it is " + kept.string();
    }
    const auto difference = picture::difference(wanted, found, tolerance);
    if (!difference)
        return "";
    const fs::path shown = fs::path(kept).replace_extension(".difference.png");
    write(kept, picture::to_png(found));
    write(shown, picture::to_png(difference->shown));
    return std::to_string(difference->pixels) + " pixels differ, by " + std::to_string(difference->most) +
           " at most, at " + std::to_string(difference->x) + "," + std::to_string(difference->y) + "; " +
           shown.string() + " shows where, and now it is " + kept.string();
}

class Sheets
{
public:
    Sheets(fs::path folder, fs::path differences) : m_folder(std::move(folder)), m_differences(std::move(differences))
    {
        fs::create_directories(m_differences);
    }

    void look_at(const fs::path& scenario)
    {
        const std::string name = scenario.stem().string() + ".png";
        const std::vector<Cell> cells = cells_of(scenario);
        m_manifest += manifest_lines(name, cells);
        m_sheets[name] = sheet_with(cells);
    }

    void renew() const
    {
        for (const auto& [name, bytes] : kept())
            if (!m_sheets.contains(name))
                fs::remove(m_folder / name);
        for (const auto& [name, sheet] : m_sheets)
            if (!complaint(sheet, m_folder / name, m_differences).empty())
                write(m_folder / name, picture::to_png(sheet));
        write(m_folder / manifest_name, m_manifest);
    }

    /** Whether they are as they were when somebody looked at them. */
    bool are_right() const
    {
        bool right = true;
        const auto tell = [&right](const std::string& what, const std::string& why) {
            right = false;
            std::cerr << what << ": " << why << '\n';
        };
        for (const auto& [name, sheet] : m_sheets)
            if (const std::string why = complaint(sheet, m_folder / name, m_differences); !why.empty())
                tell(name, why);
        std::uintmax_t bytes = 0;
        for (const auto& [name, size] : kept())
        {
            bytes += size;
            if (!m_sheets.contains(name))
                tell(name, "there is no such scenario");
        }
        if (bytes > most_bytes)
            tell("all sheets", std::to_string(bytes) + " bytes; the limit is " + std::to_string(most_bytes));
        const fs::path manifest = m_folder / manifest_name;
        if (!fs::exists(manifest) || board::files::read(manifest) != m_manifest)
        {
            write(m_differences / manifest_name, m_manifest);
            tell(manifest_name,
                 "pictures are seen behind other commands; now it is " + (m_differences / manifest_name).string());
        }
        return right;
    }

private:
    /** The size of each file that is there. */
    std::map<std::string, std::uintmax_t> kept() const
    {
        std::map<std::string, std::uintmax_t> sizes;
        for (const fs::directory_entry& file : fs::directory_iterator(m_folder))
            if (file.path().extension() == ".png")
                sizes[file.path().filename().string()] = file.file_size();
        return sizes;
    }

    fs::path m_folder;
    fs::path m_differences;
    std::map<std::string, picture::Image> m_sheets;
    std::string m_manifest = "# SPDX-License-Identifier: MIT OR GPL-2.0-only\n"
                             "# Written by a program: behind which command each cell of a sheet is seen.\n";
};

int run(const std::vector<std::string>& arguments)
{
    std::vector<fs::path> scenarios;
    for (const fs::directory_entry& file : fs::directory_iterator(arguments[0]))
        if (file.path().extension() == ".pmx")
            scenarios.push_back(file.path());
    std::sort(scenarios.begin(), scenarios.end());
    Sheets sheets(arguments[1], arguments[2]);
    for (const fs::path& scenario : scenarios)
        sheets.look_at(scenario);
    if (arguments.size() == 4)
        sheets.renew();
    if (sheets.are_right())
        return 0;
    std::cerr << "to renew: cmake --build --preset debug --target renew_sheets, and look at what has changed\n";
    return 1;
}

} // namespace

int main(int count, char** arguments)
try
{
    const std::vector<std::string> words(arguments + 1, arguments + count);
    if (words.size() == 3 || (words.size() == 4 && words[3] == "--renew"))
        return run(words);
    std::cerr << "usage: scenario_sheets SCENARIOS SHEETS DIFFERENCES [--renew]\n";
    return 2;
}
catch (const std::exception& error)
{
    std::cerr << "scenario_sheets: " << error.what() << '\n';
    return 2;
}
