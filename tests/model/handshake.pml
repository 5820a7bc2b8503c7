/* SPDX-License-Identifier: MIT OR GPL-2.0-only */
/* The handshake with the display part, and its neighbours, who act at any time.
 *
 * What the layer does to an event stands in the inlines below, one for each operation, and is held against the layer
 * itself: compiled with GRAPH the model prints every transition, and the explorer of tests/support has the same from a
 * board. Compiled without, the processes at the end are the neighbours, and the claim "graphics_come_back" says that
 * graphics that are out of the mix come back unless one of the causes has arisen that docs/calling.md names. Whoever
 * resets, shuts down and starts without end keeps them out without end; the claim looks at what comes when that has
 * ended.
 *
 * An event is one step: what falls between two calls of an operation is the matter of tests/layer. Time has no length;
 * a timer that is armed runs out some day, however often it is started anew. */

bool flag, owed, timer_set; /* F, E, T */
bool armed;                 /* the timer that the layer knows runs */
bool waiting;               /* the video plane driver, for its sync control */
bool mixed = true;          /* the OSD planes */
bool has_timer = true, mode_set = true, started = true;
bool old_armed; /* timers run that the layer no longer knows */

/* What leaves graphics out for good. */
mtype = { none, shut_down, reset_while_owed, start_while_owed, held_back_without_timer, debt_cleared,
    video_plane_silent };
mtype cause = none;

/* What the neighbours are about to do. */
bool silent;    /* the video plane driver does nothing any more */
bool awaited;   /* it has waited, and not yet called PMX_SetOsdEnable since */
bool dutiful;   /* this display part lowers each flag that it raises */
bool answering; /* it has raised one, and not lowered it yet */
bool settled;   /* nobody resets, shuts down, starts, or clears a debt any more */

#define out (!mixed)
#define expected (armed || old_armed || (owed && awaited) || (dutiful && answering))
#define nobody (out && !expected)

/* The layer. */

inline mix()
{
    mixed = true;
    owed = false
}

inline lower()
{
    flag = false;
    owed = true;
    if
    :: !waiting -> mix()
    :: else
    fi
}

inline hold_back()
{
    mixed = false;
    armed = has_timer;
    timer_set = true
}

inline set_mode(hdmi_changed, sink)
{
    if
    :: (hdmi_changed || !mode_set || timer_set) && sink
    :: else -> lower()
    fi;
    mode_set = true;
    if
    :: flag -> hold_back()
    :: else
    fi
}

inline run_out()
{
    if
    :: old_armed -> old_armed = false
    :: else -> armed = false
    fi;
    timer_set = false;
    lower()
}

inline set_osd_enable()
{
    if
    :: owed -> mix()
    :: else
    fi
}

inline reset()
{
    old_armed = old_armed || armed;
    armed = false;
    flag = false;
    owed = false;
    timer_set = false;
    has_timer = false;
    mode_set = false
}

inline shut_down_layer()
{
    if
    :: started ->
        armed = false;
        has_timer = false;
        started = false
    :: else
    fi
}

inline start_layer()
{
    if
    :: !started ->
        reset();
        has_timer = true;
        started = true
    :: else
    fi
}

/* Behind each event: when nobody is left who brings graphics back, that has a cause with a name. */
inline look(why)
{
    if
    :: mixed || expected -> cause = none
    :: nobody && cause == none ->
        if
        :: silent -> cause = video_plane_silent
        :: else ->
            cause = why;
            assert(cause != none)
        fi
    :: else
    fi
}

#ifdef GRAPH

c_code {
    static void vPrintState(void)
    {
        printf("F%d E%d T%d A%d W%d M%d H%d S%d O%d I%d", now.flag, now.owed, now.timer_set, now.armed, now.waiting,
               now.mixed, now.has_timer, now.mode_set, now.old_armed, now.started);
    }
}

#define EVENT(name, body, why)                                \
    d_step                                                    \
    {                                                         \
        c_code { vPrintState(); printf(" | %s | ", name); };  \
        body;                                                 \
        c_code { vPrintState(); printf("\n"); }               \
    }

#else
#define EVENT(name, body, why) \
    atomic                     \
    {                          \
        true; /* a choice must not begin with another one's else */ \
        body;                  \
        look(why)              \
    }
#endif

/* A mode that holds graphics back is a cause where there is no timer to start. */
#define BY_MODE (has_timer -> none : held_back_without_timer)

