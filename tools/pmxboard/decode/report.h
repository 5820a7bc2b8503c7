/** @file
 *  The status report, put together from whichever of its lines a log has, with its misleading parts put right. */
#pragma once

#include <array>
#include <map>
#include <string>
#include <vector>

#include "board/value.h"
#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

class StatusReport
{
public:
    /** Whether a line of a report can belong to this one; if not, it begins another. */
    bool wants(const Item& item) const;
    void add(const Item& item);

    std::size_t lines_seen() const { return m_lines; }
    /** In words, one subject a line. */
    std::vector<std::string> words() const;
    /** For programs: the fields by their names in the record. */
    board::Value value() const;

private:
    using Fields = std::map<std::string, std::string, std::less<>>;
    static constexpr std::size_t positions = 8;
    static constexpr std::size_t ports = 8;
    static constexpr std::size_t outputs = 4;

    /** The fields that a line belongs to; null for an index that does not exist. */
    template <typename Report>
    static auto* group(Report& report, const Item& item);
    void record_words(std::vector<std::string>& lines) const;
    void picture_words(std::vector<std::string>& lines) const;
    void order_words(std::vector<std::string>& lines) const;
    void port_words(std::vector<std::string>& lines) const;
    void output_words(std::vector<std::string>& lines) const;
    std::string output_mode_words(const Fields& output) const;

    std::size_t m_lines = 0;
    bool m_external_line = false;
    Fields m_record;
    Fields m_order; ///< by position
    std::array<Fields, ports> m_ports;
    std::array<Fields, outputs> m_outputs;
};

} // namespace pmxboard::decode
