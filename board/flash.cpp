// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Flash partitions: each is an image file, read anew at every call.
#include "board/flash.h"

#include <algorithm>
#include <charconv>
#include <fstream>
#include <iterator>
#include <map>
#include <optional>
#include <stdexcept>
#include <string_view>
#include <utility>
#include <vector>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/digest.h"
#include "board/files.h"

#include "u_os.h"

namespace
{

using board::Value;

struct Partition
{
    std::string name; ///< empty: removed, so that the ids of the others stay
    std::filesystem::path image;
    unsigned reads = 0;
    std::optional<std::uint32_t> word{}; ///< in place of an image
};

struct Flash
{
    std::vector<Partition> partitions; ///< a partition's id is its index
    unsigned failed_reads = 0;
};

Flash flash_state;

/** All that is asked for, or nothing. The layer's caller knows no exceptions: whatever is wrong with the file, to it
 *  the device has failed. */
bool read_image(const std::filesystem::path& image, UINT32 offset, UINT32 count, void* into)
try
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(image, error))
        return false;
    const std::uintmax_t size = std::filesystem::file_size(image, error);
    if (error || size < std::uintmax_t{ offset } + count)
        return false;
    std::ifstream file(image, std::ios::binary);
    file.seekg(offset);
    std::vector<char> content(count);
    if (!file.read(content.data(), static_cast<std::streamsize>(content.size())))
        return false;
    std::copy(content.begin(), content.end(), static_cast<char*>(into));
    return true;
}
catch (const std::exception&)
{
    return false;
}

std::vector<char> bytes_of(std::uint32_t word)
{
    std::vector<char> bytes;
    for (unsigned shift = 0; shift < 32; shift += 8)
        bytes.push_back(static_cast<char>(word >> shift & 0xFF));
    return bytes;
}

bool read_word(std::uint32_t word, UINT32 offset, UINT32 count, void* into)
{
    const std::vector<char> bytes = bytes_of(word);
    if (std::uintmax_t{ offset } + count > bytes.size())
        return false;
    std::copy_n(bytes.begin() + offset, count, static_cast<char*>(into));
    return true;
}

bool read_partition(const Partition& partition, UINT32 offset, UINT32 count, void* into)
{
    return partition.word ? read_word(*partition.word, offset, count, into)
                          : read_image(partition.image, offset, count, into);
}

Value size_of(const Partition& partition)
{
    if (partition.word)
        return Value::number(sizeof *partition.word);
    std::error_code error;
    const auto size = std::filesystem::file_size(partition.image, error);
    return error ? Value::null() : Value::number(static_cast<std::int64_t>(size));
}

/** What an image holds, in a few characters. It is read again when it has changed, for the state is asked for often. */
Value content_of(const Partition& partition)
try
{
    using Version = std::pair<std::filesystem::file_time_type, std::uintmax_t>;
    static std::map<std::filesystem::path, std::pair<Version, Value>> known;
    if (partition.word)
        return Value::null();
    const Version version{ std::filesystem::last_write_time(partition.image),
                           std::filesystem::file_size(partition.image) };
    auto found = known.find(partition.image);
    if (found == known.end() || found->second.first != version)
    {
        const Value content = Value::text(board::digest_of(board::files::read(partition.image)));
        found = known.insert_or_assign(partition.image, std::pair(version, content)).first;
    }
    return found->second.second;
}
catch (const std::exception&)
{
    return Value::null(); // reading it fails for the layer, too
}

std::string image_of(const Partition& partition)
{
    return partition.word ? "word " + Value::number(*partition.word, {}, Value::Base::Hex).to_text()
                          : partition.image.string();
}

} // namespace

