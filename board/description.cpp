// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The one place of the board that knows the TOML library: it compiles slowly.
#include <limits>
#include <sstream>
#include <toml++/toml.h>
#include <tuple>

#include "board/board_check.h"
#include "board/boards_directory.h"
#include "board/devices.h"
#include "board/digest.h"
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

/** { word = "RES_576P" }, or a number. */
std::uint32_t flash_word_at(const File& file, const toml::table& table, const std::string& partition)
{
    check_keys(file, table, { "word" }, " in flash partition " + partition);
    const toml::node* const word = table.get("word");
    if (word == nullptr)
        file.wrong(table.source(), "flash partition " + partition + " needs an image, or a word");
    const std::string what = "the word of flash partition " + partition;
    if (word->is_string())
        return resolution_mode_at(file, *word, what);
    return static_cast<std::uint32_t>(number_at(file, *word, what, 0, std::numeric_limits<std::uint32_t>::max()));
}

void read_flash(const File& file, const toml::table& flash, Description& description)
{
    for (const auto& [key, value] : flash)
    {
        const std::string name(key.str());
        if (value.is_table())
        {
            description.flash_words[name] = flash_word_at(file, *value.as_table(), name);
            continue;
        }
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
    if (const toml::node* const capability = mixer.get("capability"))
        description.capability = static_cast<std::uint32_t>(
            number_at(file, *capability, "capability of the mixer", 0, std::numeric_limits<std::uint32_t>::max()));
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

hdmi_av::Resolution resolution_at(const File& file, const toml::table& table, const std::string& key)
{
    const toml::node* const resolution = table.get("resolution");
    const toml::node* const frequency = table.get("frequency");
    if (resolution == nullptr || frequency == nullptr)
        file.wrong(table.source(), key + " needs resolution and frequency");
    const auto mode = resolution_mode_at(file, *resolution, "resolution of " + key);
    return { mode, static_cast<std::uint16_t>(number_at(file, *frequency, "frequency of " + key, 0, 65535)) };
}

/** As many as there are modes, in both families of refresh rates, are enough. */
void read_sink_modes(const File& file, const toml::node& node, Description& description)
{
    constexpr std::size_t most = 128;
    const toml::array* const list = node.as_array();
    if (list == nullptr || list->empty() || list->size() > most)
        file.wrong(node.source(), "modes of hdmi has to be a list of 1 to " + std::to_string(most) +
                                      " tables: { resolution = \"RES_720P60HZ\", frequency = 60 }");
    if (description.valid_resolution)
        file.wrong(node.source(), "hdmi takes valid or modes: what is valid is chosen whatever is asked");
    for (const toml::node& item : *list)
    {
        if (!item.is_table())
            file.wrong(item.source(), "a mode of hdmi has to be a table: { resolution = …, frequency = … }");
        check_keys(file, *item.as_table(), { "resolution", "frequency" }, " in modes of hdmi");
        description.sink_modes.push_back(resolution_at(file, *item.as_table(), "a mode of hdmi"));
    }
}

void read_hdmi(const File& file, const toml::table& hdmi, Description& description)
{
    if (const toml::node* const plugged = hdmi.get("plugged"))
        description.sink_plugged = switch_at(file, *plugged, "plugged of hdmi");
    if (const toml::node* const wanted = hdmi.get("request_resolution"))
        description.resolution_requested = switch_at(file, *wanted, "request_resolution of hdmi");
    if (const toml::table* const valid = table_at(file, hdmi, "valid", { "resolution", "frequency" }))
        description.valid_resolution = resolution_at(file, *valid, "valid of hdmi");
    if (const toml::node* const modes = hdmi.get("modes"))
        read_sink_modes(file, *modes, description);
}

/** A table of its own for each, and no name twice. */
sources::Id source_id_at(const File& file, const toml::table& table, const Description& description)
{
    const toml::node* const node = table.get("name");
    if (node == nullptr)
        file.wrong(table.source(), "a source needs a name");
    const std::string name = text_at(file, *node, "name of a source");
    const auto& known = sources::names();
    if (std::find(known.begin(), known.end(), name) == known.end())
        file.wrong(node->source(), "there is no source " + name + suggestion(name, known));
    for (const sources::Start& other : description.sources)
    {
        if (sources::name_of(other.id) == name)
            file.wrong(node->source(), name + " stands here twice");
    }
    return sources::find(name);
}

/** { width = 1920, height = 1080 } */
sources::Size size_at(const File& file, const toml::node& node)
{
    constexpr std::int64_t most = 65535;
    if (!node.is_table())
        file.wrong(node.source(), "size of a source has to be a table: { width = 1920, height = 1080 }");
    const toml::table& table = *node.as_table();
    check_keys(file, table, { "width", "height" }, " in size of a source");
    const toml::node* const width = table.get("width");
    const toml::node* const height = table.get("height");
    if (width == nullptr || height == nullptr)
        file.wrong(node.source(), "size of a source needs width and height");
    return { static_cast<INT32>(number_at(file, *width, "width of a source", 1, most)),
             static_cast<INT32>(number_at(file, *height, "height of a source", 1, most)) };
}

DRV_GFX_COLOR_MODE_T colour_at(const File& file, const toml::node& node)
{
    const std::string colour = text_at(file, node, "colour of a source");
    if (colour != "rgb" && colour != "ycbcr")
        file.wrong(node.source(), "colour of a source is rgb or ycbcr, not " + colour);
    return colour == "rgb" ? DRV_GFX_COLOR_MODE_RGB : DRV_GFX_COLOR_MODE_YCBCR;
}

void read_source(const File& file, const toml::node& node, Description& description)
{
    const toml::table* const table = node.as_table();
    if (table == nullptr)
        file.wrong(node.source(), "a source has to be a table: [[source]]");
    check_keys(file, *table, { "name", "size", "luma_key", "colour" }, " in [[source]]");
    sources::Start start{ source_id_at(file, *table, description) };
    const bool is_video = start.id.type == sources::Id::Type::VideoPlane;
    const toml::node* const luma_key = table->get("luma_key");
    const toml::node* const colour = table->get("colour");
    if (const toml::node* const size = table->get("size"))
        start.size = size_at(file, *size);
    if (luma_key != nullptr && (!is_video || !start.size))
        file.wrong(luma_key->source(), "a luma key goes with a video plane that has a size");
    if (luma_key != nullptr)
        start.luma_key = static_cast<UCHAR>(number_at(file, *luma_key, "luma_key of a source", 0, 255));
    if (colour != nullptr && (is_video || !start.size))
        file.wrong(colour->source(), "a colour goes with an OSD plane that has a size");
    if (!is_video && start.size && colour == nullptr)
        file.wrong(table->source(), "an OSD plane that has a size needs a colour: rgb or ycbcr");
    if (colour != nullptr)
        start.colour_mode = colour_at(file, *colour);
    description.sources.push_back(start);
}

void read_sources(const File& file, const toml::node& node, Description& description)
{
    const toml::array* const list = node.as_array();
    if (list == nullptr)
        file.wrong(node.source(), "source has to be a list of tables: [[source]]");
    for (const toml::node& item : *list)
        read_source(file, item, description);
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
    try
    {
        faults::check_all(description.faults);
    }
    catch (const std::invalid_argument& error)
    {
        file.wrong(node.source(), error.what());
    }
}

Description read(const File& file, const toml::table& root)
{
    check_keys(file, root,
               { "name", "console", "flash", "hdmi", "display_part", "mixer", "video_planes", "source", "fault" }, "");
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
    if (const toml::table* const hdmi =
            table_at(file, root, "hdmi", { "plugged", "request_resolution", "valid", "modes" }))
        read_hdmi(file, *hdmi, description);
    if (const toml::table* const part = table_at(file, root, "display_part", { "answer" }))
    {
        if (const toml::node* const answer = part->get("answer"))
            read_display_part(file, *answer, description);
    }
    if (const toml::table* const mixer = table_at(file, root, "mixer", { "capability", "plane_delay", "arrangement" }))
        read_mixer(file, *mixer, description);
    if (const toml::table* const planes = table_at(file, root, "video_planes", { "waiting_for_sync" }))
    {
        if (const toml::node* const waiting = planes->get("waiting_for_sync"))
            description.waiting_for_sync = switch_at(file, *waiting, "waiting_for_sync of video_planes");
    }
    if (const toml::node* const sources = root.get("source"))
        read_sources(file, *sources, description);
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
    return load_checked(board).description;
}

CheckedDescription load_checked(const std::filesystem::path& board)
{
    const File file{ find_file(board) };
    try
    {
        const std::string text = files::read(file.path, files::mebibyte);
        check_lines(file, text);
        const toml::table table = toml::parse(text, file.path.string());
        std::ostringstream said;
        said << table; // without comments, and laid out as all are
        return { read(file, table), digest_of(said.str()) };
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
