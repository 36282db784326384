#include <orv/testsupport/StderrCapture.h>

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <stdexcept>

namespace orv::testsupport {

StderrCapture::StderrCapture() : savedFd_(-1), captureFd_(-1) {
    char name[] = "/tmp/orv-stderr-XXXXXX";
    captureFd_ = mkstemp(name);
    if (captureFd_ < 0) throw std::runtime_error("StderrCapture: cannot create a temporary file");
    unlink(name);
    std::fflush(stderr);
    savedFd_ = dup(2);
    dup2(captureFd_, 2);
}

StderrCapture::~StderrCapture() {
    if (savedFd_ >= 0) finish();
}

std::string StderrCapture::finish() {
    std::fflush(stderr);
    dup2(savedFd_, 2);
    close(savedFd_);
    savedFd_ = -1;
    std::string text;
    char buf[4096];
    lseek(captureFd_, 0, SEEK_SET);
    for (ssize_t n; (n = read(captureFd_, buf, sizeof buf)) > 0;) text.append(buf, static_cast<size_t>(n));
    close(captureFd_);
    captureFd_ = -1;
    return text;
}

}  // namespace orv::testsupport
