// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The virtual board for C programs: tests of a middleware or of a driver power it on, call the layer as they do on a
 *  product, and look at what the layer made of it. docs/testing.md tells how; board.h is the same for C++, and more.
 *
 *  There is one board in a process, and one thread uses it. Its time stands still until somebody lets it pass.
 *
 *  What fails returns -1 or a null pointer, has done nothing unless it says otherwise, and tells why on the standard
 *  error output and by board_c_error(). Nothing but the display of the console works before board_c_power_on(). Texts
 *  that go in are read before a function returns, and kept by nobody; a null pointer for one is an error. Texts that
 *  come out belong to the board, and stay until the function that yielded them is called again.
 *
 *  Inside a call of the platform, in board_c_meanwhile()'s action and in platform functions of the program's own, the
 *  functions serve as well, except board_c_power_on(), board_c_finish(), board_c_forget() and board_c_expect(). */
#ifndef BOARD_C_H
#define BOARD_C_H

#include "board/installed_header.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Make the board as good as new, any number of times in a process, and the layer as it is at load: devices, clock,
 *  calls, faults, and what is to happen meanwhile. When it fails, the board that was there goes on.
 *  @param szBoard  a board file, a directory that holds board.toml, or the name of a board ("default")
 *  @return 0; -1 when it cannot be used */
int board_c_power_on(const char* szBoard);

/** End a test: what waits is ended, and what should not have happened is told.
 *  @return 0; -1 when the platform was misused and nobody expected it ("misuses N"), or something that was to happen
 *          meanwhile never did */
int board_c_finish(void);

/** Ask what failed last.
 *  @return the reason, an empty text before the first failure; until the next one */
const char* board_c_error(void);

/* Driving the board */

/** Carry out a line of the scenario language, docs/scenarios.md: "sink unplug", "display-part answer 3s",
 *  "source vdp0 start 1920x1080", "flash fast_init_param word RES_576P", "fault x_timer_create -1 on 2",
 *  "poke ucBrightness 3", "meanwhile x_thread_delay sink unplug", "PMX_GetMode 0". Expectations look at what it does,
 *  and at all that happens behind it. What a line would show is not shown. Where the line is right but fails, what it
 *  has done by then is done.
 *  @param szLine  one command, no line end
 *  @return 0; -1 when the line is wrong or fails */
int board_c_do(const char* szLine);

/** Let virtual time pass: timers that run out call their expiry functions. What goes wrong with the board itself, since
 *  the last such call, too, is told.
 *  @param uMilliseconds  how much
 *  @return 0; -1 when something went wrong; the time has passed */
int board_c_advance(unsigned uMilliseconds);

/** Carry an action out, once, inside a call of the platform: the device has acted, but the layer does not have its
 *  answer yet. So a neighbour's thread or an interrupt interferes. board_c_power_on() takes it back.
 *  @param szFunction  the platform function
 *  @param uCall       in which of its calls from now, counted from 1
 *  @param iAsThread   0 in the thread that calls; anything else as a thread of its own, which can wait for the mutex
 *  @param pfAction    what is done; it returns, and throws nothing
 *  @param pvArgument  handed to the action; not looked at
 *  @return 0; -1 when there is no such function, no action, or uCall is 0 */
int board_c_meanwhile(const char* szFunction, unsigned uCall, int iAsThread, void (*pfAction)(void* pvArgument),
                      void* pvArgument);

/* What the layer called */

/** Look at what happens from here on: earlier calls and console texts are of no interest to the functions below.
 *  @return 0; -1 without power */
int board_c_forget(void);

/** Hold what happened against an expectation, as in a scenario, docs/scenarios.md: "next TVE_SetEnable(0, 1)", "call
 *  PMX_HalSetMode(0, RES_1080P60HZ)", "no-more", "none x_thread_delay", "after about 3s", "state ucMode RES_480P",
 *  "console \"text\"", "log 8 \"text\"", "asserts 0", "misuses 0". "call" and "next" go on behind what was matched
 *  last.
 *  @param szExpectation  without the word expect
 *  @return 0 it is so; -1 when it is not, or cannot be read; the reason says what was found */
int board_c_expect(const char* szExpectation);

/** Count the calls that a line means.
 *  @param szCall  as in "next"
 *  @return how many; -1 when it cannot be read */
int board_c_count(const char* szCall);

