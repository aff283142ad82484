#include "cli/Run.h"
#include "file/Load.h"
#include "output/Report.h"

#include <algorithm>
#include <exception>
#include <iostream>

int main(int argc, char** argv)
{
    std::set_terminate(EndTerminated);
    const std::vector<std::string> arguments(argv + std::min(argc, 1), argv + argc);
    KeepLoaded();
    std::ios::sync_with_stdio(false); // the streams get buffers of their own
    return Run(arguments, std::cin, std::cout, std::cerr);
}