#define FLAG_RAISED EVENT("flag raised", flag = true, none)
#define FLAG_LOWERED EVENT("flag lowered", lower(), none)
#define MODE_HDMI_CHANGED EVENT("mode: HDMI changed", set_mode(true, true), BY_MODE)
#define MODE_HDMI_UNCHANGED EVENT("mode: HDMI unchanged", set_mode(false, true), BY_MODE)
#define MODE_NO_SINK EVENT("mode: no sink", set_mode(true, false), none)
#define MODE_ANSWERED EVENT("mode: answered within the call", lower(); set_mode(true, true), none)
#define MODE_REFUSED EVENT("mode: refused", lower(), none)
#define TIMER_RUNS_OUT EVENT("timer runs out", run_out(), none)
#define WAITS_FOR_SYNC EVENT("video plane waits for sync", waiting = true, none)
#define HAS_SYNC EVENT("video plane has its sync", waiting = false, none)
#define SET_OSD_ENABLE EVENT("PMX_SetOsdEnable", set_osd_enable(), none)
#define RESET EVENT("PMX_Reset", reset(), reset_while_owed)
#define SHUT_DOWN EVENT("PMX_Uninit", shut_down_layer(), shut_down)
#define SHUT_DOWN_WITH_RESULT EVENT("i4PMX_Uninit", shut_down_layer(), shut_down)
#define STOP EVENT("PMX_Stop", started = false, none)
#define START EVENT("PMX_Init", start_layer(), start_while_owed)
#define OSD_ENABLE_FLAG_SET EVENT("PMX_SetOsdEnableFlag(TRUE)", owed = true, none)
#define OSD_ENABLE_FLAG_CLEARED EVENT("PMX_SetOsdEnableFlag(FALSE)", owed = false, debt_cleared)

#ifdef GRAPH

active proctype anybody()
{
    do
    :: FLAG_RAISED
    :: FLAG_LOWERED
    :: MODE_HDMI_CHANGED
    :: MODE_HDMI_UNCHANGED
    :: MODE_NO_SINK
    :: MODE_ANSWERED
    :: MODE_REFUSED
    :: armed || old_armed -> TIMER_RUNS_OUT
    :: WAITS_FOR_SYNC
    :: HAS_SYNC
    :: SET_OSD_ENABLE
    :: RESET
    :: SHUT_DOWN
    :: SHUT_DOWN_WITH_RESULT
    :: STOP
    :: START
    :: OSD_ENABLE_FLAG_SET
    :: OSD_ENABLE_FLAG_CLEARED
    od
}

#else

/* The neighbours. Whoever can act without end does so some day (weak fairness), and nobody need act in time. */

active proctype display_part()
{
    if
    :: dutiful = true
    :: true
    fi;
    do
    :: atomic { answering = true; FLAG_RAISED };
        do
        :: !dutiful -> FLAG_RAISED
        :: !dutiful -> answering = false; break
        :: atomic { answering = false; FLAG_LOWERED }; break
        od
    :: FLAG_LOWERED
    od
}

/* With a sink that is plugged and pulled at any time. */
active proctype middleware()
{
    do
    :: MODE_HDMI_CHANGED
    :: MODE_HDMI_UNCHANGED
    :: MODE_NO_SINK
    :: MODE_ANSWERED
    :: MODE_REFUSED
    od
}

active proctype video_plane_driver()
{
    do
    :: atomic { awaited = true; WAITS_FOR_SYNC };
        if
        :: HAS_SYNC
        :: goto gone
        fi;
        if
        :: atomic { awaited = false; SET_OSD_ENABLE }
        :: goto gone
        fi
    od;
gone:
    atomic { silent = true; awaited = false; look(video_plane_silent) }
}

active proctype timers()
{
    do
    :: atomic { armed || old_armed; TIMER_RUNS_OUT }
    od
}

active proctype framework()
{
    do
    :: RESET
    :: SHUT_DOWN
    :: SHUT_DOWN_WITH_RESULT
    :: STOP
    :: START
    :: OSD_ENABLE_FLAG_CLEARED
    :: settled = true; break
    od
}

active proctype anybody_else()
{
    do
    :: SET_OSD_ENABLE
    :: OSD_ENABLE_FLAG_SET
    od
}

ltl graphics_come_back { [] ((settled && out && cause == none) -> <> (mixed || cause != none)) }

/* None of these holds: each cause arises. */
ltl never_by_shut_down { [] (cause != shut_down) }
ltl never_by_reset { [] (cause != reset_while_owed) }
ltl never_by_start { [] (cause != start_while_owed) }
ltl never_without_timer { [] (cause != held_back_without_timer) }
ltl never_by_clearing { [] (cause != debt_cleared) }
ltl never_by_silence { [] (cause != video_plane_silent) }

#endif
