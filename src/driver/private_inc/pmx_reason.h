// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Why the layer refused, or decided as it did: one table, for whoever wants to know.
 *
 *  What ships answers 0 or 1 and says no more. Compiled with PMX_REASONS, the same sources call vPmxReason at each
 *  refusal and at the decisions worth telling; a stack's debug build provides it and says on its console why:
 *
 *      void vPmxReason(PMX_REASON_T eReason, UINT32 u4A, UINT32 u4B)
 *      {
 *          snprintf(szText, sizeof szText, szPmxReason(eReason), u4A, u4B);
 *          ...
 *      }
 *
 *  The innermost decision gives the reason, once; whoever hands the refusal on adds none. Numbers are kept for ever: a
 *  new reason takes the next one, and one that nobody gives any more keeps its row. */
#ifndef PMX_REASON_H
#define PMX_REASON_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** What a program may do about it: X(number, name, advice). */
#define PMX_REASON_CLASSES(X)                                        \
    X(0, NOTE, "nothing was refused")                                \
    X(1, ARGUMENT, "correct the call")                               \
    X(2, MODE, "ask for another mode")                               \
    X(3, CONNECT, "connect the component first")                     \
    X(4, START, "start the layer first")                             \
    X(5, SAME, "nothing is to be done: it is so already")            \
    X(6, FEATURE, "nothing can be done: the product has not got it") \
    X(7, NEIGHBOUR, "ask the neighbouring driver, or try again")

/** What a value of a reason is, for who prints names instead of numbers: X(name). */
#define PMX_REASON_KINDS(X)                                    \
    X(NONE)         /* no value */                             \
    X(NUMBER)       /* a number, as it is */                   \
    X(WORD)         /* bits */                                 \
    X(MODE)         /* a PMX_RESOLUTION_MODE_T value */        \
    X(CAP_BIT)      /* bit number in the capability word */    \
    X(OUTPUT)       /* a PMX_OUTPUT_ index */                  \
    X(PLANES)       /* two planes, a hexadecimal digit each */ \
    X(COLOUR_SPACE) /* a DRV_PMX_COLOR_SPACE_T value */        \
    X(COMP_TYPE)    /* a PMX_COMP_TYPE_ value */               \
    X(PORT)         /* input port, 0 to 7 */                   \
    X(HDMI_COMMAND) /* a PMX_AVD_CMD_T value */                \
    X(SIGNED)       /* a number that may be negative */

/* X(number, name, class, kind of the first value, kind of the second, sentence). The sentence is a format for the two
 * values, in their order. */
