#include "Operations.h"

namespace bench
{

std::vector<Operation>& Operations()
{
    static std::vector<Operation> operations;
    return operations;
}

std::map<std::string, std::string>& Versions()
{
    static std::map<std::string, std::string> versions;
    return versions;
}

} // namespace bench
