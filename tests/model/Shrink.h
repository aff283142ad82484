#ifndef KX_TESTS_MODEL_SHRINK_H
#define KX_TESTS_MODEL_SHRINK_H

#include "model/Case.h"

#include <functional>

namespace kxmodel
{

/**
 * Takes away from @p failing, which @p fails, whatever it fails without.
 *
 * @return a case that still fails, from which no operation and no run of bytes of its texts can be
 *         taken away.
 */
Case Shrunk(Case failing, const std::function<bool(const Case&)>& fails);

} // namespace kxmodel

#endif
