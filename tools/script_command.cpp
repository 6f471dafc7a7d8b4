// `pexupdate script "TEXT"`: for people who write content files. Parses and checks a
// dynamic-field text the way the updater does for a row's "DynamicFieldInfo" column, and shows
// what it means and why it would be refused.
#include <cstdio>
#include <string>
#include <vector>

#include "expr/execution_plan.h"
#include "expr/expression_text.h"
#include "tools/command.h"

namespace {

const char kUsage[] =
    "usage: pexupdate script \"TEXT\"\n\n"
    "Parses TEXT as the dynamic-field script of a content-file row (the \"DynamicFieldInfo\"\n"
    "column, after the row's &#x2C; escapes are decoded), checks it against the language's\n"
    "names and types, and prints each assignment of the plan and every validation comment.\n"
    "A text that does not parse gets the parser's own message (\"syntax error\") first.\n"
    "Exit status: 0 when the text is valid, 1 when it does not parse or is not valid.\n";

int RunScript(const std::vector<std::string>& args) {
    if (args.size() != 1 || args[0] == "--help") {
        bool help = args.size() == 1;
        std::fputs(kUsage, help ? stdout : stderr);
        return help ? 0 : 2;
    }
    ExecutionPlan plan;
    bool parsed = plan.Parse(args[0]);
    for (std::size_t i = 0; i < plan.Items().size(); ++i) {
        std::printf("item %zu: %s\n", i + 1, ExpressionText(plan.Items()[i]).c_str());
    }
    if (!parsed) {
        std::printf("not valid: the text does not parse\n");
        return 1;
    }
    bool valid = plan.Validate();
    for (const std::string& comment : plan.Comments()) std::printf("comment: %s\n", comment.c_str());
    std::printf(valid ? "valid\n" : "not valid\n");
    return valid ? 0 : 1;
}

const pextool::CommandRegistrar kScript({"script", "parse and check a dynamic-field script",
                                         RunScript});

}  // namespace
