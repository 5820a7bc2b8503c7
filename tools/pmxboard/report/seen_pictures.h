// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What is seen on the outputs now, as pictures for a page. A tool that was built without pictures sees none. */
#pragma once

#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace pmxboard
{

struct SeenOutput
{
    std::string name;                   ///< "HDMI"
    std::string description;            ///< "1920x1080", or why nothing is seen
    std::optional<std::size_t> picture; ///< its place in all()
};

/** A picture that was seen before is kept once. */
class SeenPictures
{
public:
    /** Each output, in the layer's order. */
    std::vector<SeenOutput> look();

    /** The bytes of PNG files. */
    const std::vector<std::string>& all() const { return m_all; }

private:
    std::size_t place_of(std::string png);

    std::vector<std::string> m_all;
    std::map<std::string, std::size_t> m_places; ///< by the bytes
};

} // namespace pmxboard
