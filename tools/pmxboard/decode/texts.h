/** @file
 *  Every text that the layer writes to the console, each with what it means: the one table that recognition, the story
 *  and the comparison stand on. A test holds it against the texts in the layer's object. */
#pragma once

#include <span>
#include <string_view>
#include <vector>

namespace pmxboard::decode
{

/** What the story makes of a text. */
enum class Role
{
    Opens, ///< an operation begins
    Head,  ///< begins an operation, unless it is part of the one that is running
    Part,  ///< goes on with an operation
    ModeEx,
    Output, ///< one of the four outputs that are asked for
    Port,   ///< set-up of the digital port that is asked for
    Fifth,  ///< the fifth OSD plane that is asked for
    NotWait,
    HeldBack,
    Flag,    ///< the display part's flag
    OsdFlag, ///< whether graphics wait for their return
    OsdBack, ///< graphics may return
    TimedOut,
    TimerSet,
    Ready,
    Report,    ///< a line of the status report
    Assertion, ///< an expression that did not hold
    SourceFile ///< what an assertion names beside its expression
};

/** Levels of what PMX_IsLog does not print. */
constexpr int level_plain = -1;     ///< Printf, UTIL_Printf: whatever the console's level is
constexpr int level_assertion = -2; ///< an assertion, the same

struct Text
{
    Role role;
    bool problem; ///< says that something went wrong
    int level;
    std::string_view format;
    std::string_view values;     ///< their names, with commas between
    std::string_view operations; ///< the one that prints it, and then those that come there; with commas between
    std::string_view step;       ///< what it says of the operation's progress
    std::string_view tale;       ///< its sentence in the story, {name} standing for a value; empty: none of its own
};

/** The table. Texts that differ in blanks at their end alone stand one after the other. */
std::span<const Text> texts();

/** What %s prints in these texts, and a name that the layer looks up in flash: with the formats all texts of the
 *  layer's object. */
std::span<const std::string_view> value_texts();
std::span<const std::string_view> other_texts();

/** The items of a list with commas. */
std::vector<std::string_view> split(std::string_view list);
/** Whether a list with commas has an item. */
bool has(std::string_view list, std::string_view item);

/** What the console shows of a format: without blanks and line ends behind it. */
std::string_view visible(std::string_view format);

} // namespace pmxboard::decode
