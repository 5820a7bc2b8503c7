// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/support/layer_fixture.h"

#include <unistd.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

#include "board/threads.h"
#include "tools/record_view/record_view.h"
#include "tools/record_view/store_watch.h"

namespace
{

constexpr const char* boot_partition = "fast_init_param";

/** "record.ucMode" and "module.MutexPMX" by the names that record_view takes without their group. */
std::string field_name(const std::string& path)
{
    for (const std::string_view group : { "record.", "module." })
    {
        if (path.starts_with(group))
            return path.substr(group.size());
    }
    return path;
}

void compare(const std::string& path, const board::Value& before, const board::Value& now,
             std::vector<RecordSnapshot::Change>& changes)
{
    using Kind = board::Value::Kind;
    if (before == now)
        return;
    const bool nested = before.kind() == Kind::List || before.kind() == Kind::Record;
    if (!nested || before.kind() != now.kind() || before.items().size() != now.items().size())
    {
        changes.push_back({ field_name(path), before.to_text(), now.to_text() });
        return;
    }
    for (std::size_t i = 0; i < before.items().size(); ++i)
    {
        const std::string member = before.kind() == Kind::List ? path + "[" + std::to_string(i) + "]"
                                   : path.empty()              ? before.keys()[i]
                                                               : path + "." + before.keys()[i];
        compare(member, before.items()[i], now.items()[i], changes);
    }
}

std::vector<std::string> lines_of(const std::string& text)
{
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
    {
        const std::size_t first = line.find_first_not_of(" \t");
        if (first != line.npos)
            lines.push_back(line.substr(first));
    }
    return lines;
}

/** `mark` points at the line that is different; one behind the last: something is missing there. */
std::string listing(const char* title, const std::vector<std::string>& lines, std::size_t mark)
{
    std::string text = title;
    text += "\n";
    for (std::size_t i = 0; i < lines.size(); ++i)
        text += (i == mark ? "->  " : "    ") + lines[i] + "\n";
    if (mark == lines.size())
        text += "->  (nothing more)\n";
    return text;
}

testing::AssertionResult compare_entries(const std::vector<std::string>& expected,
                                         const std::function<bool(const board::TraceEntry&)>& admitted)
{
    std::vector<const board::TraceEntry*> entries;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (admitted(entry))
            entries.push_back(&entry);
    }

    std::string reason;
    std::size_t same = 0;
    try
    {
        while (same < expected.size() && same < entries.size() && entries[same]->matches(expected[same]))
            ++same;
    }
    catch (const std::invalid_argument& error)
    {
        reason = std::string("\nThe expected line is not well formed: ") + error.what();
    }
    if (same == expected.size() && same == entries.size())
        return testing::AssertionSuccess();

    std::vector<std::string> actual;
    for (const board::TraceEntry* const entry : entries)
        actual.push_back(entry->brief());
    return testing::AssertionFailure() << "The trace is different at line " << same + 1 << "." << reason << "\n"
                                       << listing("Expected:", expected, same) << listing("Actual:", actual, same);
}

testing::AssertionResult entries_are(const std::string& expected_lines,
                                     const std::function<bool(const board::TraceEntry&)>& admitted)
{
    board::trace::look();
    const testing::AssertionResult result = compare_entries(lines_of(expected_lines), admitted);
    board::trace::clear();
    return result;
}

std::vector<std::uint8_t> little_endian(std::uint32_t word)
{
    std::vector<std::uint8_t> bytes;
    for (unsigned shift = 0; shift < 32; shift += 8)
        bytes.push_back(static_cast<std::uint8_t>(word >> shift));
    return bytes;
}

bool is_notice(const board::TraceEntry& entry)
{
    return entry.kind == board::TraceEntry::Kind::Notice;
}

} // namespace

RecordSnapshot::RecordSnapshot() : m_state(record_view::state())
{
}

std::vector<RecordSnapshot::Change> RecordSnapshot::changes() const
{
    std::vector<Change> changes;
    compare("", m_state, record_view::state(), changes);
    return changes;
}

std::int64_t LayerTest::record(std::string_view field)
{
    const board::Value value = record_view::get(field);
    if (value.kind() != board::Value::Kind::Number && value.kind() != board::Value::Kind::Null)
        throw std::invalid_argument(std::string(field) + " is not a single field");
    return value.as_number();
}