namespace board
{

void set_flash_word(std::string partition, std::uint32_t word)
{
    if (partition.empty())
        throw std::invalid_argument("a flash partition has a name");
    auto& partitions = flash_state.partitions;
    const auto found = std::find_if(partitions.begin(), partitions.end(),
                                    [&](const Partition& known) { return known.name == partition; });
    if (found != partitions.end())
        found->word = word;
    else
        partitions.push_back({ std::move(partition), {}, 0, word });
}

void set_flash(std::string partition, std::filesystem::path image)
{
    if (partition.empty())
        throw std::invalid_argument("a flash partition has a name");
    std::error_code error;
    if (!image.empty() && !std::filesystem::is_regular_file(image, error))
        throw std::invalid_argument("flash partition " + partition + ": no such image file: " + image.string());
    files::note_input(image);
    auto& partitions = flash_state.partitions;
    const auto found = std::find_if(partitions.begin(), partitions.end(),
                                    [&](const Partition& known) { return known.name == partition; });
    if (image.empty())
    {
        if (found != partitions.end())
            *found = {};
    }
    else if (found != partitions.end())
    {
        found->image = std::move(image);
        found->word.reset();
    }
    else
        partitions.push_back({ std::move(partition), std::move(image), 0, {} });
}

namespace flash
{

void power_on(const Description& description)
{
    flash_state = {};
    for (const auto& [name, image] : description.flash)
    {
        files::note_input(image);
        flash_state.partitions.push_back({ name, image, 0, {} });
    }
    for (const auto& [name, word] : description.flash_words)
        flash_state.partitions.push_back({ name, {}, 0, word });
    std::sort(flash_state.partitions.begin(), flash_state.partitions.end(),
              [](const Partition& one, const Partition& other) { return one.name < other.name; });
}

Value state()
{
    std::vector<Value> partitions;
    for (std::size_t id = 0; id < flash_state.partitions.size(); ++id)
    {
        const Partition& partition = flash_state.partitions[id];
        if (partition.name.empty())
            continue;
        Value value;
        value.add("id", Value::number(static_cast<std::int64_t>(id)));
        value.add("name", Value::text(partition.name));
        value.add("image", Value::text(image_of(partition)));
        value.add("size", size_of(partition));
        value.add("content", content_of(partition));
        value.add("reads", Value::number(partition.reads));
        partitions.push_back(std::move(value));
    }
    Value value;
    value.add("partitions", Value::list(std::move(partitions)));
    value.add("failed_reads", Value::number(flash_state.failed_reads));
    return value;
}

} // namespace flash
} // namespace board

extern "C" {

INT32 get_part_id_by_name(const CHAR* szName)
try
{
    BOARD_CALL_R(get_part_id_by_name, text(szName));
    for (std::size_t id = 0; szName != nullptr && id < flash_state.partitions.size(); ++id)
    {
        if (!flash_state.partitions[id].name.empty() && flash_state.partitions[id].name == szName)
            return boardCall.answer(static_cast<INT32>(id));
    }
    return boardCall.answer(-1);
}
BOARD_CALL_END(get_part_id_by_name)

INT32 i4NFBPartitionRead(INT32 i4PartId, UINT32 u4Offset, void* pvDest, UINT32 u4Count)
try
{
    BOARD_CALL_R(i4NFBPartitionRead, i4PartId, u4Offset, bytes(pvDest, u4Count), u4Count);
    auto& partitions = flash_state.partitions;
    const auto id = static_cast<std::size_t>(i4PartId);
    if (pvDest == nullptr)
        board::report_misuse("i4NFBPartitionRead: the destination is a null pointer");
    // The result has to be able to tell the number of bytes.
    const bool readable = pvDest != nullptr && u4Count <= 0x7FFFFFFFu && i4PartId >= 0 && id < partitions.size() &&
                          !partitions[id].name.empty();
    if (readable && read_partition(partitions[id], u4Offset, u4Count, pvDest))
    {
        ++partitions[id].reads;
        return boardCall.answer(static_cast<INT32>(u4Count));
    }
    ++flash_state.failed_reads;
    return boardCall.fail(-1);
}
BOARD_CALL_END(i4NFBPartitionRead)

} // extern "C"
