// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The chip's register space, and what its video PLL makes of it.
#include <array>
#include <map>
#include <optional>

#include "board/device_values.h"
#include "board/devices.h"

#include "u_os.h"

namespace
{

constexpr UINT32 control_a = 0xFD00003C;
constexpr UINT32 synthesiser = 0xFD000040;
constexpr UINT32 control_b = 0xFD000044;

enum class Change
{
    Store,
    Set,
    Clear
};

/** One write of the sequence that brings the PLL up. */
struct Step
{
    UINT32 address;
    Change change;
    UINT32 bits;
    bool settled; ///< a millisecond has passed since the write before
};

constexpr Step sequence[] = {
    { control_b, Change::Set, 0x7, false },    { synthesiser, Change::Store, 0, false },
    { control_a, Change::Set, 0x2, false },    { control_b, Change::Set, 0x4000, false },
    { control_a, Change::Set, 0x4, true },     { control_a, Change::Clear, 0x4, false },
    { synthesiser, Change::Set, 0x1, false },  { synthesiser, Change::Clear, 0x1, false },
    { control_a, Change::Set, 0x10000, true }, { control_b, Change::Set, 0x10, false },
};

struct Registers
{
    std::map<UINT32, UINT32> words; ///< what was never written reads 0
    unsigned reads = 0;
    unsigned writes = 0;
    unsigned load_pulses = 0;
    unsigned reset_pulses = 0;
    std::size_t next_step = 0;
    std::chrono::microseconds last_step{};
    unsigned complete_sequences = 0;
    unsigned broken_sequences = 0;
};

Registers registers_state;

UINT32 word_at(UINT32 address)
{
    const auto found = registers_state.words.find(address);
    return found != registers_state.words.end() ? found->second : 0;
}

bool is_step(const Step& step, UINT32 address, UINT32 before, UINT32 value)
{
    if (address != step.address ||
        (step.settled && board::now() - registers_state.last_step < std::chrono::milliseconds(1)))
        return false;
    switch (step.change)
    {
    case Change::Store: return true;
    case Change::Set: return value == (before | step.bits);
    case Change::Clear: return value == (before & ~step.bits);
    }
    return false;
}

/** Follows the PLL's three words; a write out of order breaks the sequence, and may begin the next one. */
void follow_pll(UINT32 address, UINT32 before, UINT32 value)
{
    Registers& state = registers_state;
    state.load_pulses += address == synthesiser && (before & 1) != 0 && (value & 1) == 0 ? 1 : 0;
    state.reset_pulses += address == control_a && (before & 4) != 0 && (value & 4) == 0 ? 1 : 0;
    if (!is_step(sequence[state.next_step], address, before, value))
    {
        state.broken_sequences += state.next_step != 0 ? 1 : 0;
        state.next_step = 0;
        if (!is_step(sequence[0], address, before, value))
            return;
    }
    state.last_step = board::now();
    if (++state.next_step == std::size(sequence))
    {
        state.next_step = 0;
        ++state.complete_sequences;
    }
}

board::Value family(UINT32 word)
{
    switch (word & ~UINT32{ 1 })
    {
    case 0x03D2F1AA: return board::Value::text("60 Hz family");
    case 0x03D1745E: return board::Value::text("50/24 Hz family");
    default: return board::Value::null();
    }
}

board::Value hex(UINT32 word)
{
    return board::Value::number(word, {}, board::Value::Base::Hex);
}

board::Value pll()
{
    const Registers& state = registers_state;
    const UINT32 a = word_at(control_a), b = word_at(control_b), word = word_at(synthesiser);
    board::Value value;
    value.add("synthesiser_word", hex(word));
    value.add("family", family(word));
    value.add("load_pulse_pending", board::flag((word & 1) != 0));
    value.add("reset_pulse_pending", board::flag((a & 4) != 0));
    value.add("load_pulses", board::Value::number(state.load_pulses));
    value.add("reset_pulses", board::Value::number(state.reset_pulses));
    value.add("powered", board::flag((b & 0x4007) == 0x4007 && (a & 0x2) != 0));
    value.add("enabled", board::flag((a & 0x10000) != 0 && (b & 0x10) != 0));
    value.add("complete_sequences", board::Value::number(state.complete_sequences));
    value.add("broken_sequences", board::Value::number(state.broken_sequences));
    value.add("steps_of_running_sequence", board::Value::number(static_cast<std::int64_t>(state.next_step)));
    return value;
}

bool reachable(UINT32 address, const char* function)
{
    if (address % 4 == 0)
        return true;
    board::report_misuse(std::string(function) + ": the address is no multiple of 4: " + hex(address).to_text());
    return false;
}

} // namespace

namespace board::registers
{

void power_on(const Description&)
{
    registers_state = {};
}

Value state()
{
    Value words = Value::record({});
    for (const auto& [address, word] : registers_state.words)
        words.add(hex(address).to_text(), hex(word));
    Value value;
    value.add("reads", Value::number(registers_state.reads));
    value.add("writes", Value::number(registers_state.writes));
    value.add("words", std::move(words));
    value.add("pll", pll());
    return value;
}

} // namespace board::registers

extern "C" {

UINT32 x_reg_read32(UINT32 u4Address)
try
{
    BOARD_CALL_R(x_reg_read32, u4Address);
    if (!reachable(u4Address, "x_reg_read32"))
        return boardCall.answer(0);
    ++registers_state.reads;
    return boardCall.answer(word_at(u4Address));
}
BOARD_CALL_END(x_reg_read32)

void x_reg_write32(UINT32 u4Address, UINT32 u4Value)
try
{
    BOARD_CALL(x_reg_write32, u4Address, u4Value);
    if (!reachable(u4Address, "x_reg_write32"))
        return;
    ++registers_state.writes;
    const UINT32 before = word_at(u4Address);
    registers_state.words[u4Address] = u4Value;
    if (u4Address == control_a || u4Address == synthesiser || u4Address == control_b)
        follow_pll(u4Address, before, u4Value);
}
BOARD_CALL_END(x_reg_write32)

} // extern "C"
