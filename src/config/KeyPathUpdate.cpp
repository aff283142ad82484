#include "KeyPathUpdate.h"

#include "UpdateWalk.h"
#include "diag/Status.h"
#include "engine/OldEngine.h"

namespace kx
{

int UpdateValues(xmlNode* top, TextView key, const char* value, unsigned int& updated)
{
    if (top == 0 || key.IsEmpty())
    {
        return StatusMissing;
    }
    UpdateWalk walk(top, key);
    while (walk.Next())
    {
        if (walk.ReplacesText())
        {
            SetContent(walk.Element(), reinterpret_cast<const xmlChar*>(value));
            updated = 1;
        }
    }
    return walk.GetStatus();
}

} // namespace kx
