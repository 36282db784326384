#include "FixtureSource.h"

#include <cerrno>
#include <cstdio>

namespace orv::platform::sim {

FixtureSource::FixtureSource(std::string path) : path_(std::move(path))
{
    refresh();
}

FixtureSource::Identity FixtureSource::look() const
{
    Identity identity;
    struct stat info {};
    if (::stat(path_.c_str(), &info) != 0) {
        identity.statErrno = errno;
        return identity;
    }
    identity.device = info.st_dev;
    identity.inode = info.st_ino;
    identity.size = info.st_size;
    identity.mtimeSeconds = info.st_mtim.tv_sec;
    identity.mtimeNanoseconds = info.st_mtim.tv_nsec;
    return identity;
}

void FixtureSource::refresh()
{
    const Identity identity = look();
    std::lock_guard<std::mutex> lock(mutex_);
    if (loaded_ && identity == seen_) {
        return;
    }
    seen_ = identity;
    loaded_ = true;
    reload();
}

void FixtureSource::reload()
{
    current_ = readFixtureFile(path_);
    if (!current_.host) {
        std::fprintf(stderr, "orv platform: sim fixture (ORV_SIM_FIXTURE) rejected: %s\n", current_.error.c_str());
    }
}

FixtureResult FixtureSource::current() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return current_;
}

} // namespace orv::platform::sim
