// Objects kept across restarts in a state folder: one file per object, each
// replaced atomically (written to a temporary file, flushed to disk, renamed over
// the old file, and the folder flushed), so that a crash at any moment leaves
// every object either in its old or in its new form and never touches the others.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace orv::indication {

class StateStore {
public:
    // Creates the folder (and its parents) when missing. Throws std::runtime_error
    // naming the folder when it cannot be created or written.
    explicit StateStore(std::filesystem::path dir);

    const std::filesystem::path& dir() const noexcept { return dir_; }

    // Stores `content` as the object `id` (any text without a line end), replacing
    // what was stored under that id. Throws std::runtime_error naming the file.
    void put(std::string_view id, std::string_view content);
    // Forgets the object; nothing happens when it was not stored.
    void remove(std::string_view id);

    struct Object {
        std::string id;
        std::string content;
    };
    // Every stored object, in id order. Files left behind by a write that was cut
    // off before its rename are removed; files that are not the store's own
    // are left alone.
    std::vector<Object> loadAll() const;

    // The file that holds the object `id` (for diagnostics and tests).
    std::filesystem::path fileOf(std::string_view id) const;

private:
    std::filesystem::path dir_;
};

}  // namespace orv::indication
