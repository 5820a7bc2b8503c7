// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a state means to somebody who looks at the product: what each output shows, what each plane of the mixer is fed
 *  with, whether graphics are held back, and where the layer's record and the devices tell different things. */
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "board/value.h"
#include "tools/pmxboard/text/layout.h"

namespace pmxboard
{

/** Counted up when the meaning of a key changes. */
inline constexpr int status_schema_version = 1;

/** As its driver was told last. Values are null where there is nothing to say. */
struct OutputStatus
{
    std::string_view name;
    std::optional<bool> on; ///< nothing: its driver has taken nothing since power-on
    board::Value mode;
    board::Value frequency;
    std::string remark; ///< what else is seen there
};

struct SinkStatus
{
    bool plugged = false;
    board::Value takes_mode; ///< null: whatever it is asked about
    board::Value takes_frequency;
    std::vector<board::Value> modes; ///< with their frequencies, the one it likes best first; none: any
};

struct PlaneStatus
{
    unsigned plane = 0; ///< from 1
    bool mixed = false;
    std::optional<unsigned> position; ///< in the stack, from 0; nothing: it stands nowhere
    std::string source;               ///< "vdp0"; of a port that several share, all of them until one connects
    bool connected = false;
    board::Value width; ///< null while the source delivers nothing
    board::Value height;
    board::Value colour; ///< a DRV_PMX_COLOR_SPACE_T or DRV_GFX_COLOR_MODE_T, as the mixer takes its pictures
};

struct GraphicsStatus
{
    enum class State
    {
        Shown,
        Switching,        ///< shown, while the display part switches
        Held,             ///< out of the mix until the display part answers or the timer runs out
        AwaitsVideoPlane, ///< the display part has answered, the video plane waits for its sync control
        Out               ///< somebody else took them out of the mix
    };

    State state = State::Shown;
    std::vector<unsigned> planes; ///< out of the mix, from 1
    std::optional<std::int64_t> since_us;
    std::optional<std::int64_t> answer_us; ///< when the display part will answer, where that is settled
    std::optional<std::int64_t> timer_us;  ///< when the display timer runs out
    /** The operation that has deleted or forgotten what would bring them back: PMX_Uninit, PMX_Reset or PMX_Init.
     *  Nothing while something still does, and where a state does not tell. */
    std::optional<std::string> lost_by;
};

/** Whether nothing is under way that brings graphics back, and no flag says that they are away. */
bool are_forgotten(const GraphicsStatus& graphics);

struct Status
{
    std::string board;
    std::int64_t now_us = 0;
    bool initialised = false;
    bool enabled = false;
    board::Value mode;
    board::Value frequency;
    board::Value tv_type;
    board::Value colour_space;
    std::optional<std::uint32_t> capability;
    bool muted = false;
    bool colour_bar = false;
    std::vector<OutputStatus> outputs;
    SinkStatus sink;
    std::vector<PlaneStatus> planes;
    std::vector<std::string> swaps; ///< "1 and 2"
    GraphicsStatus graphics;
    std::vector<std::string> disagreements; ///< of the record with the devices, a sentence each
    std::vector<std::string> replaced;      ///< platform functions that are not the board's: nobody compares, then
};

/** A state that lacks something, as a stranger's may, tells nothing of it. */
Status status_of(const board::Value& state, const std::string& board);

enum class StatusPart
{
    All,
    Outputs,
    Planes,
    Graphics
};
/** As people read it: 80 columns, and on the whole a screen. */
std::string to_text(const Status& status, StatusPart part, const Look& look);

/** {"schema": "pmxboard-status", "version": 1, …}; on several lines with an indent. */
std::string to_json(const Status& status);
/** The same as a line of a trace. */
std::string to_json_line(const Status& status);

} // namespace pmxboard
