#include "cli/Completion.h"

#include "cli/LogMaskChoice.h"
#include "commands/Check.h"
#include "file/Engine.h"
#include "file/KeyTree.h"
#include "output/Failure.h"
#include "survey/KeyList.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include <signal.h>
#include <sys/time.h>
#include <unistd.h>

namespace
{

/** More keys than a person reads, or a shell quotes in an instant. */
const size_t kMostKeys = 500;

/** More bytes of keys would take a shell too long to quote. */
const size_t kMostBytes = 50000;

/** Then no more keys are listed; a load that takes longer ends the process soon after. */
const suseconds_t kMostMicroseconds = 700000;
const suseconds_t kMicrosecondsMore = 200000; // the rest of a second is the shell's

volatile sig_atomic_t g_isLate = 0;

void NoteLateness(int)
{
    if (g_isLate != 0)
    {
        _exit(0);
    }
    g_isLate = 1;
}

/** Limits the time that keys are listed, or the process takes, while the object lives. */
class TimeLimit
{
public:
    TimeLimit()
    {
        g_isLate = 0;
        struct sigaction note = {};
        note.sa_handler = NoteLateness;
        note.sa_flags = SA_RESTART;
        sigaction(SIGALRM, &note, &m_former);
        Start(kMostMicroseconds, kMicrosecondsMore);
    }

    ~TimeLimit()
    {
        Start(0, 0);
        signal(SIGALRM, SIG_IGN); // drops a signal that is still pending
        sigaction(SIGALRM, &m_former, nullptr);
    }

    TimeLimit(const TimeLimit&) = delete;
    TimeLimit& operator=(const TimeLimit&) = delete;

    static bool IsOver() { return g_isLate != 0; }

private:
    static void Start(suseconds_t first, suseconds_t more)
    {
        const itimerval timer = {{0, more}, {0, first}};
        setitimer(ITIMER_REAL, &timer, nullptr);
    }

    struct sigaction m_former = {};
};

bool StartsWith(const std::string& text, const std::string& start)
{
    return text.compare(0, start.size(), start) == 0;
}

/** A shell's completion works on lines. */
bool HasControlCharacters(const std::string& text)
{
    return std::any_of(text.begin(), text.end(),
                       [](unsigned char c) { return c < 0x20 || c == 0x7F; });
}

/** @return how many bytes @p one and @p other begin with alike. */
size_t CommonLength(const std::string& one, const std::string& other)
{
    const size_t most = std::min(one.size(), other.size());
    const auto end = one.begin() + static_cast<std::ptrdiff_t>(most);
    return static_cast<size_t>(std::mismatch(one.begin(), end, other.begin()).first - one.begin());
}

/** @return how many of @p keys are offered: two of them in any case. */
size_t NumberOffered(const std::vector<std::string>& keys)
{
    size_t bytes = 0;
    const auto end = std::find_if(keys.begin(), keys.end(),
                                  [&](const std::string& key)
                                  {
                                      bytes += key.size();
                                      return bytes > kMostBytes;
                                  });
    return std::clamp<size_t>(static_cast<size_t>(end - keys.begin()), 2, kMostKeys);
}

/** Leaves the first of the keys, and the one that is least like them: a shell completes what all
 * words that it is offered have in common. */
void Shorten(std::vector<std::string>& keys)
{
    const size_t count = NumberOffered(keys);
    if (keys.size() <= count)
    {
        return;
    }
    const auto last = keys.begin() + static_cast<std::ptrdiff_t>(count) - 1;
    std::iter_swap(last, std::min_element(last, keys.end(),
                                          [&](const std::string& one, const std::string& other) {
                                              return CommonLength(keys[0], one) <
                                                     CommonLength(keys[0], other);
                                          }));
    keys.resize(count);
}

/** @return the file that a user names so: no shell replaces "~" in a word that it completes. */
std::string InHome(const std::string& file)
{
    const char* const home = std::getenv("HOME");
    return StartsWith(file, "~/") && home != nullptr ? home + file.substr(1) : file;
}

/** @return the keys that start with @p start, as far as they are found in time. */
std::vector<std::string> KeysIn(const KeyElement* root, const std::string& start)
{
    std::vector<std::string> keys;
    Levels levels;
    VisitKeys(root, levels,
              [&](const ListedKey& listed)
              {
                  if (StartsWith(listed.key, start) && !HasControlCharacters(listed.key))
                  {
                      keys.push_back(listed.key);
                  }
                  return !TimeLimit::IsOver();
              });
    return keys;
}

/** @return the keys of the file that start with @p start. */
std::vector<std::string> KeysOf(const std::string& file, const std::string& start)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(file,
                                          error)) // from a pipe there might be nothing to read
    {
        return {};
    }
    const TimeLimit limit;
    const LogMaskChoice noRecords("none");
    const EngineSettings engine;
    const KeyTree document = LoadKeyTree(file);
    std::vector<std::string> keys = KeysIn(document.Root(), start);
    Shorten(keys);
    return keys;
}

/** @return the words that are valid for an argument of this kind, but for files and keys. */
std::vector<std::string> WordsOfType(const std::string& type)
{
    if (type == "WHEN")
    {
        return {"auto", "always", "never"};
    }
    if (type == "KIND")
    {
        return KindWords();
    }
    return type == "MASK" ? std::vector<std::string>{"warning", "error", "trace", "value",
                                                     "xpath",   "all",   "none"}
                          : std::vector<std::string>();
}

