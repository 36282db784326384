#include "orv/indication/state_store.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace orv::indication {

namespace fs = std::filesystem;

namespace {

constexpr std::string_view kSuffix = ".obj";
constexpr std::string_view kPartial = ".obj.tmp";

std::runtime_error failure(const std::string& what, const fs::path& path) {
    return std::runtime_error(what + " " + path.string() + ": " + std::strerror(errno));
}

// 64-bit FNV-1a: file names stay short and safe whatever the id holds.
std::string fileStem(std::string_view id) {
    std::uint64_t hash = 14695981039346656037ULL;
    for (unsigned char c : id) {
        hash = (hash ^ c) * 1099511628211ULL;
    }
    char text[17];
    std::snprintf(text, sizeof text, "%016llx", static_cast<unsigned long long>(hash));
    return text;
}

void writeAll(int fd, std::string_view data, const fs::path& path) {
    while (!data.empty()) {
        ssize_t n = ::write(fd, data.data(), data.size());
        if (n < 0 && errno == EINTR) {
            continue;
        }
        if (n < 0) {
            throw failure("cannot write", path);
        }
        data.remove_prefix(static_cast<std::size_t>(n));
    }
}

void syncFolder(const fs::path& dir) {
    int fd = ::open(dir.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0) {
        throw failure("cannot open folder", dir);
    }
    int rc = ::fsync(fd);
    ::close(fd);
    if (rc != 0) {
        throw failure("cannot flush folder", dir);
    }
}

bool endsWith(const std::string& text, std::string_view tail) {
    return text.size() >= tail.size() && text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

}  // namespace

StateStore::StateStore(fs::path dir) : dir_(std::move(dir)) {
    std::error_code error;
    fs::create_directories(dir_, error);
    if (error || !fs::is_directory(dir_)) {
        throw std::runtime_error("cannot create state folder " + dir_.string() + ": " +
                                 (error ? error.message() : "not a folder"));
    }
    if (::access(dir_.c_str(), W_OK | X_OK) != 0) {
        throw failure("cannot write to state folder", dir_);
    }
}

fs::path StateStore::fileOf(std::string_view id) const { return dir_ / (fileStem(id) + std::string(kSuffix)); }

void StateStore::put(std::string_view id, std::string_view content) {
    if (id.find('\n') != std::string_view::npos) {
        throw std::runtime_error("object id holds a line end: " + std::string(id));
    }
    const fs::path target = fileOf(id);
    const fs::path partial = dir_ / (fileStem(id) + std::string(kPartial));
    int fd = ::open(partial.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    if (fd < 0) {
        throw failure("cannot create", partial);
    }
    try {
        writeAll(fd, id, partial);
        writeAll(fd, "\n", partial);
        writeAll(fd, content, partial);
        if (::fsync(fd) != 0) {
            throw failure("cannot flush", partial);
        }
    } catch (...) {
        ::close(fd);
        ::unlink(partial.c_str());
        throw;
    }
    ::close(fd);
    if (::rename(partial.c_str(), target.c_str()) != 0) {
        auto error = failure("cannot rename into", target);
        ::unlink(partial.c_str());
        throw error;
    }
    syncFolder(dir_);
}

void StateStore::remove(std::string_view id) {
    const fs::path target = fileOf(id);
    if (::unlink(target.c_str()) != 0) {
        if (errno == ENOENT) {
            return;
        }
        throw failure("cannot remove", target);
    }
    syncFolder(dir_);
}

std::vector<StateStore::Object> StateStore::loadAll() const {
    std::vector<Object> objects;
    for (const auto& entry : fs::directory_iterator(dir_)) {
        const std::string name = entry.path().filename().string();
        if (endsWith(name, kPartial)) {
            std::error_code ignored;
            fs::remove(entry.path(), ignored);  // a write cut off before its rename
            continue;
        }
        if (!endsWith(name, kSuffix) || !entry.is_regular_file()) {
            continue;
        }
        std::ifstream in(entry.path(), std::ios::binary);
        std::string id;
        if (!std::getline(in, id)) {
            continue;
        }
        std::ostringstream rest;
        rest << in.rdbuf();
        objects.push_back(Object{std::move(id), rest.str()});
    }
    std::sort(objects.begin(), objects.end(), [](const Object& a, const Object& b) { return a.id < b.id; });
    return objects;
}

}  // namespace orv::indication
