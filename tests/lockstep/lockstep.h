// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Two layers side by side: one operation is run by each, from the same state, with the same arguments, on a platform
 *  that answers both alike; what they did is then compared. Neither board nor time takes part: a platform function
 *  writes down what it is given and how the state stands at that moment, and answers by a number drawn for its turn.
 *
 *  Both layers are linked into one program, the names of the one behind `first_`, those of the other behind
 *  `second_`. What both have by name is written from the headers. */
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "tests/lockstep/values.h"

namespace lockstep
{

enum class Kind
{
    number,
    tag,
    text,
    symbol,
    values,
    list,
    data,
    table,
    place
};

struct Parameter
{
    const char* type;
    const char* name;
    Kind kind;
};

struct Function
{
    const char* name;
    const char* result; ///< its type
    const Parameter* parameters;
    unsigned count;
};

/** The platform's functions and a video plane's; a call names one by its index. */
extern const Function platform[];
extern const unsigned platform_count;

/** What the layer offers, in the header's order. */
struct Operation
{
    Function function;
    std::uint64_t (*run)(const void* entry, const std::uint64_t* arguments);
    const void* entries[2]; ///< in either layer; null where it has no such operation
    bool takes_null;        ///< its pointers may be null
};
extern const Operation operations[];
extern const unsigned operation_count;

/** Something that both layers have under the same name. */
struct Named
{
    const char* name;
    void* addresses[2];
};
extern const Named state_objects[];
extern const unsigned state_object_count;
extern const Named named_addresses[]; ///< where a pointer may lead that is handed over
extern const unsigned named_address_count;

/** What stands at the caller's: an array that an operation reads, and two places that it fills. */
inline constexpr std::size_t array_size = 112;
inline constexpr std::size_t place_size = 16;
inline constexpr std::size_t caller_size = array_size + 2 * place_size;

/** The layer's state and the caller's memory, one behind the other. */
using Image = std::vector<unsigned char>;

/** A single field of an image. */
struct Field
{
    std::string name;
    std::size_t offset;
    std::size_t size;
    Draw draw; ///< as its name says
};

/** Every single field of the state; the caller's memory stands behind the last of them. */
const std::vector<Field>& state_fields();
const Field& state_field(const std::string& name);
std::size_t caller_offset();
std::size_t image_size();

/** The fields of the array that an operation takes; none for most. */
const std::vector<Field>& array_fields(const Operation& operation);

/** What a byte of an image belongs to, by name; "padding behind …" for those of no field. */
std::string field_at(const Operation& operation, std::size_t offset);

std::uint64_t get(const unsigned char* image, const Field& field);
std::uint64_t get(const Image& image, const Field& field);
void set(Image& image, const Field& field, std::uint64_t value);

/** A field that a neighbour changes while the layer is inside a platform call. */
struct Disturbance
{
    unsigned call; ///< counted from 0; `never` for none
    std::size_t offset;
    std::size_t size;
    std::uint64_t value;
};
inline constexpr unsigned never = 0xFFFFFFFF;

/** What surrounds one run. */
struct Surroundings
{
    std::uint64_t seed = 0; ///< of the answers
    bool calm = false;      ///< every answer is the one that is usual
    Disturbance disturbance{ never, 0, 0, 0 };
};

inline constexpr std::size_t argument_limit = 16;
using Arguments = std::array<std::uint64_t, argument_limit>;

/** An argument as it was handed over: a number, or a pointer with what stood behind it. */
struct Given
{
    std::uint64_t value;
    std::uint32_t at; ///< of its bytes in Trace::bytes
    std::uint32_t size;
};

/** Classes of pointers: what they point at is told by name or by offset, never by address. */
inline constexpr std::uint64_t to_caller = 1ull << 32;
inline constexpr std::uint64_t to_state = 2ull << 32;
inline constexpr std::uint64_t to_elsewhere = 3ull << 32;
inline constexpr std::uint64_t to_named = 4ull << 32;

struct Call
{
    unsigned function;
    unsigned count; ///< of its arguments
    unsigned first; ///< of them in Trace::given
};

/** What one layer did. */
struct Trace
{
    std::vector<Call> calls;
    std::vector<Given> given;
    std::vector<unsigned char> bytes;
    std::vector<unsigned char> images; ///< one for each call, as the call found it
    std::uint64_t result = 0;
    Image after;
};

/** Run an operation in one of the layers. Pointers among the arguments are made by `point`. */
void run(const Operation& operation, unsigned layer, const Arguments& arguments, const Image& before,
         const Surroundings& surroundings, Trace& trace);

/** A pointer argument into the caller's memory. */
std::uint64_t point(std::size_t offset);

/** The number of an operation or platform function; fails the program when there is none. */
unsigned operation_number(const std::string& name);

} // namespace lockstep
