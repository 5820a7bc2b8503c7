// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The trace, and the files of debugfs by which a scenario is given and the trace read. It begins and ends with the
 * port's power management, of which it is told first. */
#include <linux/debugfs.h>
#include <linux/hrtimer.h>
#include <linux/interrupt.h>
#include <linux/module.h>
#include <linux/mutex.h>
#include <linux/preempt.h>
#include <linux/seq_file.h>
#include <linux/slab.h>
#include <linux/string_helpers.h>
#include <linux/uaccess.h>
#include <linux/vmalloc.h>

#include "drv_pmx.h"
#include "pmx_port.h"
#include "record.h"

#define MOST_LINES 4096
#define LONGEST_LINE 480
#define LONGEST_TEXT 256
#define LONGEST_COMMANDS 65536

struct line
{
    u16 length;
    bool separates; /* something stands before what comes next */
    bool is_result;
    char text[LONGEST_LINE];
};

static struct line* lines;
static atomic_t line_num = ATOMIC_INIT(0);
static struct dentry *folder, *files[2];

static __printf(2, 0) void add_values(struct line* line, const char* format, va_list values)
{
    line->length += vscnprintf(line->text + line->length, LONGEST_LINE - line->length, format, values);
}

static __printf(2, 3) void add(struct line* line, const char* format, ...)
{
    va_list values;

    va_start(values, format);
    add_values(line, format, values);
    va_end(values);
}

/* What finds no room goes to the last line, and the reader is told. */
static struct line* new_line(void)
{
    unsigned int number = atomic_inc_return(&line_num) - 1;
    struct line* line = &lines[min_t(unsigned int, number, MOST_LINES - 1)];

    memset(line, 0, offsetof(struct line, text));
    return line;
}

struct line* line_begin(const char* function)
{
    struct line* line = new_line();

    add(line, "%s(", function);
    return line;
}

static void separate(struct line* line)
{
    if (line->separates)
        add(line, ", ");
    line->separates = true;
}

void line_number(struct line* line, long long number)
{
    separate(line);
    add(line, "%lld", number);
}

static void add_quoted(struct line* line, const char* text)
{
    char escaped[LONGEST_TEXT];
    int length = string_escape_str(text, escaped, sizeof(escaped) - 1, ESCAPE_SPACE | ESCAPE_SPECIAL, "\n\t\"\\");

    escaped[min_t(int, length, sizeof(escaped) - 1)] = '\0';
    add(line, "\"%s\"", escaped);
}

void line_text(struct line* line, const char* text)
{
    separate(line);
    if (text)
        add_quoted(line, text);
    else
        add(line, "0");
}

void line_symbol(struct line* line, const void* address)
{
    const struct
    {
        const void* address;
        const char* name;
    } known[] = { { NULL, "0" },
                  { &_rPMXIF, "_rPMXIF" },
                  { &pmx_pm_ops, "pmx_pm_ops" },
                  { _PMX_TmrIsr, "_PMX_TmrIsr" },
                  { script_video_plane, "video_plane_interface" } };
    int i;

    separate(line);
    for (i = 0; i < ARRAY_SIZE(known); i++)
    {
        if (known[i].address == address)
        {
            add(line, "%s", known[i].name);
            return;
        }
    }
    add(line, "<unknown>");
}

void line_unchanged(struct line* line)
{
    separate(line);
    add(line, "<unchanged>");
}

void line_open(struct line* line, char bracket)
{
    separate(line);
    add(line, "%c", bracket);
    line->separates = false;
}

void line_close(struct line* line, char bracket)
{
    add(line, "%c", bracket);
    line->separates = true;
}

void line_end(struct line* line)
{
    add(line, ")");
}

void line_end_result(struct line* line, long long result)
{
    add(line, ") = %lld", result);
}

void trace_note(const char* format, ...)
{
    va_list values;

    va_start(values, format);
    add_values(new_line(), format, values);
    va_end(values);
}

void trace_result(const char* format, ...)
{
    struct line* line;
    va_list values;

    if (script_is_inside())
        return;
    line = new_line();
    line->is_result = true;
    va_start(values, format);
    add_values(line, format, values);
    va_end(values);
}

/* Console and assertions. The compiler would build the list of values anew for the function behind; so the text is made
 * here, and handed on whole. */

