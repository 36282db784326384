// Helpers shared by the repository suites: load MOF text and capture errors.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>
#include <string_view>

#include "orv/repository/class_repository.hpp"

namespace orv::repository::testing {

inline ClassRepository loaded(std::string_view text, std::string_view file = "t.mof") {
    ClassRepository repo;
    repo.loadText(text, file);
    return repo;
}

// The "file:line: message" of the MofError that loading raises; fails the test
// when loading succeeds.
inline std::string mofError(std::string_view text, std::string_view file = "t.mof") {
    ClassRepository repo;
    try {
        repo.loadText(text, file);
    } catch (const MofError& e) {
        return e.what();
    }
    ADD_FAILURE() << "loading succeeded";
    return {};
}

inline std::filesystem::path sourceDir() {
    const char* dir = std::getenv("ORV_SOURCE_DIR");
    return dir != nullptr ? std::filesystem::path(dir) : std::filesystem::path(ORV_TEST_SOURCE_DIR);
}

}  // namespace orv::repository::testing
