// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The status report, put together from whichever of its lines a log has, with its misleading parts put right. */
#pragma once

#include <array>
#include <map>
#include <string>
#include <vector>

#include <nlohmann/json_fwd.hpp>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

class StatusReport
{
public:
    /** Whether a line of a report can belong to this one; if not, it begins another. */
    bool wants(const Item& item);
    void add(const Item& item);

    /** In words, one subject a line. */
    std::vector<std::string> words() const;
    /** For programs: the fields by their names in the record. */
    nlohmann::ordered_json json() const;

private:
    class Fields : public std::map<std::string, std::string, std::less<>>
    {
    public:
        /** As printed; a question mark for what no line had. */
        std::string get(std::string_view name) const;
        bool is(std::string_view name, std::string_view printed) const { return get(name) == printed; }
        /** A sentence with these fields for its names. */
        std::string say(std::string_view with_names) const;
        /** The same; nothing when no line had the needed field. */
        std::string say_if(std::string_view needed, std::string_view with_names) const;
    };

    Fields* group(const Item& item);
    void tell_record(std::vector<std::string>& lines) const;
    void tell_picture(std::vector<std::string>& lines) const;
    void tell_order(std::vector<std::string>& lines) const;
    void tell_ports(std::vector<std::string>& lines) const;
    void tell_outputs(std::vector<std::string>& lines) const;
    static std::string mode_of(const Fields& output);

    bool m_external_line = false;
    Fields m_record;
    Fields m_order; ///< by position
    std::array<Fields, 8> m_ports;
    std::array<Fields, 4> m_outputs;
};

} // namespace pmxboard::decode
