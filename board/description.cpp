// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The one place of the board that knows the TOML library: it compiles slowly.
#include <limits>
#include <toml++/toml.h>
#include <tuple>

#include "board/boards_directory.h"
#include "board/devices.h"
#include "board/duration.h"
#include "board/files.h"
#include "board/names.h"

namespace board
{
namespace
{

std::filesystem::path& boards_directory()
{
    static std::filesystem::path directory = found_boards_directory();
    return directory;
}

/** One board file that is being read. */
struct File
{
    std::filesystem::path path;

    [[noreturn]] void wrong(const toml::source_region& where, const std::string& what) const
    {
        throw DescriptionError(path.string() + ":" + std::to_string(where.begin.line) + ": " + what);
    }
};

std::string suggestion(std::string_view wrong, const std::vector<std::string_view>& valid)
{
    std::string text;
    for (const std::string& near : names::nearest(wrong, valid))
        text += (text.empty() ? "; did you mean " : ", ") + near;
    if (!text.empty())
        return text + "?";
    for (const std::string_view key : valid)
        text += (text.empty() ? "; there are: " : ", ") + std::string(key);
    return text;
}

/** Refuses keys that nothing reads. */
void check_keys(const File& file, const toml::table& table, const std::vector<std::string_view>& valid,
                const std::string& where)
{
    for (const auto& [key, value] : table)
    {
        if (std::find(valid.begin(), valid.end(), key.str()) == valid.end())
            file.wrong(key.source(),
                       "no such key" + where + ": " + std::string(key.str()) + suggestion(key.str(), valid));
    }
}

std::int64_t number_at(const File& file, const toml::node& node, const std::string& key, std::int64_t least,
                       std::int64_t most)
{
    if (!node.is_integer())
        file.wrong(node.source(), key + " has to be a whole number");
    const std::int64_t number = node.as_integer()->get();
    if (number < least || number > most)
        file.wrong(node.source(), key + " has to be " + std::to_string(least) + " to " + std::to_string(most));
    return number;
}

std::string text_at(const File& file, const toml::node& node, const std::string& key)
{
    if (!node.is_string() || node.as_string()->get().empty())
        file.wrong(node.source(), key + " has to be a text, and not an empty one");
    return node.as_string()->get();
}

bool switch_at(const File& file, const toml::node& node, const std::string& key)
{
    if (!node.is_boolean())
        file.wrong(node.source(), key + " has to be true or false");
    return node.as_boolean()->get();
}

/** A table of the file; null when it is not there. */
const toml::table* table_at(const File& file, const toml::table& root, std::string_view key,
                            const std::vector<std::string_view>& valid)
{
    const toml::node* const node = root.get(key);
    if (node == nullptr)
        return nullptr;
    if (!node->is_table())
        file.wrong(node->source(), std::string(key) + " has to be a table: [" + std::string(key) + "]");
    if (!valid.empty())
        check_keys(file, *node->as_table(), valid, " in [" + std::string(key) + "]");
    return node->as_table();
}

void read_flash(const File& file, const toml::table& flash, Description& description)
{
    for (const auto& [key, value] : flash)
    {
        const std::string name(key.str());
        const auto image = file.path.parent_path() / text_at(file, value, "the image of flash partition " + name);
        if (name.empty())
            file.wrong(key.source(), "a flash partition has a name");
        std::error_code error;
        if (!std::filesystem::is_regular_file(image, error))
            file.wrong(value.source(), "flash partition " + name + ": no such image file: " + image.string());
        description.flash[name] = image;
    }
}

mixer::PlaneDelays plane_delays_at(const File& file, const toml::node& node, const std::string& key)
{
    mixer::PlaneDelays delays{};
    const toml::array* const list = node.as_array();
    if (list == nullptr || list->size() != delays.size())
        file.wrong(node.source(),
                   key + " has to be a list of " + std::to_string(delays.size()) + " numbers, plane 1 first");
    for (std::size_t plane = 0; plane < delays.size(); ++plane)
        delays[plane] = static_cast<std::int32_t>(number_at(file, (*list)[plane], "a plane's delay",
                                                            std::numeric_limits<std::int32_t>::min(),
                                                            std::numeric_limits<std::int32_t>::max()));
    return delays;
}

void read_arrangement(const File& file, const toml::node& node, Description& description)
{
    const toml::table* const table = node.as_table();
    if (table == nullptr)
        file.wrong(node.source(), "an arrangement has to be a table: [[mixer.arrangement]]");
    check_keys(file, *table, { "order", "delay" }, " in [[mixer.arrangement]]");
    const toml::node* const order = table->get("order");
    const toml::node* const delay = table->get("delay");
    if (order == nullptr || delay == nullptr)
        file.wrong(table->source(), "an arrangement needs order and delay");
    mixer::Arrangement arrangement{};
    arrangement.order = static_cast<std::uint32_t>(
        number_at(file, *order, "order of an arrangement", 0, std::numeric_limits<std::uint32_t>::max()));
    arrangement.delay = plane_delays_at(file, *delay, "delay of an arrangement");
    try
    {
        mixer::check_order(arrangement.order);
    }
    catch (const std::invalid_argument& error)
    {
        file.wrong(order->source(), error.what());
    }
    for (const mixer::Arrangement& other : description.arrangements)
    {
        if (other.order == arrangement.order)
            file.wrong(order->source(), "this arrangement stands here twice");
    }
    description.arrangements.push_back(arrangement);
}

void read_mixer(const File& file, const toml::table& mixer, Description& description)
{
    if (const toml::node* const delay = mixer.get("plane_delay"))
        description.plane_delay = plane_delays_at(file, *delay, "plane_delay");
    const toml::node* const node = mixer.get("arrangement");
    if (node == nullptr)
        return;
    const toml::array* const list = node->as_array();
    if (list == nullptr)
        file.wrong(node->source(), "arrangement has to be a list of tables: [[mixer.arrangement]]");
    for (const toml::node& item : *list)
        read_arrangement(file, item, description);
}

std::uint32_t resolution_mode_at(const File& file, const toml::node& node, const std::string& key)
{
    const std::string text = text_at(file, node, key);
    std::vector<std::string_view> modes;
    for (const std::string_view name : names::all())
    {
        const std::int64_t number = names::number_of(name).value();
        if (names::name_of(names::Family::ResolutionMode, number) != name)
            continue;
        if (name == text)
            return static_cast<std::uint32_t>(number);
        modes.push_back(name);
    }
    file.wrong(node.source(), "no resolution mode is called " + text + suggestion(text, modes));
}

void read_hdmi(const File& file, const toml::table& hdmi, Description& description)
{
    if (const toml::node* const plugged = hdmi.get("plugged"))
        description.sink_plugged = switch_at(file, *plugged, "plugged of hdmi");
    if (const toml::node* const wanted = hdmi.get("request_resolution"))
        description.resolution_requested = switch_at(file, *wanted, "request_resolution of hdmi");
    const toml::table* const valid = table_at(file, hdmi, "valid", { "resolution", "frequency" });
    if (valid == nullptr)
        return;
    const toml::node* const resolution = valid->get("resolution");
    const toml::node* const frequency = valid->get("frequency");
    if (resolution == nullptr || frequency == nullptr)
        file.wrong(valid->source(), "valid of hdmi needs resolution and frequency");
    const auto mode = resolution_mode_at(file, *resolution, "resolution of valid");
    description.valid_resolution = { mode, static_cast<std::uint16_t>(
                                               number_at(file, *frequency, "frequency of valid", 0, 65535)) };
}

void read_display_part(const File& file, const toml::node& node, Description& description)
{
    try
    {
        description.display_part = display_part::read_behaviour(text_at(file, node, "answer of display_part"));
    }
    catch (const std::invalid_argument& error)
    {
        file.wrong(node.source(), error.what());
    }
}

std::chrono::microseconds time_at(const File& file, const toml::node& node, const std::string& key)
try
{
    if (const auto time = read_duration(text_at(file, node, key)))
        return *time;
    file.wrong(node.source(), key + " has to be a time: 10s, 500ms or 2us");
}
catch (const std::invalid_argument& error)
{
    file.wrong(node.source(), error.what());
}

/** When a fault answers: one of on, from, for and always; without any of them the first call. */
void read_moment(const File& file, const toml::table& table, Fault& fault)
{
    unsigned given = 0;
    for (const auto& [key, when] : { std::pair{ "on", Fault::When::On }, std::pair{ "from", Fault::When::From } })
    {
        if (const toml::node* const node = table.get(key))
        {
            fault.when = when;
            fault.n = static_cast<unsigned>(
                number_at(file, *node, std::string(key) + " of a fault", 1, std::numeric_limits<std::int32_t>::max()));
            ++given;
        }
    }
    if (const toml::node* const node = table.get("always"))
    {
        if (!switch_at(file, *node, "always of a fault"))
            file.wrong(node->source(), "always of a fault can only be true; leave it out, or use on or from");
        fault.when = Fault::When::Always;
        ++given;
    }
    if (const toml::node* const node = table.get("for"))
    {
        fault.time = time_at(file, *node, "for of a fault");
        fault.when = Fault::When::For;
        ++given;
    }
    if (given > 1)
        file.wrong(table.source(), "a fault takes one of on, from, for and always");
}

/** What a fault sets outputs to: a number, or a text as a scenario has it. */
void read_outputs(const File& file, const toml::table& table, Fault& fault)
{
    const toml::node* const node = table.get("outputs");
    if (node == nullptr)
        return;
    if (!node->is_table())
        file.wrong(node->source(), "outputs of a fault has to be a table: { phTimer = 7 }");
    for (const auto& [key, value] : *node->as_table())
    {
        const std::string name(key.str());
        fault.outputs.push_back({ name, value.is_integer() ? std::to_string(value.as_integer()->get())
                                                           : text_at(file, value, "the output " + name) });
    }
}

Fault read_fault(const File& file, const toml::node& node)
{
    const toml::table* const table = node.as_table();
    if (table == nullptr)
        file.wrong(node.source(), "a fault has to be a table: [[fault]]");
    check_keys(file, *table, { "function", "answer", "on", "from", "for", "always", "outputs" }, " in [[fault]]");
    const toml::node* const function = table->get("function");
    const toml::node* const answer = table->get("answer");
    if (function == nullptr || answer == nullptr)
        file.wrong(table->source(), "a fault needs function and answer");
    Fault fault;
    fault.answer = number_at(file, *answer, "answer of a fault", std::numeric_limits<std::int32_t>::min(),
                             std::numeric_limits<std::uint32_t>::max());
    read_moment(file, *table, fault);
    read_outputs(file, *table, fault);
    try
    {
        std::tie(fault.function, fault.arguments) = faults::read_call(text_at(file, *function, "function of a fault"));
        faults::check(fault);
    }
    catch (const std::invalid_argument& error)
    {
        file.wrong(function->source(), error.what());
    }
    return fault;
}

void read_faults(const File& file, const toml::node& node, Description& description)
{
    const toml::array* const list = node.as_array();
    if (list == nullptr)
        file.wrong(node.source(), "fault has to be a list of tables: [[fault]]");
    for (const toml::node& item : *list)
        description.faults.push_back(read_fault(file, item));
}

Description read(const File& file, const toml::table& root)
{
    check_keys(file, root, { "name", "console", "flash", "hdmi", "display_part", "mixer", "fault" }, "");
    Description description;
    description.name = file.path.parent_path().filename().string();
    if (const toml::node* const name = root.get("name"))
        description.name = text_at(file, *name, "name");
    if (const toml::table* const console = table_at(file, root, "console", { "level" }))
    {
        if (const toml::node* const level = console->get("level"))
            description.console_level = static_cast<int>(number_at(file, *level, "level of the console", -1, 1000));
    }
    if (const toml::table* const flash = table_at(file, root, "flash", {}))
        read_flash(file, *flash, description);
    if (const toml::table* const hdmi = table_at(file, root, "hdmi", { "plugged", "request_resolution", "valid" }))
        read_hdmi(file, *hdmi, description);
    if (const toml::table* const part = table_at(file, root, "display_part", { "answer" }))
    {
        if (const toml::node* const answer = part->get("answer"))
            read_display_part(file, *answer, description);
    }
    if (const toml::table* const mixer = table_at(file, root, "mixer", { "plane_delay", "arrangement" }))
        read_mixer(file, *mixer, description);
    if (const toml::node* const faults = root.get("fault"))
        read_faults(file, *faults, description);
    return description;
}

/** The library follows dotted keys however deep they lead, and falls with what it has built; a key's depth is bounded
 *  by the length of its line. */
void check_lines(const File& file, std::string_view text)
{
    constexpr std::size_t longest = 4096;
    std::size_t number = 1;
    while (!text.empty())
    {
        const std::string_view line = text.substr(0, text.find('\n'));
        if (line.size() > longest)
            throw DescriptionError(file.path.string() + ":" + std::to_string(number) + ": a line is longer than " +
                                   std::to_string(longest) + " bytes");
        text.remove_prefix(std::min(line.size() + 1, text.size()));
        ++number;
    }
}

std::filesystem::path find_file(const std::filesystem::path& board)
{
    for (const auto& candidate : { board, board / "board.toml", boards_directory() / board / "board.toml" })
    {
        std::error_code error;
        if (!board.empty() && std::filesystem::is_regular_file(candidate, error))
            return candidate;
        const bool is_absent =
            !error || error == std::errc::no_such_file_or_directory || error == std::errc::not_a_directory;
        if (!board.empty() && !is_absent)
            throw DescriptionError("cannot read " + candidate.string() + ": " + error.message());
    }
    const std::vector<std::string> known = boards_by_name();
    throw DescriptionError("no such board: " + board.string() +
                           (known.empty() ? "; there is none in " + boards_directory().string()
                                          : suggestion(board.string(), { known.begin(), known.end() })));
}

} // namespace

std::vector<std::string> boards_by_name()
{
    std::vector<std::string> names;
    std::error_code error;
    std::error_code ignored;
    // Step by step: the loop over a range would throw where a step fails.
    for (std::filesystem::directory_iterator entry(boards_directory(), error), end; !error && entry != end;
         entry.increment(error))
    {
        if (std::filesystem::is_regular_file(entry->path() / "board.toml", ignored))
            names.push_back(entry->path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

void set_boards_directory(std::filesystem::path directory)
{
    boards_directory() = std::move(directory);
}

Description load_description(const std::filesystem::path& board)
{
    const File file{ find_file(board) };
    try
    {
        const std::string text = files::read(file.path, files::mebibyte);
        check_lines(file, text);
        return read(file, toml::parse(text, file.path.string()));
    }
    catch (const files::FileError& error)
    {
        throw DescriptionError(error.what());
    }
    catch (const toml::parse_error& error)
    {
        file.wrong(error.source(), std::string(error.description()));
    }
}

} // namespace board
