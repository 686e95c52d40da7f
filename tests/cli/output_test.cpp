#include <gmock/gmock.h>
#include <json/json.h>

#include "cli/report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {
namespace {

TEST(Output, AlignsColumnsByCharactersNotBytes) {
    EXPECT_EQ(Render(Options(), {{{"NAME", "X"}, {"Zürich", "1"}, {"A", ""}}, {}}),
              "NAME    X\nZürich  1\nA\n");
}

TEST(Output, JsonStaysJsonWhateverTheModemSays) {
    Report report;
    report.document["text"] = std::string("a\"\n\x1b\xff");
    Options options;
    options.json = true;
    Json::Value parsed;
    std::string errors;
    std::istringstream printed(Render(options, report));
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), printed, &parsed, &errors));
    EXPECT_EQ(parsed["text"].asString().substr(0, 4), "a\"\n\x1b");
}

}  // namespace
}  // namespace taviwireless::cli
