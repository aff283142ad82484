#include "ToolTest.h"

#include <algorithm>

#include <sys/stat.h>
#include <unistd.h>

using namespace kxtest;

namespace
{

class KxconfigCompletion : public ToolTest
{
protected:
    const std::string m_plain = m_folder.Write(
        "plain.xml", "<cfg><net id='1'><ip>a</ip></net><net id='2'><ip>b</ip></net></cfg>");

    /** @return what bash is offered when a user types @p line, without quotes, and then the tab
     * key. */
    static std::set<std::string> Completions(const std::string& line)
    {
        const std::string script = "set -u; kxconfig() { " + InShell(KX_CONFIG_TOOL) +
                                   " \"$@\"; }; . \"$1\"; COMP_LINE=$2; COMP_POINT=${#2}; "
                                   "_kxconfig kxconfig \"${2##*[ =@:|&]}\"; "
                                   "printf '%s\\n' \"${COMPREPLY[@]}\"";
        const Outcome outcome =
            RunProgram({"/bin/bash", "-c", script, "bash", KX_COMPLETION, line});
        EXPECT_EQ("", outcome.err) << line;
        std::istringstream words(outcome.out);
        std::set<std::string> offered;
        for (std::string word; std::getline(words, word);)
        {
            offered.insert(word);
        }
        offered.erase("");
        return offered;
    }
};

/** What a user sees who types into a bash that works in the directory. */
class KxconfigTyped : public ToolTest
{
protected:
    void SetUp() override
    {
        if (!HasTerminals())
        {
            GTEST_SKIP() << "needs a terminal, and this machine gives out none";
        }
    }

    /** @return @p line as it is after the tab key. */
    std::string Completed(const std::string& line) const
    {
        const std::string shown = Type("line", line);
        return shown.substr(0, shown.find('\n'));
    }

    /** @return the arguments that kxconfig gets, one on a line, if @p line is entered then. */
    std::string Entered(const std::string& line) const { return Type("arguments", line); }

private:
    std::string Type(const std::string& wanted, const std::string& line) const
    {
        const std::string script = "cd \"$1\"; shift; exec \"$@\"";
        const Outcome outcome =
            RunProgram({"/bin/bash", "-c", script, "bash", m_folder.Path(""), KX_PYTHON,
                        KX_TYPE_IN_BASH, KX_COMPLETION, KX_CONFIG_TOOL, wanted, line});
        EXPECT_EQ(0, outcome.status) << outcome.err;
        return outcome.out;
    }
};

} // namespace

TEST_F(KxconfigCompletion, OffersTheCommandsThatHelpLists)
{
    EXPECT_EQ(m_verbs, Completions("kxconfig "));
    EXPECT_EQ(std::set<std::string>{"explain"}, Completions("kxconfig --json e"));
    const std::string help = Tool({"--help"}).out;
    for (const std::string& verb : m_verbs)
    {
        EXPECT_THAT(help, testing::HasSubstr("\n  " + verb + " "));
    }
}

TEST_F(KxconfigCompletion, OffersTheOptionsThatHelpLists)
{
    std::set<std::string> general = OptionsOf(Tool({"--help"}).out);
    EXPECT_EQ(general, Completions("kxconfig -"));
    general.erase("--version");
    for (const std::string& verb : m_verbs)
    {
        std::set<std::string> options = OptionsOf(Tool({verb, "--help"}).out);
        options.insert(general.begin(), general.end());
        EXPECT_EQ(options, Completions("kxconfig " + verb + " --"));
    }
}

TEST_F(KxconfigCompletion, OffersTheFilesKeys)
{
    const std::set<std::string> both = {"cfg.net@id=1.ip", "cfg.net@id=2.ip"};
    for (const std::string verb : {"get", "set", "explain", "check", "--log-mask error get"})
    {
        EXPECT_EQ(both, Completions("kxconfig " + verb + " " + m_plain + " ")) << verb;
    }
    // What bash takes for a word of its own is not repeated.
    EXPECT_EQ(std::set<std::string>{"2.ip"},
              Completions("kxconfig get " + m_plain + " cfg.net@id=2"));
    EXPECT_EQ(std::set<std::string>{}, Completions("kxconfig get /missing.xml c"));
    EXPECT_EQ(std::set<std::string>{}, Completions("kxconfig find " + m_plain + " c"));
}

TEST_F(KxconfigCompletion, OffersFilesAndLevels)
{
    EXPECT_EQ(std::set<std::string>{m_plain},
              Completions("kxconfig get " + m_plain.substr(0, m_plain.size() - 2)));
    EXPECT_EQ(std::set<std::string>{m_plain},
              Completions("kxconfig set --output " + m_plain.substr(0, m_plain.size() - 2)));
    EXPECT_EQ((std::set<std::string>{"trace"}), Completions("kxconfig --log-mask t"));
}

