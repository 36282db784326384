// The fixture file of a running simulated host. refresh() looks at the file's
// identity (inode, size, modification time) and reads it again when it
// changed, so a host can be altered from outside while it runs. A rejected
// fixture is reported on stderr once per change; calls then fail.
#pragma once

#include <sys/stat.h>

#include <memory>
#include <mutex>
#include <string>

#include "FixtureReader.h"

namespace orv::platform::sim {

class FixtureSource {
public:
    explicit FixtureSource(std::string path);

    void refresh();
    // The host as last read; null host with the reason when rejected.
    FixtureResult current() const;

private:
    struct Identity {
        int statErrno = 0;
        dev_t device = 0;
        ino_t inode = 0;
        off_t size = 0;
        long mtimeSeconds = 0;
        long mtimeNanoseconds = 0;
        bool operator==(const Identity&) const = default;
    };

    Identity look() const;
    void reload();

    std::string path_;
    mutable std::mutex mutex_;
    bool loaded_ = false;
    Identity seen_;
    FixtureResult current_;
};

} // namespace orv::platform::sim
