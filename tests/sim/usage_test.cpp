// What the program says to a person: help, and one sentence for each mistake.
#include <gmock/gmock.h>

#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

RunResult RunModemsim(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), BuiltProgram("modemsim"));
    return RunProgram(arguments, input);
}

TEST(Usage, AWrongOptionEndsWithOneSentenceAndStatus2) {
    const struct {
        std::vector<std::string> arguments;
        const char* sentence;
    } kMistakes[] = {
        {{"--info-dir", "/tmp"}, "--link-dir"},
        {{"--modem", "9999"}, "9999.json cannot be opened"},
        {{"--modem", "generic,color=red"}, "there is no setting 'color'; there are pin, puk"},
        {{"--modem", "generic,ports=dial/quick"}, "a port is dial, at or mute, not 'quick'"},
        {{"--modem", "generic,id=3", "--modem", "generic,id=3"}, "two modems have the id 3"},
        {{"--fault", "0.7:silent"}, "modem 0 has no port 7"},
        {{"--fault", "0:slow=soon"}, "the argument is a number up to 999999, not 'soon'"},
    };
    for (const auto& mistake : kMistakes) {
        SCOPED_TRACE(mistake.sentence);
        const RunResult result = RunModemsim(mistake.arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_THAT(result.err, AllOf(StartsWith("modemsim: "), HasSubstr(mistake.sentence)));
        EXPECT_EQ(result.err.find('\n'), result.err.size() - 1);
    }
}

TEST(Usage, AMalformedPersonalityIsNamedWithThePlaceInIt) {
    const struct {
        const char* text;
        const char* sentence;
    } kMistakes[] = {
        {"{\"extends\": \"generic\",\n ports}", "Line 2, Column 2"},
        {R"({"extends": "/tmp/p.json"})", "in a circle"},
        {R"({"extends": "generic", "ports": ["modem"]})", "'modem' is none of at, dial, mute"},
        {R"({"extends": "generic", "variables": {"echo": null}})", "'echo' is needed"},
        {R"({"extends": "generic", "commands": {"AT+X": {"effect": "explode"}}})",
         "at commands / AT+X / effect: 'explode' is none of change_pin, dial"},
        {R"({"extends": "generic", "commands": {"AT+X=*": {"set": {"no": 1}}}})",
         "at commands / AT+X=*: there is no variable 'no'"},
    };
    for (const auto& mistake : kMistakes) {
        SCOPED_TRACE(mistake.text);
        WriteFile("/tmp/p.json", mistake.text);
        const RunResult result = RunModemsim({"--modem", "/tmp/p.json"});
        EXPECT_EQ(result.status, 2);
        EXPECT_THAT(result.err, AllOf(StartsWith("modemsim: "), HasSubstr("/tmp/p.json"),
                                      HasSubstr(mistake.sentence), EndsWith(".\n")));
        EXPECT_EQ(result.err.find('\n'), result.err.size() - 1);
    }
}

TEST(Control, AnswersEachLineWithOkOrError) {
    const RunResult result =
        RunModemsim({"--control"},
                    "set 0 signal 31\n\nnonsense\nreceived 0\nreply 0 AT \"\\\"\n"
                    "set 5 signal 1\nfault 0.x silent\nfault 0\nquit\nset 0 signal 1\n");
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out,
                EndsWith("ready\n"
                         "ok\n"
                         "error: something is missing; see help\n"
                         "error: there is no command 'nonsense'; see help\n"
                         "[]\nok\n"
                         "error: a text as JSON is expected, such as \"\\r\\nOK\\r\\n\"\n"
                         "error: there is no modem 5\n"
                         "error: a port is a number up to 999999, not 'x'\n"
                         "error: there is no fault ''; there are silent, slow, pieces, "
                         "unsolicited, error, long, babble, vanish, noecho, garbage, off\n"
                         "ok\n"));
}

}  // namespace
}  // namespace taviwireless::test
