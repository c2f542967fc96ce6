#include "cgi/file_lock.h"

#include <cerrno>
#include <fcntl.h>
#include <string>
#include <sys/file.h>
#include <sys/stat.h>
#include <syslog.h>
#include <thread>
#include <unistd.h>

namespace {

constexpr const char* kLockFolder = "/var/lock";

int open_lock_file(const std::string& path)
{
    int fd = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0644);
    if (fd < 0 && errno == ENOENT) {
        mkdir("/var", 0755);
        mkdir(kLockFolder, 0755);
        fd = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0644);
    }
    return fd;
}

void log_gave_up(std::string_view resource)
{
    openlog("SYSTEM", 0, 0);
    syslog(LOG_INFO, "Gave up waiting for the lock of \"%.*s\".", static_cast<int>(resource.size()),
           resource.data());
    closelog();
}

} // namespace

std::optional<FileLock> FileLock::acquire(std::string_view resource, Mode mode, std::chrono::milliseconds wait)
{
    const std::string path = std::string(kLockFolder) + "/" + std::string(resource) + ".lock";
    const int fd = open_lock_file(path);
    if (fd < 0) {
        log_gave_up(resource);
        return std::nullopt;
    }
    FileLock lock(fd);
    const int operation = mode == Mode::shared ? LOCK_SH : LOCK_EX;
    const auto deadline = std::chrono::steady_clock::now() + wait;
    // Polled rather than blocking, so that the wait stays bounded without a signal;
    // the pause grows from 1 ms to 16 ms.
    std::chrono::milliseconds pause{1};
    for (;;) {
        if (flock(fd, operation | LOCK_NB) == 0)
            return lock;
        if (errno != EWOULDBLOCK && errno != EINTR)
            break;
        if (std::chrono::steady_clock::now() >= deadline)
            break;
        std::this_thread::sleep_for(pause);
        if (pause < std::chrono::milliseconds{16})
            pause *= 2;
    }
    log_gave_up(resource);
    return std::nullopt;
}

FileLock::FileLock(FileLock&& other) noexcept : m_fd(other.m_fd)
{
    other.m_fd = -1;
}

FileLock& FileLock::operator=(FileLock&& other) noexcept
{
    if (this != &other) {
        if (m_fd >= 0)
            close(m_fd);
        m_fd = other.m_fd;
        other.m_fd = -1;
    }
    return *this;
}

FileLock::~FileLock()
{
    if (m_fd >= 0)
        close(m_fd);   // closing the only descriptor releases the lock
}
