#include "support/Program.h"

#include "support/Files.h"

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

} // namespace

Outcome RunProgram(const std::vector<std::string>& command,
                   const std::vector<std::string>& environment, const std::string& output)
{
    const TemporaryFolder folder;
    const std::string out = folder.Write("out", "");
    const std::string err = folder.Path("err");

    // A program for another architecture needs its emulator in front.
    std::vector<const char*> arguments;
    const std::string emulator = KX_TEST_EMULATOR;
    std::vector<std::string> emulatorWords;
    for (std::string::size_type begin = 0; begin < emulator.size();)
    {
        const auto end = std::min(emulator.find('|', begin), emulator.size());
        emulatorWords.push_back(emulator.substr(begin, end - begin));
        begin = end + 1;
    }
    for (const std::string& word : emulatorWords)
    {
        arguments.push_back(word.c_str());
    }
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
        Redirect(STDOUT_FILENO, output.empty() ? out.c_str() : output.c_str(), O_WRONLY | O_CREAT);
        Redirect(STDERR_FILENO, err.c_str(), O_WRONLY | O_CREAT);
        for (const std::string& setting : environment)
        {
            putenv(const_cast<char*>(setting.c_str()));
        }
        execvp(arguments[0], const_cast<char* const*>(arguments.data()));
        _exit(127);
    }
    int status = 0;
    waitpid(child, &status, 0);
    const int code = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    return {code, ReadFile(out), ReadFile(err)};
}

} // namespace kxtest
