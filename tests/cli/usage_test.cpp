// SPDX-License-Identifier: MIT
// What the program says of its command line: mistakes, help, completion, and output that nobody takes.
#include "base/split.h"
#include "tests/cli/cli_runs.h"
#include "tests/support/terminal.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::SizeIs;
using testing::StartsWith;

using Words = std::vector<std::string>;

RunResult Call(const std::string& words, const std::string& program = "taviwireless") {
    Words argv = Split(words, ' ');
    argv.insert(argv.begin(), BuiltProgram(program));
    return RunProgram(argv);
}

TEST(Usage, MistakesAreNamedWithWhatWasMeantAndItsHelp) {
    const struct {
        std::string words;
        std::string sentence;
    } kMistakes[] = {
        {"modem shwo",
         "there is no command \"shwo\" in modem (did you mean \"show\"?); see "
         "taviwireless modem --help"},
        {"wifi xyzzy x", "there is no command \"xyzzy\" in wifi; see taviwireless wifi --help"},
        {"scan",
         "there is no command \"scan\" (did you mean \"taviwireless wifi scan\"?); see "
         "taviwireless --help"},
        {"help modem lst",
         "there is no command \"lst\" in modem (did you mean \"list\"?); see "
         "taviwireless modem --help"},
        {"--verison",
         "there is no option \"--verison\" (did you mean \"--version\"?); see "
         "taviwireless --help"},
        {"modem list --jsn=1",
         "there is no option \"--jsn\" in modem list (did you mean "
         "\"--json\"?); see taviwireless modem list --help"},
        {"wifi scan -- --what", "wifi scan takes no argument: \"--what\" is too many; see "},
        {"modem --json=no list", "--json takes no value; see "},
        {"modem list --timeout", "--timeout wants a value: "},
        {"modem list --timeout 1h", "--timeout: \"1h\" is no number from 1 to 3600; see "},
        {"wifi mode clint",
         "MODE: \"clint\" is none of ap, client (did you mean \"client\"?); see "},
        {"wifi connect X --dhcp --static 1", "--static and --dhcp exclude each other; see "},
        {"wifi connect X --security wpa", "--security is for use with --hidden only; see "},
        {"modem show", "modem show wants ID ("},
        {"pin", "there is no command \"pin\" (did you mean \"taviwireless modem pin\"?); see "},
        {"modem pin", "modem pin wants a command: set, protect, unprotect; see "},
        {"modem \033[2J", "there is no command \"?[2J\" in modem; see "},
    };
    for (const auto& mistake : kMistakes) {
        SCOPED_TRACE(mistake.words);
        const RunResult result = Call(mistake.words);
        EXPECT_EQ(result.status, kUsage);
        EXPECT_THAT(result.err, StartsWith("taviwireless: " + mistake.sentence));
    }
    EXPECT_EQ(Parse(Call("modem shwo --json").out)["error"].asString() + "\n",
              Call("modem shwo").err.substr(strlen("taviwireless: ")));
    EXPECT_THAT(Call("--fist-port 3", "modemsim").err,
                StartsWith("modemsim: there is no option \"--fist-port\" (did you mean "
                           "\"--first-port\"?); see modemsim --help"));
}

TEST(Usage, OptionsOfTheProgramStandAnywhere) {
    for (const char* words :
         {"--json --timeout 5 modem --direct list", "modem list --direct --json",
          "modem --timeout 5 --json list --direct --timeout 6"}) {
        EXPECT_EQ(Call(words).out, "[]\n") << words;
    }
}

size_t LongestLine(const std::string& text) {
    size_t longest = 0;
    for (const std::string& line : Lines(text)) {
        longest = std::max(longest, line.substr(0, line.find('\r')).size());
    }
    return longest;
}

TEST(Usage, HelpIsThereAtEveryLevelAndFits) {
    for (const char* words : {"help", "help modem", "help wifi connect", "ap help set"}) {
        Words argv = Split(words, ' ');
        argv.insert(argv.begin(), BuiltProgram("taviwireless"));
        const std::string page = RunProgram(argv).out;
        EXPECT_THAT(page, StartsWith("Usage: taviwireless ")) << words;
        EXPECT_LE(LongestLine(page), 80u) << words;
        for (const unsigned short columns : {40, 80, 200}) {
            Terminal terminal(argv, columns);
            EXPECT_EQ(terminal.Wait(), 0);
            EXPECT_LE(LongestLine(terminal.Shown()), columns) << terminal.Shown();
            EXPECT_EQ(terminal.Shown().find('\033'), std::string::npos);
        }
    }
    EXPECT_EQ(Call("help modem list").out, Call("modem list --help").out);
    EXPECT_THAT(Call("modem --help").out, HasSubstr("\n  disconnect  Hang up\n"));
}

