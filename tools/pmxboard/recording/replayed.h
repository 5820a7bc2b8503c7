// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer that recordings are replayed with, and the platform below it: what recorder/write_replay.py writes from
 *  the headers, and what that is written with. */
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "x_typedef.h"

namespace pmxboard
{

/** What was behind a pointer of an operation's arguments, where the operation may write. */
class Bytes
{
public:
    Bytes() = default;
    explicit Bytes(std::span<const UINT32> words, std::size_t size);

    void* pointer() { return m_is_null ? nullptr : m_content.data(); }
    /** For what is written whatever the pointer is: where it is null, a place that keeps whether that was done. */
    void* pointer_or_spare();
    bool is_spare_written() const;
    const char* text() { return static_cast<const char*>(pointer()); }
    void put_into(std::vector<UINT32>& words) const;

private:
    // More than any operation takes or is given: a recording that says less of it is no danger.
    std::array<UINT32, 160> m_content{};
    std::size_t m_size = 0;
    bool m_is_null = true;
};

/** The recorded arguments of an operation, one behind the other. What is missing is 0. */
class Given
{
public:
    explicit Given(std::span<const UINT32> words) : m_words(words) {}

    UINT32 number();
    Bytes bytes();
    /** What goes with a format; texts stay as long as this. */
    std::vector<long> values(const char* format);
    /** Behind the operation: whether this pointer is null, and was written behind. */
    void note_loss(std::string_view parameter, const Bytes& behind);
    /** The parameter of which that was noted, or nothing. */
    std::string_view loss() const { return m_loss; }

private:
    std::span<const UINT32> m_words;
    std::size_t m_at = 0;
    std::string_view m_loss;
    std::vector<Bytes> m_texts;
};

/** What the platform answered. */
struct Answer
{
    UINT32 number = ~UINT32{ 0 }; ///< where nothing is known any more: a failure
    std::span<const UINT32> written;

    void write(void* place, std::size_t size);
    void write_text(char* place, std::size_t size);
    void write_table(void** place, const void* table);
    void write_tag(void** place);

private:
    std::span<const UINT32> next(std::size_t words);
};

struct DescribedParameter
{
    std::string name;
    std::string kind; ///< see tools/cost/signatures.py
};

struct Described
{
    std::string name;
    bool has_result;
    bool tells_texts; ///< texts are recorded by where they stand, and told apart
    std::vector<DescribedParameter> parameters;
};

/** What it answers leads to a table through which the layer calls. */
bool hands_out_table(const Described& function);

struct ReplayedOperation
{
    Described described;
    UINT32 (*run)(Given& given, std::vector<UINT32>& written);
};

struct Variable
{
    std::string name;
    unsigned char* address;
    std::size_t size;
    std::size_t offset; ///< in a recorded state
};

struct ReplayedLayer
{
    UINT32 interface;
    std::size_t exported_size;
    std::size_t state_size;
    const std::vector<ReplayedOperation>& operations;
    const std::vector<Described>& functions;
    const std::vector<Variable>& variables;
};

/** The layer of this program; throws std::runtime_error when it was linked without one. */
const ReplayedLayer& replayed_layer();

/** Where the platform's stand-ins ask what was answered. */
struct Replay
{
    static Answer call(unsigned function, const UINT32* words, unsigned count, unsigned reserved);
    /** What was answered is written; returns when nothing else comes before what the layer does next. */
    static void go_on();
};

} // namespace pmxboard
