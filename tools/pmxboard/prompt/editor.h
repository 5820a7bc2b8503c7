// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where the shell's lines come from: a terminal, with history and completion, or anything else. */
#pragma once

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "tools/pmxboard/prompt/completion.h"

namespace pmxboard
{

class LineSource
{
public:
    LineSource() = default;
    LineSource(const LineSource&) = delete;
    LineSource& operator=(const LineSource&) = delete;
    virtual ~LineSource() = default;

    /** The next line; nothing at the end. */
    virtual std::optional<std::string> read() = 0;
    /** Keys that somebody else has read are the next to be read, where there is an editor. */
    virtual void take_back(const std::string&) {}
    /** Keep a line in the history. */
    virtual void remember(const std::string&) {}
};

struct EditorOptions
{
    std::string prompt;
    std::filesystem::path history; ///< empty: none is kept
    std::function<Completion(std::string_view line, std::size_t cursor)> complete;
};

/** An editor on the terminal. Without the editor's library it reads plain lines behind the prompt. */
std::unique_ptr<LineSource> make_editor(const EditorOptions& options);
/** The lines of the standard input as they come. */
std::unique_ptr<LineSource> make_plain_source();

/** Whether this build has an editor. */
bool has_editor();

} // namespace pmxboard