static void record_log(const char* head, const char* format, va_list values, char* text)
{
    struct line* line = new_line();

    vscnprintf(text, LONGEST_TEXT, format, values);
    add(line, "%s ", head);
    add_quoted(line, text);
}

void __real_PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...);
void __wrap_PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...);
void __wrap_PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...)
{
    char head[24], text[LONGEST_TEXT];
    va_list values;

    snprintf(head, sizeof(head), "PMX_IsLog %d", i4Level);
    va_start(values, szFormat);
    record_log(head, szFormat, values, text);
    va_end(values);
    __real_PMX_IsLog(i4Level, "%s", text);
    script_call_ends("PMX_IsLog");
}

#define WRAPPED_PRINT(Name)                        \
    void __real_##Name(const CHAR* szFormat, ...); \
    void __wrap_##Name(const CHAR* szFormat, ...); \
    void __wrap_##Name(const CHAR* szFormat, ...)  \
    {                                              \
        char text[LONGEST_TEXT];                   \
        va_list values;                            \
                                                   \
        va_start(values, szFormat);                \
        record_log(#Name, szFormat, values, text); \
        va_end(values);                            \
        __real_##Name("%s", text);                 \
        script_call_ends(#Name);                   \
    }

WRAPPED_PRINT(Printf)
WRAPPED_PRINT(UTIL_Printf)

/* The timer's context shows itself by an interrupt's count. */
static x_timer_cb_fct expiry_function;

static void expire(HANDLE_T hTimer, void* pvArg)
{
    trace_note("EXPIRY timer %u%s", hTimer, in_softirq() ? "" : " outside soft interrupts");
    expiry_function(hTimer, pvArg);
}

/* What the port is given instead of the layer's function. */
x_timer_cb_fct recorded_expiry(x_timer_cb_fct function);
x_timer_cb_fct recorded_expiry(x_timer_cb_fct function)
{
    expiry_function = function;
    return function ? expire : NULL;
}

/* Files */

static ssize_t command_write(struct file* file, const char __user* from, size_t count, loff_t* position)
{
    char *text, *rest, *line;
    ssize_t result = count;

    if (count > LONGEST_COMMANDS)
        return -EFBIG;
    text = memdup_user_nul(from, count);
    if (IS_ERR(text))
        return PTR_ERR(text);
    rest = text;
    while (result > 0 && (line = strsep(&rest, "\n")) != NULL)
    {
        if (run_line(line) == NO_SUCH_COMMAND)
            result = -EINVAL;
    }
    kfree(text);
    return result;
}

static const struct file_operations command_file = { .owner = THIS_MODULE, .write = command_write };

static int trace_show(struct seq_file* file, void* nothing)
{
    int i, num = atomic_read(&line_num);

    for (i = 0; i < min(num, MOST_LINES); i++)
        seq_printf(file, "%c %s\n", lines[i].is_result ? '=' : '|', lines[i].text);
    if (num > MOST_LINES)
        seq_printf(file, "| %d lines found no room\n", num - MOST_LINES);
    return 0;
}
DEFINE_SHOW_ATTRIBUTE(trace);

int __real_pmx_power_begin(void);
int __wrap_pmx_power_begin(void);
int __wrap_pmx_power_begin(void)
{
    struct dentry* found;
    int result;

    lines = vzalloc(sizeof(*lines) * MOST_LINES);
    if (!lines)
        return -ENOMEM;
    result = __real_pmx_power_begin();
    if (result)
    {
        vfree(lines);
        return result;
    }
    scripts_begin();
    found = debugfs_lookup("pmx", NULL); /* the recorder's */
    folder = found ? NULL : debugfs_create_dir("pmx", NULL);
    files[0] = debugfs_create_file("command", 0200, found ? found : folder, NULL, &command_file);
    files[1] = debugfs_create_file("trace", 0400, found ? found : folder, NULL, &trace_fops);
    dput(found);
    return 0;
}

/* The trace goes last of all: an expiry writes into it until the port has deleted its timers. */
void __real_pmx_power_end(void);
void __wrap_pmx_power_end(void);
void __wrap_pmx_power_end(void)
{
    debugfs_remove(files[0]);
    debugfs_remove(files[1]);
    debugfs_remove(folder);
    scripts_end();
    __real_pmx_power_end();
}

void __real_pmx_console_end(void);
void __wrap_pmx_console_end(void);
void __wrap_pmx_console_end(void)
{
    __real_pmx_console_end();
    vfree(lines);
}
