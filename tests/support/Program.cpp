#include "support/Program.h"

#include "support/Files.h"

#include <algorithm>
#include <sstream>
#include <stdexcept>

#include <fcntl.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

namespace kxtest
{

namespace
{

void Redirect(int descriptor, const char* path, int flags)
{
    const int file = open(path, flags, 0600);
    if (file < 0 || dup2(file, descriptor) < 0)
    {
        _exit(126);
    }
    close(file);
}

std::vector<std::string> EmulatorWords()
{
    std::vector<std::string> words;
    const std::string emulator = KX_TEST_EMULATOR;
    for (std::string::size_type begin = 0; begin < emulator.size();)
    {
        const auto end = std::min(emulator.find('|', begin), emulator.size());
        words.push_back(emulator.substr(begin, end - begin));
        begin = end + 1;
    }
    return words;
}

void SetEnvironment(const std::vector<std::string>& settings)
{
    unsetenv("KX_LOG_MASK"); // the environment of the tests may have set it
    for (const std::string& setting : settings)
    {
        putenv(const_cast<char*>(setting.c_str()));
    }
}

/** @return @p text without the loader's warnings about an engine without symbol versions. */
std::string WithoutLoaderWarnings(const std::string& text)
{
    std::istringstream lines(text);
    std::string rest;
    for (std::string line; std::getline(lines, line);)
    {
        const bool isLast = lines.eof(); // then it has no end of line
        if (line.find(": no version information available (required by ") == std::string::npos)
        {
            rest += line + (isLast ? "" : "\n");
        }
    }
    return rest;
}

Outcome RunAsItIs(const std::vector<std::string>& command,
                  const std::vector<std::string>& environment, unsigned user)
{
    const TemporaryFolder folder;
    const std::string out = folder.Path("out");
    const std::string err = folder.Path("err");
    std::vector<const char*> arguments;
    for (const std::string& word : command)
    {
        arguments.push_back(word.c_str());
    }
    arguments.push_back(nullptr);

    const pid_t child = fork();
    if (child < 0)
    {
        throw std::runtime_error("cannot fork");
    }
    if (child == 0)
    {
        Redirect(STDIN_FILENO, "/dev/null", O_RDONLY);
        Redirect(STDOUT_FILENO, out.c_str(), O_WRONLY | O_CREAT);
        Redirect(STDERR_FILENO, err.c_str(), O_WRONLY | O_CREAT);
        SetEnvironment(environment);
        if (user != 0)
        {
            setenv("LLVM_PROFILE_FILE", "/dev/null", 1); // cannot write where the tests do
        }
        if (user != 0 && setuid(user) != 0)
        {
            _exit(125);
        }
        execvp(arguments[0], const_cast<char* const*>(arguments.data()));
        _exit(127);
    }
    int status = 0;
    waitpid(child, &status, 0);
    const int code = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return {code, ReadFile(out), WithoutLoaderWarnings(ReadFile(err))};
}

} // namespace

Outcome RunProgram(const std::vector<std::string>& command,
                   const std::vector<std::string>& environment, unsigned user)
{
    std::vector<std::string> words = EmulatorWords();
    words.insert(words.end(), command.begin(), command.end());
    return RunAsItIs(words, environment, user);
}

Outcome RunShell(const std::string& script, const std::vector<std::string>& environment)
{
    return RunAsItIs({"/bin/bash", "-c", script}, environment, 0);
}

std::string InShell(const std::string& program)
{
    std::string words;
    for (const std::string& word : EmulatorWords())
    {
        words += "'" + word + "' ";
    }
    return words + "'" + program + "'";
}

} // namespace kxtest
