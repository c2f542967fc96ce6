#include "cgi/atomic_file.h"

#include <array>
#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// A descriptor that closes itself unless it was closed (and checked) already.
class Descriptor {
public:
    explicit Descriptor(int fd) : m_fd(fd) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    ~Descriptor()
    {
        if (m_fd >= 0)
            ::close(m_fd);
    }
    int get() const { return m_fd; }
    bool valid() const { return m_fd >= 0; }
    bool close()
    {
        const int fd = m_fd;
        m_fd = -1;
        return ::close(fd) == 0;
    }

private:
    int m_fd;
};

bool write_all(int fd, std::string_view content)
{
    while (!content.empty()) {
        const ssize_t written = ::write(fd, content.data(), content.size());
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return false;
        content.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
}

std::string folder_of(const std::string& path)
{
    const auto slash = path.rfind('/');
    if (slash == std::string::npos)
        return ".";
    return slash == 0 ? "/" : path.substr(0, slash);
}

bool sync_folder(const std::string& folder)
{
    Descriptor dir(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    return dir.valid() && ::fsync(dir.get()) == 0 && dir.close();
}

} // namespace

bool replace_file(const std::string& path, std::string_view content)
{
    std::string temporary = path + ".XXXXXX";
    Descriptor file(::mkostemp(temporary.data(), O_CLOEXEC));
    if (!file.valid())
        return false;
    struct stat old {};
    const mode_t mode = ::stat(path.c_str(), &old) == 0 ? (old.st_mode & 07777) : 0644;
    const bool written = ::fchmod(file.get(), mode) == 0 && write_all(file.get(), content)
                         && ::fsync(file.get()) == 0;
    if (!file.close() || !written || std::rename(temporary.c_str(), path.c_str()) != 0) {
        ::unlink(temporary.c_str());
        return false;
    }
    // The rename is the commit: from here on the file holds the new content.
    return sync_folder(folder_of(path));
}

// Hot: placed with the start-up code, which every request has loaded already, rather
// than on a page of its own that the reading of the config file would load.
[[gnu::hot]] bool read_whole_file(const std::string& path, std::string& content)
{
    Descriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (!file.valid())
        return false;
    // Straight into the text, sized by the file's length and a byte more, so that the end
    // shows without growing it: a file with a length that gives less than was asked has
    // ended, and no read is spent to hear so. A file that grows meanwhile, or has no
    // length (/proc), is read on.
    struct stat status {};
    const bool sized = ::fstat(file.get(), &status) == 0 && status.st_size > 0;
    content.resize(sized ? static_cast<std::size_t>(status.st_size) + 1 : 4096);
    std::size_t used = 0;
    for (;;) {
        if (used == content.size())
            content.resize(2 * content.size());
        const std::size_t asked = content.size() - used;
        const ssize_t n = ::read(file.get(), content.data() + used, asked);
        if (n < 0 && errno == EINTR)
            continue;
        if (n > 0)
            used += static_cast<std::size_t>(n);
        if (n <= 0 || (sized && static_cast<std::size_t>(n) < asked)) {
            content.resize(used);
            return n >= 0;
        }
    }
}
