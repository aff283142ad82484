#include "cli/Run.h"

#include <algorithm>
#include <iostream>

int main(int argc, char** argv)
{
    const std::vector<std::string> arguments(argv + std::min(argc, 1), argv + argc);
    return Run(arguments, std::cin, std::cout, std::cerr);
}
