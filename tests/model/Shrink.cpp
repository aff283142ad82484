#include "model/Shrink.h"

namespace kxmodel
{

namespace
{

using Fails = std::function<bool(const Case&)>;

/** Takes runs of elements out of @p part, a part of @p subject, halving their length each time. */
template <class Sequence>
bool ShrinkPart(Case& subject, Sequence& part, const Fails& fails)
{
    bool shrunk = false;
    for (std::size_t length = part.size(); length != 0; length /= 2)
    {
        for (std::size_t begin = 0; begin + length <= part.size();)
        {
            const Sequence before = part;
            const auto first = part.begin() + static_cast<std::ptrdiff_t>(begin);
            part.erase(first, first + static_cast<std::ptrdiff_t>(length));
            if (fails(subject))
            {
                shrunk = true;
            }
            else
            {
                part = before;
                ++begin;
            }
        }
    }
    return shrunk;
}

} // namespace

Case Shrunk(Case failing, const Fails& fails)
{
    bool shrunk = true;
    while (shrunk)
    {
        shrunk = ShrinkPart(failing, failing.operations, fails);
        shrunk = ShrinkPart(failing, failing.document, fails) || shrunk;
        for (Operation& operation : failing.operations)
        {
            shrunk = ShrinkPart(failing, operation.key, fails) || shrunk;
            shrunk = ShrinkPart(failing, operation.value, fails) || shrunk;
        }
    }
    return failing;
}

} // namespace kxmodel
