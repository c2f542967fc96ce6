// Files that remove themselves: a received upload lives in one until it is renamed
// into place or the process ends.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <sys/types.h>

namespace cgilib {

// An owned file descriptor.
class UniqueFd {
public:
    UniqueFd() = default;
    explicit UniqueFd(int fd) : m_fd(fd) {}
    UniqueFd(UniqueFd&& other) noexcept;
    UniqueFd& operator=(UniqueFd&& other) noexcept;
    UniqueFd(const UniqueFd&) = delete;
    UniqueFd& operator=(const UniqueFd&) = delete;
    ~UniqueFd() { close(); }

    int get() const { return m_fd; }
    bool valid() const { return m_fd >= 0; }
    // Closes now; false when the close reported an error (a write that failed late).
    bool close();

private:
    int m_fd = -1;
};

// Writes all of `bytes`, retrying interrupted and partial writes.
bool write_all(int fd, std::string_view bytes);

class TempFile {
public:
    // Creates a new file from a mkstemp pattern (ending in "XXXXXX"), mode 0600,
    // not inherited by the programs the process runs.
    static std::optional<TempFile> create(std::string pattern = "/tmp/cgicXXXXXX");

    TempFile(TempFile&& other) noexcept;
    TempFile& operator=(TempFile&& other) noexcept;
    TempFile(const TempFile&) = delete;
    TempFile& operator=(const TempFile&) = delete;
    ~TempFile() { discard(); }

    // The file's path; empty once it was moved away.
    const std::string& path() const { return m_path; }

    bool write(std::string_view bytes) { return write_all(m_fd.get(), bytes); }
    // Closes the file after writing; false when a write error surfaced on close.
    bool finish() { return m_fd.close(); }

    // Moves the file to `target`, replacing what is there: a rename, or where that
    // crosses file systems, a copy placed next to `target` and renamed over it.
    // Afterwards this object no longer owns a file.
    bool move_to(const std::string& target);

private:
    TempFile(std::string path, UniqueFd fd);
    void discard();

    std::string m_path;
    UniqueFd m_fd;
    // Only the process that created the file removes it: a forked child that exits
    // must not take the parent's upload away.
    pid_t m_creator;
};

} // namespace cgilib