TEST_F(KxconfigCompletion, OffersFilesAfterAnEqualsSign)
{
    // Bash breaks words there, and keeps what stands in front.
    EXPECT_EQ(std::set<std::string>{m_plain},
              Completions("kxconfig set --output=" + m_plain.substr(0, m_plain.size() - 2)));
    EXPECT_EQ(std::set<std::string>{"trace"}, Completions("kxconfig --log-mask=t"));
    EXPECT_EQ(std::set<std::string>{"error,trace"}, Completions("kxconfig --log-mask error,t"));
}

TEST_F(KxconfigCompletion, OffersKinds)
{
    const std::set<std::string> kinds = {"several-values", "suspended-condition"};
    EXPECT_EQ(kinds, Completions("kxconfig check --only s"));
    EXPECT_EQ(kinds, Completions("kxconfig check --ignore=s"));
}

TEST_F(KxconfigCompletion, QuotesKeys)
{
    const std::string file =
        m_folder.Write("evil.xml", "<cfg><n id='a b;touch x;$(id)'><v>1</v></n>"
                                   "<n id='zz'><v>2</v></n></cfg>");
    EXPECT_EQ((std::set<std::string>{"a\\ b\\;touch\\ x\\;\\$\\(id\\).v"}),
              Completions("kxconfig get " + file + " cfg.n@id=a"));
}

TEST_F(KxconfigCompletion, DoesNotWaitForAFileThatNobodyWrites)
{
    const std::string pipe = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    EXPECT_EQ(std::set<std::string>{}, Completions("kxconfig get " + pipe + " c"));
}

TEST_F(KxconfigTyped, KeyOfAFileIsOneArgumentWhateverItHolds)
{
    m_folder.Write("evil.xml", "<cfg><n id='a b;touch PWNED;$(touch PWNED)'><v>1</v></n>"
                               "<n id='zz'><v>2</v></n></cfg>");
    for (const std::string quote : {"", "'", "\""})
    {
        EXPECT_EQ("get\nevil.xml\ncfg.n@id=a b;touch PWNED;$(touch PWNED).v\n",
                  Entered("kxconfig get evil.xml " + quote + "cfg.n@id=a"));
    }
    EXPECT_FALSE(FileExists(m_folder.Path("PWNED")));
}

TEST_F(KxconfigTyped, KeyIsQuotedAsTheQuoteInFrontOfItAsks)
{
    m_folder.Write("odd.xml",
                   "<cfg><n id=\"a'b\"><v>1</v></n><n id='c\"d\\e$f`g!h'><v>2</v></n></cfg>");
    EXPECT_EQ("kxconfig get odd.xml cfg.n@id=a\\'b.v ",
              Completed("kxconfig get odd.xml cfg.n@id=a"));
    EXPECT_EQ("kxconfig get odd.xml 'cfg.n@id=a'\\''b.v' ",
              Completed("kxconfig get odd.xml 'cfg.n@id=a"));
    for (const std::string quote : {"", "'", "\""})
    {
        EXPECT_EQ("get\nodd.xml\ncfg.n@id=c\"d\\e$f`g!h.v\n",
                  Entered("kxconfig get odd.xml " + quote + "cfg.n@id=c"));
    }
}

TEST_F(KxconfigTyped, KeyIsCompletedBehindAnEscapeAndInTheMiddleOfAQuote)
{
    m_folder.Write("cfg.xml", "<cfg><n id=\"it's;\"><v>1</v></n><n id='a b'><v>2</v></n></cfg>");
    EXPECT_EQ("kxconfig get cfg.xml cfg.n@id=a\\ b.v ",
              Completed("kxconfig get cfg.xml cfg.n@id=a\\ "));
    EXPECT_EQ("kxconfig get cfg.xml 'cfg.n@id=it'\\''s;.v' ",
              Completed("kxconfig get cfg.xml 'cfg.n@id=it'\\''s"));
}

TEST_F(KxconfigTyped, FolderIsGoneInto)
{
    ASSERT_EQ(0, mkdir(m_folder.Path("sub").c_str(), 0700));
    m_folder.Write("sub/in.xml", "<cfg/>");
    EXPECT_EQ("kxconfig keys sub/", Completed("kxconfig keys su"));
    EXPECT_EQ("kxconfig keys sub/in.xml ", Completed("kxconfig keys sub/"));
    EXPECT_EQ("kxconfig set --output=sub/", Completed("kxconfig set --output=su"));
}

