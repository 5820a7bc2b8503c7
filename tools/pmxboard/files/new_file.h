// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How the tool writes files: whole or not at all, and never over what it reads. */
#pragma once

#include <memory>
#include <ostream>
#include <string>
#include <string_view>

namespace pmxboard
{

/** A file that takes its name when it is complete; until then, and for good when it never is, whoever had the name
 *  before keeps it. What is no plain file, a pipe or a device, is written to as it is. */
class NewFile
{
public:
    enum class Over
    {
        OutputsAlone, ///< what this process reads is refused
        Anything
    };

    /** What becomes of it when the program is ended before it is complete. */
    enum class Unfinished
    {
        Removed,
        Kept ///< beside it, under a name that says so, unless it is ended by Ctrl-C: see remember_temporary()
    };

    /** Throws board::files::FileError. */
    explicit NewFile(const std::string& name, Over over = Over::OutputsAlone,
                     Unfinished unfinished = Unfinished::Removed);
    ~NewFile();
    NewFile(const NewFile&) = delete;
    NewFile& operator=(const NewFile&) = delete;

    std::ostream& stream();
    /** It is complete. Throws board::files::FileError when any of it could not be written. */
    void commit();

private:
    class Buffer;

    void refuse_input() const;
    void create_beside(Unfinished unfinished);
    [[noreturn]] void failed(int error) const;

    std::string m_name; ///< as the user wrote it
    Over m_over;
    std::string m_target;    ///< the same behind symbolic links
    std::string m_temporary; ///< empty: written to as it is
    std::unique_ptr<Buffer> m_buffer;
    std::unique_ptr<std::ostream> m_stream;
};

/** A whole file at once. Throws board::files::FileError. */
void write_file(const std::string& name, std::string_view text);

} // namespace pmxboard
