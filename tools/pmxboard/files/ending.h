// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How the program ends when something ends it: in good order, and with a line that says where it was. */
#pragma once

#include <signal.h>

#include <string>
#include <string_view>

namespace pmxboard
{

/** From now on: a reader that has gone away ends the program quietly; an interrupt removes what is unfinished and ends
 *  it as one does; a full disk is an error of the write that met it; what breaks down is told, and is a failed step. */
void end_in_order();

/** Where the program is: what a breakdown is told with. */
void set_place(std::string_view place);
std::string current_place();

/** In a copy of the process that is to die as it would by itself: its parent tells it. */
void end_as_it_comes();

/** An unfinished file, to be removed when the program is ended. There are few at a time. One whose rest can be written
 *  is kept, and told, when the program breaks down or somebody else ends it: it shows how far things went.
 *  @param write_rest  of system calls alone: it runs in a signal handler; null: the file is removed in any case */
void remember_temporary(const char* name, void (*write_rest)(void* writer) = nullptr, void* writer = nullptr);
void forget_temporary(const char* name);

/** As long as there is one, who interrupts the program waits: a file that has been made is remembered first. */
class InterruptsWait
{
public:
    InterruptsWait();
    ~InterruptsWait();
    InterruptsWait(const InterruptsWait&) = delete;
    InterruptsWait& operator=(const InterruptsWait&) = delete;

private:
    sigset_t m_before{};
};

} // namespace pmxboard
