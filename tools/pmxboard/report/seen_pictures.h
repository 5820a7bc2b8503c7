// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What is seen on the outputs now, as pictures for a page. A tool that was built without pictures sees none. */
#pragma once

#include <cstddef>
#include <deque>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace board::picture
{
struct Hardware;
}

namespace pmxboard
{

struct SeenOutput
{
    std::string name;        ///< "HDMI"
    std::string description; ///< "1920x1080", or why nothing is seen
    std::size_t picture = 0; ///< its place in all()
};

/** A picture that was seen before is kept once. */
class SeenPictures
{
public:
    /** Whether this tool was built with pictures. */
    static bool can_look();

    /** Each output, in the layer's order. What was looked at of late is not computed again. */
    std::vector<SeenOutput> look();

    /** How often pictures were computed. */
    unsigned looks() const { return m_looks; }

    /** The bytes of PNG files. */
    const std::vector<std::string>& all() const { return m_all; }

private:
    /** What the hardware was, and what was seen then. */
    struct Looked
    {
        std::shared_ptr<const board::picture::Hardware> hardware;
        std::vector<SeenOutput> seen;
    };

    std::size_t place_of(std::string png);

    std::vector<std::string> m_all;
    std::map<std::size_t, std::vector<std::size_t>> m_places; ///< by a hash of the bytes
    std::deque<Looked> m_looked;                              ///< the last ones, the latest first
    unsigned m_looks = 0;
};

} // namespace pmxboard