// clang-format off
#define PMX_REASONS_KNOWN(X) \
    X( 1, MIXER_ID,           ARGUMENT,  NUMBER,       NONE,         \
       "there is no mixer %u: the one mixer is 0") \
    X( 2, NULL_POINTER,       ARGUMENT,  NUMBER,       NONE,         \
       "argument %u is a null pointer") \
    X( 3, MODE_NEVER,         MODE,      MODE,         NONE,         \
       "no product admits mode %u") \
    X( 4, MODE_BIT,           MODE,      CAP_BIT,      WORD,         \
       "capability bit %u is clear in 0x%08X") \
    X( 5, FEATURE_BIT,        FEATURE,   CAP_BIT,      WORD,         \
       "capability bit %u is clear in 0x%08X") \
    X( 6, STARTED_ALREADY,    SAME,      NONE,         NONE,         \
       "the layer has been started already") \
    X( 7, NOT_STARTED,        START,     NUMBER,       NONE,         \
       "the layer is not started: its mark is %u") \
    X( 8, SAME_VALUE,         SAME,      NUMBER,       NONE,         \
       "it is set to %u already") \
    X( 9, NOT_IN_SECOND,      ARGUMENT,  NUMBER,       NUMBER,       \
       "video plane %u is not switched here: plane %u sits in the second mixer plane") \
    X(10, PRINT_LEVEL,        ARGUMENT,  SIGNED,       WORD,         \
       "level %d is not admitted by the bits 0x%08X") \
    X(11, NO_PORT,            ARGUMENT,  COMP_TYPE,    NUMBER,       \
       "a component of type %u with id %u has no input port") \
    X(12, NOT_CONNECTED,      CONNECT,   NUMBER,       PORT,         \
       "nobody has connected video plane %u: port %u is empty") \
    X(13, SOURCE_TWICE,       ARGUMENT,  NUMBER,       PLANES,       \
       "source %u feeds two planes, 0x%02X") \
    X(14, ORDER_REFUSED,      NEIGHBOUR, NONE,         NONE,         \
       "the mixer hardware refused the order, which stays stored") \
    X(15, ORDER_UNREAD,       NEIGHBOUR, NONE,         NONE,         \
       "the mixer hardware cannot report its order") \
    X(16, POSITION,           ARGUMENT,  NUMBER,       NONE,         \
       "there is no position %u: the last one is 7") \
    X(17, SWAP_MODE,          ARGUMENT,  NUMBER,       NONE,         \
       "there is no swap %u: they are 1 to 6") \
    X(18, TV_SYSTEM,          ARGUMENT,  NUMBER,       NONE,         \
       "no TV system has %u Hz: they have 24, 25, 30, 50 or 60") \
    X(19, HDMI_REFUSED,       NEIGHBOUR, HDMI_COMMAND, NUMBER,       \
       "the HDMI/AV driver refused command %u with value %u") \
    X(20, NO_HDMI_ANSWER,     NEIGHBOUR, MODE,         NUMBER,       \
       "the HDMI/AV driver has no answer for mode %u at %u Hz") \
    X(21, COLOUR_FORMAT,      ARGUMENT,  NUMBER,       NONE,         \
       "HDMI has no code for colour format %u: the last one is 4") \
    X(22, CHIP_SETTING,       ARGUMENT,  NUMBER,       NONE,         \
       "the external chip has no setting %u") \
    X(23, NO_VIDEO_PLANE,     ARGUMENT,  NUMBER,       NONE,         \
       "the hardware has no video plane %u: they are 0 and 1") \
    X(24, COLOUR_SPACE,       ARGUMENT,  COLOUR_SPACE, NONE,         \
       "the mixer is never set up for colour space %u") \
    X(25, NO_STANDARD,        MODE,      MODE,         NONE,         \
       "mode %u has no colour standard: the converters stay as they are") \
    X(26, NO_TABLE,           NEIGHBOUR, COMP_TYPE,    NUMBER,       \
       "a component of type %u with id %u gave no table") \
    X(27, NOT_REGISTERED,     NEIGHBOUR, SIGNED,       NONE,         \
       "the interface manager refused with %d") \
    X(28, INERT,              ARGUMENT,  NONE,         NONE,         \
       "source events through the table are inert: only the direct operation counts") \
    X(29, MUTEX_STAYS,        NEIGHBOUR, WORD,         NONE,         \
       "the operating system did not delete mutex 0x%X") \
    X(30, NOTHING_OWED,       SAME,      NONE,         NONE,         \
       "no graphics are owed their return") \
    X(31, NOTHING_WAITS,      SAME,      NUMBER,       NONE,         \
       "no aspect ratio waits: %u is in force") \
    X(32, FORMAT_FROM_OUTPUT, NOTE,      OUTPUT,       MODE,         \
       "output %u is the first that is on, and gives the mixer mode %u") \
    X(33, FORMAT_FROM_OFF,    NOTE,      MODE,         NONE,         \
       "all outputs are off, and HDMI gives the mixer mode %u") \
    X(34, FORMAT_WAS,         NOTE,      MODE,         NUMBER,       \
       "the mixer was set to mode %u at %u Hz") \
    X(35, FULL_CHANGE,        NOTE,      MODE,         NUMBER,       \
       "everything is programmed for mode %u at %u Hz") \
    X(36, SAME_FORMAT,        NOTE,      NUMBER,       NUMBER,       \
       "the mixer's format stays (HDMI changed: %u, TV encoders changed: %u)") \
    X(37, AFTER_BOOT,         NOTE,      NONE,         NONE,         \
       "the first setting after start-up programs everything") \
    X(38, NO_SINK,            NOTE,      NONE,         NONE,         \
       "nobody is waited for: no sink is there") \
    X(39, HDMI_AS_IT_WAS,     NOTE,      NONE,         NONE,         \
       "nobody is waited for: HDMI was sent no change, and no display timer runs") \
    X(40, HELD_BACK,          NOTE,      NUMBER,       NONE,         \
       "graphics wait for the display part, for %u ms at most") \
    X(41, AWAITS_VIDEO,       NOTE,      NONE,         NONE,         \
       "graphics wait until the video plane driver calls PMX_SetOsdEnable") \
    X(42, TIMED_OUT,          NOTE,      NONE,         NONE,         \
       "the display timer has run out") \
    X(43, MIXED_AGAIN,        NOTE,      NONE,         NONE,         \
       "graphics are mixed again") \
    X(44, MASTER_FROM_PORT,   NOTE,      COLOUR_SPACE, PORT,         \
       "colour space %u is what port %u asks for, over those before it") \
    X(45, SECOND_NOT_COUNTED, NOTE,      NUMBER,       NONE,         \
       "the second video does not count: it needs a luma key, which is %u, and to be mixed") \
    X(46, RGB_NOT_COUNTED,    NOTE,      PORT,         NONE,         \
       "RGB graphics on port %u do not count") \
    X(47, MASTER_STAYS,       NOTE,      COLOUR_SPACE, NONE,         \
       "the master colour space stays %u") \
    X(48, MASTER_CHANGES,     NOTE,      COLOUR_SPACE, COLOUR_SPACE, \
       "the master colour space changes from %u to %u") \
    X(49, STORED_ALONE,       NOTE,      NONE,         NONE,         \
       "stored alone: PMX_SetEnable programs it when the mixer goes on") \
    X(50, CLOCK_AT_ONCE,      NOTE,      NUMBER,       NONE,         \
       "phase %u is programmed at once, and its low 8 bits are stored") \
    X(51, BOOT_MODE,          NOTE,      MODE,         NONE,         \
       "mode %u is none to start with: 480p takes its place") \
    X(52, NO_TIMER,           NEIGHBOUR, NONE,         NONE,         \
       "the operating system refused the display timer") \
    X(53, COUNTS_AS_YCBCR,    NOTE,      PORT,         NONE,         \
       "port %u goes on counting as YCbCr graphics, whatever it is given now") \
    X(54, NO_CURVE,           NOTE,      NUMBER,       NONE,         \
       "no gamma curve has the number %u: gamma is off") \
    X(55, SAME_MODE,          NOTE,      MODE,         NUMBER,       \
       "mode %u at %u Hz is what runs already: nothing is programmed")
