// libFuzzer target for the heartbeat interval's configuration reader: for any
// file content the line scanner's digit run lies within the line, holds only
// digits, has no "#" and no digit before it and no digit after it; and the
// setting read is accepted only at 30 or more, refused only below 30.
#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>

#include "Heartbeat-Config.h"

namespace {

void check(bool condition) {
    if (!condition) {
        __builtin_trap();
    }
}

bool isDigit(char c) { return c >= '0' && c <= '9'; }

void checkScan(const std::string& line) {
    const Heartbeat::DigitRun run = Heartbeat::scanIntervalLine(line);
    check(run.start <= line.size() && run.length <= line.size() - run.start);
    if (run.length == 0) {
        return;
    }
    for (std::size_t at = 0; at < run.start; ++at) {
        check(!isDigit(line[at]) && line[at] != '#');
    }
    for (std::size_t at = run.start; at < run.start + run.length; ++at) {
        check(isDigit(line[at]));
    }
    check(run.start + run.length == line.size() || !isDigit(line[run.start + run.length]));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string content(reinterpret_cast<const char*>(data), size);
    std::istringstream lines(content);
    std::string line;
    while (std::getline(lines, line)) {
        checkScan(line);
    }
    std::istringstream config(content);
    const Heartbeat::IntervalSetting setting = Heartbeat::readIntervalSetting(config);
    using Kind = Heartbeat::IntervalSetting::Kind;
    check(setting.kind != Kind::Accepted || setting.value >= Heartbeat::kMinimumInterval);
    check(setting.kind != Kind::BelowMinimum || (setting.value >= -1 && setting.value < Heartbeat::kMinimumInterval));
    check(setting.kind == Kind::None || content.find(Heartbeat::kIntervalKey) != std::string::npos);
    return 0;
}
