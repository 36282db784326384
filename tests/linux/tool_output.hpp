// The command-line tools the tests compare the substitute with (ip, ethtool, ...).
#pragma once

#include <optional>
#include <string>

namespace orv::linuxtest {

// Standard output of a shell command; nothing when it exits with a failure.
std::optional<std::string> toolOutput(const std::string& command);
// Runs a command; true when it exits with success.
bool runTool(const std::string& command);
// The value after "key:" on the first line that starts with key (after blanks),
// as ethtool prints its settings; empty when there is none.
std::string fieldAfter(const std::string& text, const std::string& key, int occurrence = 0);

}  // namespace orv::linuxtest
