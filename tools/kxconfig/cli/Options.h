#ifndef KX_TOOLS_OPTIONS_H
#define KX_TOOLS_OPTIONS_H

#include "commands/Add.h"
#include "commands/Check.h"
#include "commands/Diff.h"
#include "commands/Explain.h"
#include "commands/Find.h"
#include "commands/Get.h"
#include "commands/Keys.h"
#include "commands/Remove.h"
#include "commands/Set.h"

#include <functional>
#include <string>

namespace CLI
{
class App;
}

/** What the user asked for. */
struct Request
{
    GetArguments get;
    SetArguments set;
    AddArguments add;
    RemoveArguments remove;
    ExplainArguments explain;
    CheckArguments check;
    KeysArguments keys;
    FindArguments find;
    DiffArguments diff;
    std::istream* input = nullptr; ///< standard input
    std::string logMask;
    bool trace = false;
    std::string color = "auto";
    std::string file;                           ///< of the command
    std::function<ExitStatus(Report&)> command; ///< empty if no command was named
};

/** Adds all commands and options to @p app, which stores in @p request what it parses. */
void AddOptions(CLI::App& app, Request& request);

#endif