TEST_F(KxconfigTyped, NameOfAFileIsQuoted)
{
    m_folder.Write("sp ace;.xml", "<cfg><name>box</name></cfg>");
    EXPECT_EQ("kxconfig get sp\\ ace\\;.xml ", Completed("kxconfig get sp"));
    EXPECT_EQ("kxconfig get 'sp ace;.xml' ", Completed("kxconfig get 'sp"));
    EXPECT_EQ("kxconfig set --output=sp\\ ace\\;.xml ", Completed("kxconfig set --output=sp"));
}

TEST_F(KxconfigTyped, KeysOfAFileWithAQuotedNameAreOffered)
{
    m_folder.Write("sp ace.xml", "<cfg><name>box</name></cfg>");
    EXPECT_EQ("kxconfig get sp\\ ace.xml cfg.name ", Completed("kxconfig get sp\\ ace.xml c"));
    EXPECT_EQ("kxconfig get \"sp ace.xml\" cfg.name ", Completed("kxconfig get \"sp ace.xml\" c"));
}

namespace
{

/** The completions for the other shells, where these are installed. */
class KxconfigOtherShells : public ToolTest
{
protected:
    const std::string m_bin = m_folder.Path("bin");
    const std::string m_file = m_folder.Write(
        "odd.xml", "<cfg><net id=\"it's $(touch evil)\"><ip>b</ip></net><net/></cfg>");

    void SetUp() override
    {
        ASSERT_EQ(0, mkdir(m_bin.c_str(), 0700));
        ASSERT_EQ(0, symlink(KX_CONFIG_TOOL, (m_bin + "/kxconfig").c_str()));
    }

    static bool IsInstalled(const std::string& shell)
    {
        return access(("/usr/bin/" + shell).c_str(), X_OK) == 0;
    }

    /** Runs a command with kxconfig in PATH, in the folder. */
    std::string InFolder(const std::vector<std::string>& command) const
    {
        const std::string script = "cd \"$1\" && export HOME=$1 PATH=$1/bin:$PATH; shift; \"$@\"";
        std::vector<std::string> words = {"/bin/bash", "-c", script, "bash", m_folder.Path("")};
        words.insert(words.end(), command.begin(), command.end());
        return RunProgram(words).out;
    }

    /** @return the line as it is after the tab key. */
    std::string InZsh(const std::string& line) const
    {
        InFolder({"mkdir", "-p", "functions"});
        InFolder({"cp", KX_COMPLETIONS "/kxconfig.zsh", "functions/_kxconfig"});
        InFolder({"rm", "-f", "answer"});
        return InFolder({"zsh", "-f", KX_TYPE_IN_ZSH, m_folder.Path("functions"),
                         m_folder.Path("answer"), line});
    }

    /** @return the words that fish offers. */
    std::string InFish(const std::string& line) const
    {
        return InFolder({"fish", "--no-config", "-c",
                         "source $argv[1]; complete -C $argv[2] | string replace -r '\\t.*' ''",
                         KX_COMPLETIONS "/kxconfig.fish", line});
    }
};

} // namespace

TEST_F(KxconfigOtherShells, ZshOffersAndQuotes)
{
    if (!IsInstalled("zsh") || !HasTerminals())
    {
        GTEST_SKIP() << "needs zsh and a terminal";
    }
    EXPECT_EQ("kxconfig explain \n", InZsh("kxconfig ex"));
    EXPECT_EQ("kxconfig get odd.xml \n", InZsh("kxconfig get od"));
    EXPECT_EQ("kxconfig set --output=odd.xml \n", InZsh("kxconfig set --output=od"));
    EXPECT_EQ("kxconfig get odd.xml cfg.net@id=it\\'s\\ \\$\\(touch\\ evil\\).ip \n",
              InZsh("kxconfig get odd.xml cfg"));
    EXPECT_EQ("kxconfig get odd.xml 'cfg.net@id=it'\\''s $(touch evil).ip' \n",
              InZsh("kxconfig get odd.xml 'cfg"));
    EXPECT_NE(0, access(m_folder.Path("evil").c_str(), F_OK));
}

TEST_F(KxconfigOtherShells, FishOffers)
{
    if (!IsInstalled("fish"))
    {
        GTEST_SKIP() << "needs fish";
    }
    EXPECT_EQ("explain\n", InFish("kxconfig ex"));
    EXPECT_EQ("odd.xml\n", InFish("kxconfig get od"));
    EXPECT_EQ("--output=odd.xml\n", InFish("kxconfig set --output=od"));
    EXPECT_EQ("cfg.net@id=it's $(touch evil).ip\n", InFish("kxconfig get odd.xml c"));
    EXPECT_NE(0, access(m_folder.Path("evil").c_str(), F_OK));
}

