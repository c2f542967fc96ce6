// Locks of the device's shared files. Every read-modify-write of a file that two
// requests (or a request and a platform tool) may change at once happens under the
// exclusive lock of its resource, held from the read to the final rename; readers
// either take the shared lock or rely on the file being replaced atomically.
//
// A resource's lock is flock() on "/var/lock/NAME.lock" (the folder is made when
// missing). The lock file is opened close-on-exec, so tools started while a lock is
// held (in the background too) never inherit it.
//
// Resources, in the order in which a process that needs several takes them (and so
// never the other way round):
//     account_batch_info, import_users, import_groups
//                         the bulk record files (never held together with another)
//     account_mgr         one account_mgr run at a time
//     accounts            /etc/passwd, /etc/shadow, /etc/group and the password hints
//     config              /etc/NAS_CFG/config.xml
//     exports             /etc/exports, the per-volume copies and USB ".exports" files,
//                         the staging files /tmp/exports and /tmp/exports_iso, and the
//                         "/nfs" link
//     shares              the share store and the /shares links
//     quota               the quota store
//     dfs                 the DFS links and groups
//     acl                 the default-ACL store
// A lock is held from the read of its files to their final rename, and no longer
// (the exports lock also over the "/nfs" link that a new rule makes again).
//
// Waiting is bounded: after kLockWait the caller takes its failure path, and the
// device's system log gets one event naming the resource; the process then fails at
// once on that resource for the rest of its run (one event, one wait per command).
// A process that asks again for a resource it holds gets it at once (the lock is
// released when the outermost holder ends).
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

// Long enough for a queue of requests on a busy device (twenty account creations at
// once each hold the account files for a few synced rewrites).
inline constexpr std::chrono::milliseconds kLockWait{10000};

class FileLock {
public:
    enum class Mode { shared, exclusive };

    // Takes the resource's lock, waiting at most `wait`; nothing when it could not
    // be had (the event is logged then).
    static std::optional<FileLock> acquire(std::string_view resource, Mode mode = Mode::exclusive,
                                           std::chrono::milliseconds wait = kLockWait);

    FileLock(FileLock&& other) noexcept;
    FileLock& operator=(FileLock&&) = delete;
    FileLock(const FileLock&) = delete;
    FileLock& operator=(const FileLock&) = delete;
    ~FileLock();

private:
    FileLock(int fd, std::string resource) : m_fd(fd), m_resource(std::move(resource)) {}
    int m_fd = -1;              // -1: the resource was held already by this process
    std::string m_resource;
};
