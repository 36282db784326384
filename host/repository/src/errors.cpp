#include "orv/repository/errors.hpp"

#include <utility>

namespace orv::repository {

ParseError::ParseError(std::string file, int line, std::string message)
    : std::runtime_error(file + ":" + std::to_string(line) + ": " + message),
      file_(std::move(file)),
      line_(line),
      message_(std::move(message)) {}

}  // namespace orv::repository
