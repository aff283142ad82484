#ifndef KX_TOOLS_COMPLETION_H
#define KX_TOOLS_COMPLETION_H

#include <string>
#include <vector>

namespace CLI
{
class App;
}

/** What can stand in the place of a word. */
struct Completions
{
    struct Word
    {
        std::string text;
        std::string description; ///< may be empty
    };

    std::vector<Word> words;
    bool isFile = false;       ///< the shell offers the names of files instead
    std::string beforeTheFile; ///< what of the word precedes the name, such as "--output="

    /** @return a line "text<TAB>description" for each word, or "<TAB>beforeTheFile". */
    std::string Lines() const;
};

/**
 * Completes the last of @p words for the completion of a shell, from the commands and options of
 * @p app and from the file that the words name. At most a second passes: then the process ends.
 *
 * @param words  what follows the program's name, up to the cursor.
 */
Completions Complete(const CLI::App& app, const std::vector<std::string>& words);

#endif