/** The words before the one that is completed, as the parser will understand them. */
class Line
{
public:
    Line(const CLI::App& app, const std::vector<std::string>& words)
        : m_app(app), m_current(words.back())
    {
        for (size_t i = 0; i + 1 < words.size(); ++i)
        {
            Read(words[i]);
        }
    }

    Completions Complete()
    {
        const bool isOption = m_optionsEnded ? false : StartsWith(m_current, "-");
        const size_t equals = m_current.find('=');
        if (m_waiting != nullptr)
        {
            OfferValues(m_waiting->get_type_name(), "");
        }
        else if (isOption && equals != std::string::npos)
        {
            const CLI::Option* const option = OptionNamed(m_current.substr(0, equals));
            OfferValues(option == nullptr ? "" : option->get_type_name(),
                        m_current.substr(0, equals + 1));
        }
        else if (isOption)
        {
            OfferOptions();
        }
        else
        {
            OfferArguments();
        }
        return m_completions;
    }

private:
    void Read(const std::string& word)
    {
        if (m_waiting != nullptr)
        {
            m_waiting = nullptr;
        }
        else if (m_optionsEnded || !StartsWith(word, "-") || word == "-")
        {
            ReadArgument(word);
        }
        else if (word == "--")
        {
            m_optionsEnded = true;
        }
        else
        {
            const CLI::Option* const option = OptionNamed(word);
            m_waiting = option != nullptr && TakesValue(*option) ? option : nullptr;
        }
    }

    void ReadArgument(const std::string& word)
    {
        if (m_command == nullptr)
        {
            const std::vector<const CLI::App*> named = m_app.get_subcommands(
                [&](const CLI::App* command) { return command->get_name() == word; });
            m_command = named.empty() ? nullptr : named.front();
        }
        else
        {
            m_arguments.push_back(word);
        }
    }

    static bool TakesValue(const CLI::Option& option)
    {
        return option.get_items_expected_min() > 0; // one that may lack its value has it after "="
    }

    const CLI::Option* OptionNamed(const std::string& name) const
    {
        const CLI::Option* const own =
            m_command == nullptr ? nullptr : m_command->get_option_no_throw(name);
        return own != nullptr ? own : m_app.get_option_no_throw(name);
    }

    void Offer(const std::string& text, const std::string& description)
    {
        if (StartsWith(text, m_current))
        {
            m_completions.words.push_back({text, description});
        }
    }

    void OfferOptionsOf(const CLI::App& app)
    {
        for (const CLI::Option* const option : app.get_options())
        {
            const bool isGeneral = &app == &m_app;
            const bool isElsewhere =
                isGeneral && m_command != nullptr &&
                (option->check_lname("version") || option->check_lname("help"));
            for (const std::string& name : option->get_lnames())
            {
                if (!isElsewhere)
                {
                    Offer("--" + name, option->get_description());
                }
            }
        }
    }

    void OfferOptions()
    {
        if (m_command != nullptr)
        {
            OfferOptionsOf(*m_command);
        }
        OfferOptionsOf(m_app);
    }

    void OfferValues(const std::string& type, const std::string& before)
    {
        if (type == "FILE")
        {
            OfferFile(before);
        }
        // Of several levels, joined by commas, the last one is completed.
        const size_t comma = type == "MASK" ? m_current.rfind(',') : std::string::npos;
        const std::string given =
            comma == std::string::npos ? before : m_current.substr(0, comma + 1);
        for (const std::string& word : WordsOfType(type))
        {
            Offer(given + word, "");
        }
    }

    void OfferFile(const std::string& before)
    {
        m_completions.isFile = true;
        m_completions.beforeTheFile = before;
    }

    void OfferCommands()
    {
        for (const CLI::App* const command : m_app.get_subcommands(nullptr))
        {
            Offer(command->get_name(), command->get_description());
        }
    }

    /** @return the name of the argument that the current word is; empty if there is none. */
    std::string ArgumentName() const
    {
        std::vector<const CLI::Option*> arguments = m_command->get_options(
            [](const CLI::Option* option) { return option->get_positional(); });
        if (m_arguments.size() < arguments.size())
        {
            return arguments[m_arguments.size()]->get_name(true);
        }
        const bool hasMore = arguments.back()->get_items_expected_max() > 1;
        return hasMore ? arguments.back()->get_name(true) : "";
    }

    void OfferArguments()
    {
        if (m_command == nullptr)
        {
            OfferCommands();
            return;
        }
        const std::string name = ArgumentName();
        if (name == "FILE" || name == "OTHER")
        {
            OfferFile("");
        }
        else if (name == "KEY" || name == "PREFIX")
        {
            OfferKeys();
        }
    }

    void OfferKeys()
    {
        for (const std::string& key : KeysOf(InHome(m_arguments.front()), m_current))
        {
            Offer(key, "");
        }
    }

    const CLI::App& m_app;
    const std::string m_current;
    const CLI::App* m_command = nullptr;
    const CLI::Option* m_waiting = nullptr; ///< the option whose value comes next
    bool m_optionsEnded = false;
    std::vector<std::string> m_arguments; ///< of the command
    Completions m_completions;
};

} // namespace

std::string Completions::Lines() const
{
    std::string lines = isFile ? "\t" + beforeTheFile + "\n" : "";
    for (const Word& word : words)
    {
        lines += word.text + (word.description.empty() ? "" : "\t" + word.description) + "\n";
    }
    return lines;
}

Completions Complete(const CLI::App& app, const std::vector<std::string>& words)
{
    try
    {
        return words.empty() ? Completions() : Line(app, words).Complete();
    }
    catch (const Failure&)
    {
        return {}; // a file that cannot be read has no keys
    }
}
