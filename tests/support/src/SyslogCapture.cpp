#include <orv/testsupport/SyslogCapture.h>

#include <cstdarg>
#include <cstdio>
#include <mutex>

namespace orv::testsupport {

namespace {

struct Store {
    std::mutex mutex;
    bool capturing = false;
    std::vector<SyslogLine> lines;
};

Store& store() {
    static Store s;
    return s;
}

std::string format(const char* fmt, va_list ap) {
    va_list copy;
    va_copy(copy, ap);
    const int n = std::vsnprintf(nullptr, 0, fmt, copy);
    va_end(copy);
    std::string text(n > 0 ? static_cast<size_t>(n) : 0, '\0');
    if (n > 0) std::vsnprintf(text.data(), text.size() + 1, fmt, ap);
    return text;
}

void record(int priority, const char* fmt, va_list ap) {
    std::string text = format(fmt, ap);
    Store& s = store();
    std::lock_guard<std::mutex> lock(s.mutex);
    if (s.capturing) s.lines.push_back(SyslogLine{priority, std::move(text)});
}

}  // namespace

std::ostream& operator<<(std::ostream& os, const SyslogLine& line) {
    return os << "{priority " << line.priority << ", \"" << line.text << "\"}";
}

SyslogCapture::SyslogCapture() {
    std::lock_guard<std::mutex> lock(store().mutex);
    store().lines.clear();
    store().capturing = true;
}

SyslogCapture::~SyslogCapture() {
    std::lock_guard<std::mutex> lock(store().mutex);
    store().capturing = false;
}

std::vector<SyslogLine> SyslogCapture::lines() const {
    std::lock_guard<std::mutex> lock(store().mutex);
    return store().lines;
}

void SyslogCapture::clear() {
    std::lock_guard<std::mutex> lock(store().mutex);
    store().lines.clear();
}

}  // namespace orv::testsupport

// The system log entry points, replaced for the whole test process.
#define ORV_TS_EXPORT extern "C" __attribute__((visibility("default")))

ORV_TS_EXPORT void vsyslog(int priority, const char* fmt, va_list ap) {
    orv::testsupport::record(priority, fmt, ap);
}

ORV_TS_EXPORT void syslog(int priority, const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    orv::testsupport::record(priority, fmt, ap);
    va_end(ap);
}

ORV_TS_EXPORT void __vsyslog_chk(int priority, int, const char* fmt, va_list ap) {
    orv::testsupport::record(priority, fmt, ap);
}

ORV_TS_EXPORT void __syslog_chk(int priority, int, const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    orv::testsupport::record(priority, fmt, ap);
    va_end(ap);
}
