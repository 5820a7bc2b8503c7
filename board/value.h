// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A plain value tree: what the trace records about arguments and what devices report about their state. */
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace board
{

class Value
{
public:
    enum class Kind
    {
        Null,   ///< a null pointer, an absent thing
        Number, ///< a number, with its symbolic name where it has one
        Text,
        List,
        Record, ///< named members in a fixed order
        Symbol  ///< an object known by name alone: a function, a table
    };

    /** How a number is printed when it has no name. */
    enum class Base
    {
        Decimal,
        Hex
    };

    Value() = default;
    static Value null() { return {}; }
    static Value number(std::int64_t number, std::string_view name = {}, Base base = Base::Decimal);
    static Value text(std::string text);
    static Value symbol(std::string name);
    static Value list(std::vector<Value> items);
    static Value record(std::vector<std::pair<std::string, Value>> members);

    /** Names of members, for many records to have in common. */
    class Names
    {
    public:
        /** Throws std::logic_error when one is there twice. */
        explicit Names(std::vector<std::string> names);

    private:
        friend class Value;
        std::shared_ptr<std::vector<std::string>> m_names;
    };
    /** A record with these names: an item for each. */
    static Value record(const Names& names, std::vector<Value> items);

    Kind kind() const { return m_kind; }
    std::int64_t as_number() const { return m_number; }
    Base base() const { return m_base; }
    /** Symbolic name of a number, text of a text, name of a symbol. */
    const std::string& string() const { return m_string; }
    const std::vector<Value>& items() const;
    const std::vector<std::string>& keys() const;

    /** Append a member to a record (a null value becomes an empty record first). */
    Value& add(std::string key, Value value);
    /** Member at a dotted path ("os.mutexes[0].held"); null pointer when there is none. */
    const Value* find(std::string_view path) const;

    /** For people: RES_480P, 0x108080, "text", [1, 2], {a=1}, null. */
    std::string to_text() const;
    /** Whether a token written by a person means this value: a number in any base, a symbolic name, "*", a quoted text
     *  with escapes, a list or record of such tokens; a record may leave members out where "…" or "..." stands. */
    bool matches(std::string_view token) const;
    /** JSON, in the form that json.h describes. indent < 0: on one line. */
    std::string to_json(int indent = -1) const;

    bool operator==(const Value& other) const;

private:
    /** What a list or a record holds: copies have it in common, for whole states are copied at every command. */
    struct Held
    {
        std::vector<Value> items;
        std::shared_ptr<std::vector<std::string>> keys; ///< of a record
    };
    Held& held_alone();

    Kind m_kind = Kind::Null;
    Base m_base = Base::Decimal;
    std::int64_t m_number = 0;
    std::string m_string;
    std::shared_ptr<Held> m_held; ///< none: nothing is held
};

/** Text in double quotes with \n, \t, \", \\ and \xNN escapes. */
std::string quote(std::string_view text);
/** The reverse of quote; throws std::invalid_argument. */
std::string unquote(std::string_view quoted);

} // namespace board