/** What an entry is: BOARD_C_CALL a call of the platform; BOARD_C_LOG a console text, called by the layer;
 *  BOARD_C_ASSERT a broken invariant; BOARD_C_NOTICE the board itself; BOARD_C_STORE a store into the layer's objects,
 *  while they are watched ("stores on"). */
#define BOARD_C_CALL 0
#define BOARD_C_LOG 1
#define BOARD_C_ASSERT 2
#define BOARD_C_NOTICE 3
#define BOARD_C_STORE 4

/** Something that happened. */
typedef struct
{
    int iKind;                         /**< BOARD_C_CALL, … */
    const char* szLine;                /**< all of it: "x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0" */
    const char* szFunction;            /**< the function; of a notice its kind, of a store the field */
    const char* szText;                /**< of a console text or notice; else empty */
    const char* szOperation;           /**< the layer's operation that was running; empty outside of one */
    unsigned long long u8Microseconds; /**< when it began, since power-on */
    unsigned uDepth;                   /**< 0; 1 and more inside a call that called back */
    unsigned uArguments;               /**< how many it has */
    int iHasResult;                    /**< 0, 1 */
    long long i8Result;                /**< when it has one */
    int iFaulted;                      /**< 1: a fault answered */
} BOARD_C_ENTRY_T;

/** Ask how many entries there are.
 *  @return the number of entries since board_c_forget(), the last board_c_do() or power-on; 0 without power */
unsigned board_c_entries(void);

/** Read an entry.
 *  @param uEntry   from 0, in the order of beginning
 *  @param prEntry  [out] the entry; its texts stay until the next board_c_entry()
 *  @return 0; -1 when there is none, or no place for it */
int board_c_entry(unsigned uEntry, BOARD_C_ENTRY_T* prEntry);

/** Read an argument of an entry as text.
 *  @param uEntry      from 0
 *  @param szArgument  its name, as in the header: "fgEnable"
 *  @return as in the entry's line: "1", "RES_480P", "[4, 3]"; null when there is none */
const char* board_c_argument(unsigned uEntry, const char* szArgument);

/** Read an argument of an entry as a number.
 *  @param uEntry      from 0
 *  @param szArgument  its name, as in the header
 *  @param pi8Number   [out] the number
 *  @return 0; -1 when there is none, or it is none */
int board_c_argument_number(unsigned uEntry, const char* szArgument, long long* pi8Number);

/** Print what happened, a line for each entry with its time, on the standard output: for a test that has failed.
 *  @return 0; -1 without power */
int board_c_print_entries(void);

/* What board and layer hold */

/** Read a part of the state, of a device ("tv_encoder.encoders[0].enabled", "os.timers") or of the layer's record
 *  ("ucMode", "arPortInfo[3].fgEnabled", "status.hPMXTimer").
 *  @param szPath  where, docs/scenarios.md
 *  @return the value: "RES_480P", "{enabled=1, …}", "null" for what nobody has set; null pointer when there is none */
const char* board_c_state(const char* szPath);

/** The same for a number.
 *  @param szPath     where
 *  @param pi8Number  [out] the number
 *  @return 0; -1 when there is nothing, or no number */
int board_c_state_number(const char* szPath, long long* pi8Number);

/** Read what the state means, as the verb status shows it: outputs, planes, graphics, disagreements of record and
 *  hardware.
 *  @return lines of at most 80 columns; null without power */
const char* board_c_status(void);

/** Ask whether this program has a platform function of its own in place of the board's.
 *  @param szFunction  the platform function
 *  @return 0 the board's; 1 the program's; -1 when there is no such function */
int board_c_is_replaced(const char* szFunction);

/* The console */

/** Show the console on the standard output from now on, or stop showing it.
 *  @param iShown  0 stop, anything else show */
void board_c_show_console(int iShown);

/** Admit lines of PMX_IsLog up to this level, until the next power-on.
 *  @param iLevel  0 to 9 */
void board_c_console_level(int iLevel);

/** Read what the console printed.
 *  @return the text since board_c_forget(), the last board_c_do() or power-on; null without power */
const char* board_c_console(void);

/** Ask how often an invariant was reported as broken since power-on.
 *  @return the number of calls of Assert */
unsigned board_c_asserts(void);

/** Ask how often the platform was misused since power-on: a second lock by the holder, a handle that does not exist.
 *  @return the number of misuses that the board found */
unsigned board_c_misuses(void);

#ifdef __cplusplus
}
#endif

#endif
