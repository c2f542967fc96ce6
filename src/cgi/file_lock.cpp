#include "cgi/file_lock.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <string>
#include <sys/file.h>
#include <sys/stat.h>
#include <syslog.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace {

constexpr const char* kLockFolder = "/var/lock";

// The resources this process holds: a second lock of one of them is the first one
// again (a new descriptor would wait for the process itself).
std::vector<std::string>& held()
{
    static std::vector<std::string> names;
    return names;
}

// The resources this process gave up waiting for: it does not wait for them again,
// so that a command logs one event and waits once.
std::vector<std::string>& given_up()
{
    static std::vector<std::string> names;
    return names;
}

bool listed(const std::vector<std::string>& names, std::string_view name)
{
    return std::find(names.begin(), names.end(), name) != names.end();
}

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

void give_up(std::string_view resource)
{
    given_up().emplace_back(resource);
    openlog("SYSTEM", 0, 0);
    syslog(LOG_INFO, "Gave up waiting for the lock of \"%.*s\".", static_cast<int>(resource.size()),
           resource.data());
    closelog();
}

} // namespace

std::optional<FileLock> FileLock::acquire(std::string_view resource, Mode mode, std::chrono::milliseconds wait)
{
    if (listed(given_up(), resource))
        return std::nullopt;
    if (listed(held(), resource))
        return FileLock(-1, std::string(resource));

    const int fd = open_lock_file(std::string(kLockFolder) + "/" + std::string(resource) + ".lock");
    if (fd < 0) {
        give_up(resource);
        return std::nullopt;
    }
    FileLock lock(fd, std::string(resource));
    const int operation = mode == Mode::shared ? LOCK_SH : LOCK_EX;
    const auto deadline = std::chrono::steady_clock::now() + wait;
    // Polled rather than blocking, so that the wait stays bounded without a signal;
    // the pause grows from 1 ms to 16 ms.
    std::chrono::milliseconds pause{1};
    for (;;) {
        if (flock(fd, operation | LOCK_NB) == 0) {
            held().push_back(lock.m_resource);
            return lock;
        }
        if ((errno != EWOULDBLOCK && errno != EINTR) || std::chrono::steady_clock::now() >= deadline)
            break;
        std::this_thread::sleep_for(pause);
        pause = std::min(pause * 2, std::chrono::milliseconds{16});
    }
    give_up(resource);
    return std::nullopt;
}

FileLock::FileLock(FileLock&& other) noexcept : m_fd(other.m_fd), m_resource(std::move(other.m_resource))
{
    other.m_fd = -1;
}

FileLock::~FileLock()
{
    if (m_fd < 0)
        return;   // a lock held further out, or a moved-from one
    std::erase(held(), m_resource);
    close(m_fd);  // closing the only descriptor releases the lock
}
