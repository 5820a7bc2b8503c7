// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/recording/recorded_run.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <stdexcept>
#include <vector>

#include "board/board.h"
#include "board/threads.h"
#include "recorder/pmx_recorder.h"

// Not in every program that has the tool's library.
#pragma weak fgPmxRecorderStart
#pragma weak PMX_RecorderStop

namespace pmxboard
{
namespace
{

UINT32 recorder_time()
{
    return static_cast<UINT32>(board::now().count());
}

UINT32 recorder_thread()
{
    constexpr UINT32 most = 254;
    return std::min<UINT32>(board::threads::context().number, most);
}

/** While it exists the layer is recorded. */
class RecorderOn
{
public:
    explicit RecorderOn(std::vector<UINT32>& memory)
    {
        if (fgPmxRecorderStart == nullptr)
            throw std::runtime_error("this program was linked without a recorder");
        const PMX_RECORDER_SETUP_T setup{ memory.data(), static_cast<UINT32>(4 * memory.size()),
                                          recorder_time, recorder_thread,
                                          1000,          TRUE };
        if (fgPmxRecorderStart(&setup) == FALSE)
            throw std::runtime_error("the recorder's memory is too small");
    }
    ~RecorderOn() { PMX_RecorderStop(); }
    RecorderOn(const RecorderOn&) = delete;
    RecorderOn& operator=(const RecorderOn&) = delete;
};

} // namespace

std::string recorded(std::uint32_t size, const std::function<void()>& meanwhile)
{
    std::vector<UINT32> memory(PMX_RECORDER_MEMORY(size) / 4);
    {
        const RecorderOn on(memory);
        meanwhile();
    }
    PMX_RECORDER_T header;
    std::memcpy(&header, memory.data(), sizeof header);
    const std::size_t texts = PMX_RECORDER_TEXTS * sizeof(PMX_RECORDER_TEXT_T);
    const std::size_t given = PMX_RECORDER_MEMORY(4 * std::size_t{ header.u4RingWords });
    header.u4RingWords = std::min(header.u4RingWords, std::max(std::bit_ceil(header.u4Head), PMX_RECORDER_LEAST_WORDS));
    std::string bytes(PMX_RECORDER_MEMORY(4 * std::size_t{ header.u4RingWords }), '\0');
    const auto* const from = reinterpret_cast<const char*>(memory.data());
    std::memcpy(bytes.data(), &header, sizeof header);
    std::memcpy(bytes.data() + sizeof header, from + sizeof header, bytes.size() - sizeof header - texts);
    std::memcpy(bytes.data() + bytes.size() - texts, from + given - texts, texts);
    return bytes;
}

} // namespace pmxboard