TEST(Usage, OutputThatNobodyTakesIsAFailure) {
    for (const char* words : {"--help", "help modem", "--version", "modem --direct list",
                              "modem --direct list --json"}) {
        for (const char* output : {"> /dev/full", ">&-", "| true"}) {
            const std::string script = "{ \"$0\" " + std::string(words) + "; echo $? >&2; } ";
            const RunResult result =
                RunProgram({"sh", "-c", "trap '' PIPE; (sleep 0.1; " + script + ") " + output,
                            BuiltProgram("taviwireless")});
            EXPECT_THAT(result.err, StartsWith("taviwireless: ")) << words << output;
            EXPECT_THAT(Lines(result.err), ElementsAre(HasSubstr("output"), "1"));
        }
    }
}

// What may stand for the last of the words.
Words Completed(Words words) {
    words.insert(words.begin(), {BuiltProgram("taviwireless"), "complete-words", "--"});
    return Lines(RunProgram(words).out);
}

constexpr char kSaved[] = "/usr/tavi/etc/wireless.conf";
constexpr char kNames[] =
    "[1]\n\tESSID=My Home\n"
    "[2]\n\tESSID=It's \"d\" $x\n"
    "[3]\n\tESSID=a:b c\n";

TEST(Usage, WordsAreCompleted) {
    WriteFile("/tmp/usbmodem.info3", "CONNECTNODE=77\nDEVICENODE=77\n");
    WriteFile(kSaved, kNames);
    EXPECT_THAT(Completed({"modem", "s"}), ElementsAre("show", "status"));
    EXPECT_THAT(Completed({"help", "wi"}), ElementsAre("wifi"));
    EXPECT_THAT(Completed({"modem", "list", "--t"}), ElementsAre("--timeout"));
    EXPECT_THAT(Completed({"wifi", "connect", "X", "--security", "wpa2"}),
                ElementsAre("wpa2", "wpa2-eap"));
    EXPECT_THAT(Completed({"modem", "show", ""}), ElementsAre("usbmodem3"));
    EXPECT_THAT(Completed({"modem", "show", "usbmodem3", ""}), SizeIs(0));
    EXPECT_THAT(Completed({"modem", "shwo", ""}), SizeIs(0));
    EXPECT_THAT(Completed({"wifi", "connect", "\"My H"}), ElementsAre("My Home"));
}

// Types what a person does; the words are shown as the program would get them.
TEST(Usage, BashCompletesNamesWithBlanksAndQuotes) {
    WriteFile(kSaved, kNames);
    Terminal shell({"env", "PS1=ready> ", "bash", "--norc", "--noprofile", "-i"}, 200);
    ASSERT_TRUE(shell.Await("ready> "));  // what comes earlier is not typed into the shell's line
    shell.Type("taviwireless() { if [ $1 = complete-words ]; then '" +
               BuiltProgram("taviwireless") +
               "' \"$@\"; else printf '<%s>' \"$@\"; fi; }; "
               ". '" TAVI_SOURCE_DIR "/packaging/taviwireless.bash'\n");
    const std::pair<const char*, const char*> kTyped[] = {
        {"My\\ H\t\n", "<My Home>"},      {"\"My H\t\n", "<My Home>"},
        {"It\\'\t\n", "<It's \"d\" $x>"}, {"'It\t\n", "<It's \"d\" $x>"},
        {"\"It\t\n", "<It's \"d\" $x>"},  {"a:\t\n", "<a:b c>"},
    };
    for (const auto& [typed, word] : kTyped) {
        ASSERT_TRUE(shell.Await("ready> "));
        shell.Type("taviwireless wifi saved show " + std::string(typed));
        ASSERT_TRUE(shell.Await(std::string("<wifi><saved><show>") + word)) << shell.Shown();
    }
    shell.Type("exit\n");
    shell.Wait();
}

}  // namespace
}  // namespace taviwireless::test
