// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The page that shows a storyboard. It holds all that it needs, and asks for nothing: it opens from a file. */
#pragma once

#include <string>
#include <string_view>

namespace pmxboard
{

/** What is shown around the data; written from page.html, page.css and page.js when the tool is built. */
extern const std::string_view page_template;

/** The page with this data, one JSON document. */
std::string page_with(std::string_view json);

} // namespace pmxboard
