#pragma once

#include "cli/commands.h"

#include <QString>
#include <vector>

namespace quotas::cli {

// The exit statuses every command keeps to.
struct ExitStatus {
    int code;
    const char* text;
};
const std::vector<ExitStatus>& exitStatuses();

// "quotas --help": the general options, every command with its summary, the
// exit statuses.
QString generalHelp();
// "quotas COMMAND --help": its synopsis, what it does, one line per option.
QString commandHelp(const Command& command);
// "gerar --ano A --mes M [--no-tap N]"
QString synopsis(const Command& command);
// "quotas 1.0"
QString versionText();

}  // namespace quotas::cli
