// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The virtual board: what tools and tests may do to it. There is one in a process, and one thread uses it; threads of
 *  the board's own world run by turns, see threads.h. */
#pragma once

#if __cplusplus < 202002L
#error "the board's headers are C++20: compile with -std=c++20; C programs include board/board_c.h"
#endif

#include <array>
#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "board/display_part.h"
#include "board/hdmi_av.h"
#include "board/installed_header.h"
#include "board/meanwhile.h"
#include "board/mixer.h"
#include "board/sources.h"
#include "board/trace.h"
#include "board/value.h"

namespace board
{

/** What a board has; read from a board file or filled by a test. */
struct Description
{
    std::string name = "bare";
    int console_level = 1;                               ///< PMX_IsLog prints lines of this level and below
    std::map<std::string, std::filesystem::path> flash;  ///< partition name to image file
    std::map<std::string, std::uint32_t> flash_words;    ///< partition name to the one word that it holds
    bool sink_plugged = true;                            ///< an HDMI sink is plugged in at power-on
    bool resolution_requested = false;                   ///< a hot-plug event wants the HDMI resolution sent again
    std::optional<hdmi_av::Resolution> valid_resolution; ///< what the HDMI driver would choose; nothing: what is asked
    std::vector<hdmi_av::Resolution> sink_modes;  ///< what the sink takes, the one it likes best first; none: anything
    display_part::Behaviour display_part;         ///< what the display part does with a resolution change
    mixer::PlaneDelays plane_delay{};             ///< delay that the hardware reports for each mixer plane
    std::vector<mixer::Arrangement> arrangements; ///< arrangements of the planes that have other delays
    std::optional<std::uint32_t> capability;      ///< what the product's mixer can; nothing: what the layer says
    bool waiting_for_sync = false;                ///< the video plane driver waits for its sync control
    std::vector<sources::Start> sources;          ///< what connects when the mixer has started
    std::vector<Fault> faults;                    ///< in force from power-on
};

/** A board file that cannot be used: file, line where known, what is wrong. */
class DescriptionError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/** Names of the boards in the boards directory, sorted. */
std::vector<std::string> boards_by_name();

/** Read a board description: a .toml file, or a directory that holds board.toml, or the name of one under the boards
 *  directory. Relative paths in it are relative to the file. Unknown keys are errors. Throws DescriptionError. */
Description load_description(const std::filesystem::path& board);

/** Where named boards are looked up; unless set, the folder share/pmx/boards of the installation whose headers the
 *  program was compiled with, or of a folder above the program. */
void set_boards_directory(std::filesystem::path directory);

/** Make the board as good as new, any number of times in a process: devices, clock, trace, faults, and the layer's own
 *  state at load. */
void power_on(const Description& description);

/** The description in force. */
const Description& description();

/** Replace or add a flash partition. An image that does not exist is an error (std::invalid_argument); an empty path
 *  removes the partition. */
void set_flash(std::string partition, std::filesystem::path image);

/** Console level from now on. */
void set_console_level(int level);
int console_level();

/** Where console text goes, as it is printed; the default discards it. Everything printed is kept in console_text()
 *  too. */
void set_console(std::function<void(std::string_view text)> sink);
std::string console_text();

/** Virtual time since power-on. */
std::chrono::microseconds now();

/** Let virtual time pass: timers that run out call their expiry functions at their moment. */
void advance(std::chrono::microseconds duration);

/** Run the suspend or resume operation of everything registered, in order of registration (resume: reversed); the first
 *  non-zero result. */
int suspend();
int resume();

/** Everything that the devices hold, by device: os, console, flash, registers, interface_manager, power, mixer,
 *  tv_encoder, video_planes, osd_planes, sources, hdmi_av, display_part, display_control. Stable keys; numbers with
 *  their names. Where replaced_functions() has any, they stand there as replaced: what those would have set is as it
 *  was at power-on. */
Value state();

/** The platform functions for which this program has functions of its own in place of the board's, in the headers'
 *  order; see replaced.h. */
std::vector<std::string> replaced_functions();

/** Number of reports since power-on. */
unsigned asserts(); ///< through Assert
unsigned misuses(); ///< of the platform, found by the board (a second lock by the holder, unlock without lock, …)

} // namespace board
