#include "output/Change.h"

#include "output/Quoting.h"

#include <nlohmann/json.hpp>

std::string Change::Line() const
{
    if (!before)
    {
        return location + ": added " + Quoted(after.value_or(""));
    }
    return location + (after ? ": " + Quoted(*before) + " -> " + Quoted(*after)
                             : ": removed " + Quoted(*before));
}

Json Change::InJson() const
{
    return {{"location", location}, {"before", OrNull(before)}, {"after", OrNull(after)}};
}
