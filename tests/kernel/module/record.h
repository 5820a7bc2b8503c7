// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What recorders, scripts and commands tell each other. */
#ifndef RECORD_H
#define RECORD_H

#include <linux/types.h>

/* Trace: a line a call, which stands where the call began. */
struct line;
struct line* line_begin(const char* function);
void line_number(struct line* line, long long number);
void line_text(struct line* line, const char* text);
void line_symbol(struct line* line, const void* address);
void line_unchanged(struct line* line);
void line_open(struct line* line, char bracket);
void line_close(struct line* line, char bracket);
void line_end(struct line* line);
void line_end_result(struct line* line, long long result);
void trace_note(const char* format, ...) __printf(1, 2);
/* What an operation answered; kept apart from the calls. */
void trace_result(const char* format, ...) __printf(1, 2);

/* Scripts: what a scenario has prepared for a function. */
bool script_fails(const char* function, int* answer);
void script_call_ends(const char* function);
bool script_is_inside(void);
void scripts_begin(void);
void scripts_end(void);
extern const void* const script_video_plane;

/* Commands: the words of a line, and what a scenario can call. */
struct words
{
    char* rest;
    bool wrong;
};

#define NO_SUCH_COMMAND (-4096)
char* word(struct words* words);
long long number(struct words* words);
bool is_null(struct words* words);
int run_line(char* text);

struct command
{
    const char* name;
    void (*run)(struct words* words);
};

extern const struct command operations[];
extern const struct command slots[];

/* Its request, while PMX_SetModeEx runs. */
extern void* lent_outputs;

int script_command(const char* verb, struct words* words);

#endif
