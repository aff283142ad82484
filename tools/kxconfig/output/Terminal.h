#ifndef KX_TOOLS_TERMINAL_H
#define KX_TOOLS_TERMINAL_H

#include <cstddef>
#include <iosfwd>

/** @return whether @p stream is one of the process's own, and that is a terminal. */
bool IsTerminal(const std::ostream& stream);

/** @return whether the environment's terminal understands no control sequences, or is none. */
bool IsDumbTerminal();

/** @return the columns that a text for standard output is wrapped at: those that COLUMNS states,
 * those of the terminal, or 80. */
size_t OutputWidth();

#endif