void LayerTest::set_record(std::string_view field, std::int64_t number)
{
    record_view::set(field, number);
}

std::vector<std::string> LayerTest::notices()
{
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (is_notice(entry))
            lines.push_back(entry.brief());
    }
    return lines;
}

void LayerTest::SetUp()
{
    std::string directory = (std::filesystem::temp_directory_path() / "layer_test.XXXXXX").string();
    ASSERT_NE(nullptr, mkdtemp(directory.data()));
    m_directory = directory;
    description.flash[boot_partition] = write_image(little_endian(0x0000010C));
    board::power_on(description);
    board::trace::clear();
}

void LayerTest::TearDown()
{
    board::at_every_call({});
    check_reports();
    record_view::watch_stores(false);
    if (!m_directory.empty())
        std::filesystem::remove_all(m_directory);
}

void LayerTest::fail(const char* function, std::int64_t answer)
{
    board::faults::set({ function, answer, board::Fault::When::Always });
}

void LayerTest::watch_stores()
{
    record_view::watch_stores(true);
}

void LayerTest::check_reports()
{
    board::threads::end_all();
    EXPECT_NO_THROW(board::meanwhiles::rethrow_failure());
    for (const auto& armed : board::meanwhiles::armed())
        ADD_FAILURE() << "never happened: " << armed.name << ", after " << armed.calls << " calls";
    board::meanwhiles::forget_all();
    EXPECT_EQ(m_asserts, board::asserts()) << "failed assertions since power-on";
    EXPECT_EQ(m_misuses, board::misuses()) << "misuses of the platform since power-on";
    m_asserts = 0;
    m_misuses = 0;
}

void LayerTest::power_on()
{
    check_reports();
    board::power_on(description);
    board::trace::clear();
}

void LayerTest::started()
{
    PMX_Init();
    board::trace::clear();
}

void LayerTest::boot_word(std::uint32_t word)
{
    boot_image(little_endian(word));
}

void LayerTest::boot_image(const std::vector<std::uint8_t>& bytes)
{
    description.flash[boot_partition] = write_image(bytes);
    board::set_flash(boot_partition, description.flash[boot_partition]);
}

std::filesystem::path LayerTest::write_image(const std::vector<std::uint8_t>& bytes) const
{
    std::filesystem::path path = m_directory / "fast_init_param.bin";
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    std::copy(bytes.begin(), bytes.end(), std::ostreambuf_iterator<char>(file));
    file.close();
    if (!file)
        throw std::runtime_error("cannot write " + path.string());
    return path;
}

void LayerTest::no_boot_partition()
{
    description.flash.erase(boot_partition);
    board::set_flash(boot_partition, {});
}

void LayerTest::at_call(std::string function, std::function<void()> action)
{
    board::at_every_call([function = std::move(function), action = std::move(action)](const board::TraceEntry& entry) {
        if (entry.function == function)
            action();
    });
}

testing::AssertionResult layer_test::trace_is(const char*, const std::string& lines)
{
    return entries_are(lines, [](const board::TraceEntry& entry) { return !is_notice(entry); });
}

testing::AssertionResult layer_test::calls_are(const char*, const std::string& lines)
{
    using Kind = board::TraceEntry::Kind;
    return entries_are(lines, [](const board::TraceEntry& entry) {
        return !is_notice(entry) && entry.kind != Kind::Log && entry.function != "x_reg_read32";
    });
}

testing::AssertionResult layer_test::changed_are(const char*, const char*, const RecordSnapshot& before,
                                                 const std::vector<std::string>& fields)
{
    std::string wrong;
    std::vector<std::string> missing = fields;
    for (const RecordSnapshot::Change& change : before.changes())
    {
        const auto expected = std::find(missing.begin(), missing.end(), change.field);
        if (expected == missing.end())
            wrong += "    " + change.field + " changed from " + change.before + " to " + change.now + "\n";
        else
            missing.erase(expected);
    }
    for (const std::string& field : missing)
    {
        wrong += "    " + field + " did not change";
        wrong += record_view::has(field) ? "\n" : ": there is no such field\n";
    }
    if (wrong.empty())
        return testing::AssertionSuccess();
    return testing::AssertionFailure() << "The layer's record is not as expected:\n" << wrong;
}
