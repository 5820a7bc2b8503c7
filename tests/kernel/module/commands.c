// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A line of a scenario, as it was prepared for here: a name and numbers. */
#include <linux/kernel.h>
#include <linux/string.h>

#include "drv_pmx.h"
#include "record.h"

void* lent_outputs;

char* word(struct words* words)
{
    char* found;

    do
        found = strsep(&words->rest, " ");
    while (found && !*found);
    return found ? found : "";
}

long long number(struct words* words)
{
    long long value = 0;

    if (kstrtoll(word(words), 0, &value))
        words->wrong = true;
    return value;
}

bool is_null(struct words* words)
{
    while (words->rest && *words->rest == ' ')
        words->rest++;
    if (!words->rest || strncmp(words->rest, "null", 4) != 0)
        return false;
    word(words);
    return true;
}

static const struct command* find(const struct command* all, const char* name)
{
    for (; all->name; all++)
    {
        if (strcmp(all->name, name) == 0)
            return all;
    }
    return NULL;
}

/* A table's function, from outside, as a driver calls it. */
static int run_slot(struct words* words)
{
    const struct command* slot = find(slots, word(words));

    if (!slot)
        return NO_SUCH_COMMAND;
    slot->run(words);
    return 0;
}

int run_line(char* text)
{
    struct words words = { text, false };
    const char* verb = word(&words);
    const struct command* operation = find(operations, verb);
    int result = 0;

    if (!*verb)
        return 0;
    if (operation)
        operation->run(&words);
    else if (strcmp(verb, "ipmx") == 0)
        result = run_slot(&words);
    else
        result = script_command(verb, &words);
    return words.wrong ? NO_SUCH_COMMAND : result;
}