TEST_F(KxconfigCompletion, OffersAFewOfManyKeysWithoutCompletingTooMuch)
{
    std::string xml = "<cfg><a>1</a>";
    for (int i = 0; i != 1000; ++i)
    {
        xml += "<net id='" + std::to_string(i) + "'><ip>x</ip></net>";
    }
    const std::string file = m_folder.Write("many.xml", xml + "<b>2</b></cfg>");
    const Outcome offered = Tool({"--complete", "get", file, "cfg."});
    EXPECT_EQ(500, std::count(offered.out.begin(), offered.out.end(), '\n'));
    EXPECT_THAT(offered.out, testing::StartsWith("cfg.a\n"));
    const Outcome nets = Tool({"--complete", "get", file, "cfg.net"});
    EXPECT_EQ(500, std::count(nets.out.begin(), nets.out.end(), '\n'));
    EXPECT_EQ("cfg.b\n", Tool({"--complete", "get", file, "cfg.b"}).out);
}

/** What the program offers to any shell. */
class KxconfigComplete : public ToolTest
{
protected:
    /** @return the lines for the last of @p words. */
    static std::string Complete(std::vector<std::string> words)
    {
        words.insert(words.begin(), "--complete");
        return Tool(words, {"HOME=/nowhere"}).out;
    }

    const std::string m_plain = m_folder.Write(
        "plain.xml", "<cfg><a i='1'>x</a><a i='&#127;'>y</a><a i='&#9;'>z</a></cfg>");
};

TEST_F(KxconfigComplete, OffersNothingForNoWord)
{
    EXPECT_EQ("", Complete({}));
}

TEST_F(KxconfigComplete, OffersTheWordsOfAnOption)
{
    EXPECT_EQ("auto\nalways\nnever\n", Complete({"get", "--color", ""}));
    EXPECT_EQ("--color=auto\n--color=always\n", Complete({"--color=a"}));
    EXPECT_EQ("error,warning\n", Complete({"--log-mask", "error,w"}));
    EXPECT_EQ("several-values\n", Complete({"check", "--only", "sev"}));
    EXPECT_EQ("", Complete({"--nothing=a"}));
    EXPECT_EQ("\t\n", Complete({"set", "f.xml", "--output", ""}));
    EXPECT_EQ("\t--output=\n", Complete({"set", "f.xml", "--output=x"}));
}

TEST_F(KxconfigComplete, GoesOnAfterTheValueOfAnOption)
{
    EXPECT_EQ("\t\n", Complete({"--color", "never", "get", ""}));
    EXPECT_EQ("\t\n", Complete({"get", "--nothing", ""}));
    EXPECT_EQ("\t\n", Complete({"get", "--json", ""}));
}

TEST_F(KxconfigComplete, OffersNoOptionsBehindTheSeparator)
{
    EXPECT_EQ("\t\n", Complete({"get", "--", "-"}));
    EXPECT_EQ("", Complete({"get", "--", "-", "-"}));
    EXPECT_EQ("", Complete({"get", "-", ""})); // standard input is not read
}

TEST_F(KxconfigComplete, OffersKeysWithoutControlCharacters)
{
    EXPECT_EQ("cfg.a@i=1\ncfg.a\n", Complete({"get", m_plain, "cfg"}));
    EXPECT_EQ("cfg.a@i=1\n", Complete({"get", m_plain, "cfg.b", "cfg.a@"}));
    EXPECT_EQ("cfg.a@i=1\ncfg.a\n", Complete({"keys", m_plain, ""}));
}

TEST_F(KxconfigComplete, OffersNothingWhereNothingIsKnown)
{
    EXPECT_EQ("", Complete({"get", m_folder.Write("broken.xml", "<cfg>"), ""}));
    EXPECT_EQ("", Complete({"get", m_folder.Path("missing.xml"), ""}));
    EXPECT_EQ("", Complete({"get", "~/missing.xml", ""}));
    EXPECT_EQ("", Complete({"remove", m_plain, "/cfg/a", ""}));
    EXPECT_EQ("", Complete({"set", m_plain, "cfg.a", ""}));
    EXPECT_EQ("\t\n", Complete({"diff", m_plain, ""}));
}

TEST_F(KxconfigComplete, AnUnknownCommandIsNone)
{
    EXPECT_EQ("get\t", Complete({"nothing", "ge"}).substr(0, 4));
}
