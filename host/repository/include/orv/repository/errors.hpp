// Errors raised while reading MOF and provider registration files.
//
// Every error names the file and the line where reading stopped and says what
// was expected there; what() reads "file:line: message", the form editors and
// build logs understand.
#pragma once

#include <stdexcept>
#include <string>

namespace orv::repository {

class ParseError : public std::runtime_error {
public:
    ParseError(std::string file, int line, std::string message);

    const std::string& file() const noexcept { return file_; }
    int line() const noexcept { return line_; }
    // The message without the "file:line: " prefix.
    const std::string& message() const noexcept { return message_; }

private:
    std::string file_;
    int line_;
    std::string message_;
};

// A malformed MOF file, or a declaration the repository cannot accept
// (unknown superclass, duplicate class, unknown qualifier, instance declaration, ...).
class MofError : public ParseError {
public:
    using ParseError::ParseError;
};

// A malformed provider registration file.
class RegistrationError : public ParseError {
public:
    using ParseError::ParseError;
};

}  // namespace orv::repository