// clang-format on

/** The classes: PMX_REASON_CLASS_ and the name. */
typedef enum
{
#define PMX_REASON_ROW(Number, Name, Advice) PMX_REASON_CLASS_##Name = (Number),
    PMX_REASON_CLASSES(PMX_REASON_ROW)
#undef PMX_REASON_ROW
} PMX_REASON_CLASS_T;

/** The reasons: PMX_REASON_ and the name. 0 is none. */
typedef enum
{
#define PMX_REASON_ROW(Number, Name, Class, A, B, Sentence) PMX_REASON_##Name = (Number),
    PMX_REASONS_KNOWN(PMX_REASON_ROW)
#undef PMX_REASON_ROW
} PMX_REASON_T;

/** A reason's sentence: a format for its two values, which are both handed over whether it shows them or not.
 *  @param eReason  one of the reasons
 *  @return the sentence, without a full stop or an end of line; empty for a number without a reason
 *  @context any thread */
static inline const CHAR* szPmxReason(PMX_REASON_T eReason)
{
    /* By number: they run from 1 on without a gap. */
    static const CHAR* const aszSentences[] = { "",
#define PMX_REASON_ROW(Number, Name, Class, A, B, Sentence) Sentence,
                                                PMX_REASONS_KNOWN(PMX_REASON_ROW)
#undef PMX_REASON_ROW
    };
    UINT32 u4Number = (UINT32)eReason;
    return u4Number < sizeof aszSentences / sizeof aszSentences[0] ? aszSentences[u4Number] : "";
}

/** What may be done about a reason.
 *  @param eReason  one of the reasons
 *  @return its class; PMX_REASON_CLASS_NOTE for a number without a reason
 *  @context any thread */
static inline PMX_REASON_CLASS_T ePmxReasonClass(PMX_REASON_T eReason)
{
    static const PMX_REASON_CLASS_T aeClasses[] = { PMX_REASON_CLASS_NOTE,
#define PMX_REASON_ROW(Number, Name, Class, A, B, Sentence) PMX_REASON_CLASS_##Class,
                                                    PMX_REASONS_KNOWN(PMX_REASON_ROW)
#undef PMX_REASON_ROW
    };
    UINT32 u4Number = (UINT32)eReason;
    return u4Number < sizeof aeClasses / sizeof aeClasses[0] ? aeClasses[u4Number] : PMX_REASON_CLASS_NOTE;
}

/** Hook of a layer that was compiled with PMX_REASONS; whoever links it provides it. It is called in the midst of an
 *  operation: it must not call the layer.
 *  @param eReason  one of the reasons
 *  @param u4A      the first value of its sentence, 0 without one
 *  @param u4B      the second
 *  @context whatever the operation is called in: any thread, and the display timer's; with MutexPMX held in connecting
 *           and informing */
void vPmxReason(PMX_REASON_T eReason, UINT32 u4A, UINT32 u4B);

#ifdef __cplusplus
}
#endif

#endif
