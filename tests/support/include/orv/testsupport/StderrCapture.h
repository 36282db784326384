// Capture of what the process writes to standard error (file descriptor 2),
// from C stdio, C++ streams or write(2) alike.
//
//   orv::testsupport::StderrCapture capture;
//   ... run the code under test ...
//   std::string text = capture.finish();   // restores standard error
#ifndef ORV_TESTSUPPORT_STDERRCAPTURE_H
#define ORV_TESTSUPPORT_STDERRCAPTURE_H

#include <string>

namespace orv::testsupport {

class StderrCapture {
public:
    // Redirects descriptor 2 into a temporary file.
    StderrCapture();
    // Restores standard error if finish() was not called.
    ~StderrCapture();
    StderrCapture(const StderrCapture&) = delete;
    StderrCapture& operator=(const StderrCapture&) = delete;

    // Restores standard error and returns everything written meanwhile.
    std::string finish();

private:
    int savedFd_;
    int captureFd_;
};

}  // namespace orv::testsupport

#endif
