// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a mixer's life: operations with any arguments, drivers that answer anything, sources that come and go.
// The first byte tells whether drivers keep their contracts.
#include <cstddef>
#include <cstdint>
#include <span>

#include "board/board.h"
#include "fuzz/support/holds.h"
#include "tools/soak/drawn_steps.h"

namespace
{

using namespace soak;

constexpr unsigned most_steps = 16;

/** As many bytes as a choice needs; behind the last one everything is 0. */
class Bytes : public Choices
{
public:
    explicit Bytes(std::span<const std::uint8_t> bytes) : m_bytes(bytes) {}

    bool are_left() const { return !m_bytes.empty(); }
    std::uint64_t any() override { return number_of(sizeof(std::uint32_t)); }
    std::uint64_t below(std::uint64_t count) override
    {
        std::size_t size = 0;
        for (std::uint64_t rest = count - 1; rest != 0; rest >>= 8)
            ++size;
        return number_of(size) % count;
    }

private:
    std::uint64_t number_of(std::size_t size)
    {
        std::uint64_t number = 0;
        for (std::size_t i = 0; i < size && are_left(); ++i)
        {
            number = number << 8 | m_bytes.front();
            m_bytes = m_bytes.subspan(1);
        }
        return number;
    }

    std::span<const std::uint8_t> m_bytes;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    Bytes bytes({ data, size });
    const Life life = bytes.once_in(2) ? Life::Calm : Life::Unruly;
    begin_life(bytes);
    for (unsigned step = 0; bytes.are_left() && step < most_steps; ++step)
        draw_step(bytes, life);
    fuzz::must(life == Life::Unruly || board::misuses() == 0, "nobody misuses the platform who need not");
    return 0;
}
