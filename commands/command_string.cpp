#include "commands/command_string.h"

#include <cstddef>
#include <vector>

#include "commands/item_list.h"
#include "diag/trace_log.h"

struct CommandString::CommandRow {
    const char* tag;
    std::size_t length;
    void (CommandString::*executor)(std::string);
    bool ignoreErrors;
};

// Searched in this order; each tag is compared over its own full length, so [DEL] never
// takes a [DELIFEXISTS] item or the reverse.
const CommandString::CommandRow* CommandString::FindCommand(const std::string& item) {
    static const CommandRow kRows[] = {
        {"[RUN]", 5, &CommandString::ExecuteRun, false},
        {"[DEL]", 5, &CommandString::ExecuteDel, false},
        {"[DELIFEXISTS]", 13, &CommandString::ExecuteDelIfExists, false},
        {"[REGSVR]", 8, &CommandString::ExecuteRegSvr, false},
        {"[REGISTRY]", 10, &CommandString::ExecuteRegistry, false},
        {"[TRY-RUN]", 9, &CommandString::ExecuteRun, true},
        {"[TRY-DEL]", 9, &CommandString::ExecuteDel, true},
        {"[TRY-DELIFEXISTS]", 17, &CommandString::ExecuteDelIfExists, true},
        {"[TRY-REGSVR]", 12, &CommandString::ExecuteRegSvr, true},
        {"[TRY-REGISTRY]", 14, &CommandString::ExecuteRegistry, true},
    };
    for (const CommandRow& row : kRows) {
        std::string head = item.substr(0, row.length);
        for (char& c : head) {
            if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
        }
        if (head == row.tag) return &row;
    }
    return nullptr;
}

namespace {

std::uint32_t g_runTimeoutMs = CommandString::kDefaultRunTimeoutMs;

}  // namespace

CommandString::CommandString(const std::string& directory) : directory_(directory) {}

CommandString::~CommandString() = default;

std::uint32_t CommandString::RunTimeoutMs() { return g_runTimeoutMs; }

void CommandString::SetRunTimeoutMs(std::uint32_t timeoutMs) { g_runTimeoutMs = timeoutMs; }

bool CommandString::Execute(std::string commands) {
    const std::vector<std::string> items = SplitItemList(commands);
    TRACE(g_TraceLog, "CommandString::Execute %d items in command list", static_cast<int>(items.size()));
    bool allSucceeded = true;
    for (const std::string& item : items) {
        TRACE(g_TraceLog, "CommandString::Execute, command is %s", item.c_str());
        const CommandRow* row = FindCommand(item);
        if (!row) continue;
        try {
            (this->*row->executor)(TrimItem(item.substr(row->length)));
            TRACE(g_TraceLog, "Command [%s] Complete.", row->tag);
        } catch (const char* message) {
            allSucceeded = false;
            if (!row->ignoreErrors) {
                TRACE(g_TraceLog, "Throwing Exception [%s] from Command [%s].", message, row->tag);
                throw;
            }
            TRACE(g_TraceLog, "Ignoring Exception [%s] from Command [%s].", message, row->tag);
        } catch (...) {
            allSucceeded = false;
            if (!row->ignoreErrors) {
                TRACE(g_TraceLog, "Throwing unknown Exception from Command [%s].", row->tag);
                throw;
            }
            TRACE(g_TraceLog, "Ignoring unknown Exception from Command [%s].", row->tag);
        }
    }
    TRACE(g_TraceLog, "CommandString::Execute returning %d", allSucceeded ? 1 : 0);
    return allSucceeded;
}
