// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The tool for many runs: each is a copy of this process, for a checked program takes longer to start than most runs
// take. A request are words on the standard input, each with a mark before and a zero byte behind it: the directory,
// who runs it, a variable of its environment, the files for the three standard streams, the arguments. A word without a
// mark ends it. The answer is a line on the standard output: how the run ended, as wait() has it.
#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>
#include <vector>

#include "tools/pmxboard/commands/command_line.h"
#include "tools/pmxboard/files/ending.h"

namespace
{

enum Word
{
    Directory,
    User,     // a number, or nothing: who runs this
    Variable, // NAME=VALUE, or nothing
    Input,
    Output,
    Diagnostics,
    Arguments
};

std::vector<std::string> request()
{
    std::vector<std::string> words;
    for (std::string word; std::getline(std::cin, word, '\0') && !word.empty();)
        words.push_back(word.substr(1)); // an argument may be empty
    return words;
}

[[noreturn]] void failed(const char* what)
{
    std::perror(what);
    _exit(127);
}

void become(int file, int stream)
{
    if (file < 0 || dup2(file, stream) < 0)
        failed("many_runs");
    close(file);
}

/** Hand a file on; false when nobody reads it to the end. */
bool copy(int from, int to)
{
    char part[65536];
    ssize_t size = 0;
    while ((size = read(from, part, sizeof part)) > 0)
    {
        if (write(to, part, static_cast<std::size_t>(size)) != size)
            return false;
    }
    return true;
}

/** The file's content through a pipe, as if somebody typed it. */
void feed(const std::string& name)
{
    int ends[2];
    struct stat status
    {
    };
    const int file = open(name.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0 || fstat(file, &status) != 0 || pipe(ends) != 0)
        failed(name.c_str());
    const bool fits = status.st_size <= 65536; // what a pipe holds
    if (fits || fork() == 0)
    {
        signal(SIGPIPE, SIG_IGN);
        const bool is_fed = copy(file, ends[1]);
        if (!fits)
            _exit(is_fed ? 0 : 1);
    }
    close(file);
    close(ends[1]);
    become(ends[0], STDIN_FILENO);
}

[[noreturn]] void run(const std::vector<std::string>& words)
{
    constexpr int flags = O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC;
    if (chdir(words[Directory].c_str()) != 0)
        failed(words[Directory].c_str());
    feed(words[Input]);
    become(open(words[Output].c_str(), flags, 0600), STDOUT_FILENO);
    become(open(words[Diagnostics].c_str(), flags, 0600), STDERR_FILENO);
    if (!words[User].empty() && setuid(static_cast<uid_t>(std::stoul(words[User]))) != 0)
        failed("many_runs: setuid");
    if (!words[Variable].empty())
        putenv(const_cast<char*>(words[Variable].c_str())); // the words outlive the run
    std::vector<const char*> arguments{ "pmxboard" };
    for (std::size_t i = Arguments; i < words.size(); ++i)
        arguments.push_back(words[i].c_str());
    pmxboard::end_in_order();
    // It has written all that it prints; what the process has besides is the next run's as well.
    _exit(pmxboard::run_command_line(static_cast<int>(arguments.size()), arguments.data()));
}

} // namespace

int main()
{
    std::vector<std::string> words;
    while (words = request(), words.size() >= Arguments)
    {
        const pid_t copy = fork();
        if (copy < 0)
            failed("many_runs: fork");
        if (copy == 0)
            run(words);
        int status = 0;
        waitpid(copy, &status, 0);
        std::cout << status << std::endl;
    }
    return 0;
}
