// Capture of what code in the test process sends to the system log.
//
// The library defines syslog, vsyslog and their fortified variants with C
// linkage and default visibility. A test executable linking it (with
// ENABLE_EXPORTS, so that the definitions are exported) receives every
// syslog call of its own code and of every shared library it loads,
// providers included, instead of the real system log.
//
//   orv::testsupport::SyslogCapture capture;      // starts empty
//   ... run the code under test ...
//   EXPECT_EQ(capture.lines(), (std::vector<orv::testsupport::SyslogLine>{{LOG_ERR, "text"}}));
#ifndef ORV_TESTSUPPORT_SYSLOGCAPTURE_H
#define ORV_TESTSUPPORT_SYSLOGCAPTURE_H

#include <ostream>
#include <string>
#include <vector>

namespace orv::testsupport {

// One logged line: the priority argument as given (facility bits included)
// and the formatted text, exactly as formatted (no line end added or removed).
struct SyslogLine {
    int priority;
    std::string text;
    bool operator==(const SyslogLine&) const = default;
};

std::ostream& operator<<(std::ostream& os, const SyslogLine& line);

// While an object lives, logged lines are kept; creating one clears what an
// earlier capture kept. Lines logged with no capture alive are dropped.
class SyslogCapture {
public:
    SyslogCapture();
    ~SyslogCapture();
    SyslogCapture(const SyslogCapture&) = delete;
    SyslogCapture& operator=(const SyslogCapture&) = delete;

    // The lines logged so far, in order (safe to call while other threads log).
    std::vector<SyslogLine> lines() const;
    void clear();
};

}  // namespace orv::testsupport

#endif
