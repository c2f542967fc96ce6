#include "cgilib/temp_file.h"

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

namespace cgilib {

UniqueFd::UniqueFd(UniqueFd&& other) noexcept : m_fd(std::exchange(other.m_fd, -1)) {}

UniqueFd& UniqueFd::operator=(UniqueFd&& other) noexcept
{
    if (this != &other) {
        close();
        m_fd = std::exchange(other.m_fd, -1);
    }
    return *this;
}

bool UniqueFd::close()
{
    if (m_fd < 0)
        return true;
    // Linux releases the descriptor even when close fails, so it is never retried.
    return ::close(std::exchange(m_fd, -1)) == 0;
}

bool write_all(int fd, std::string_view bytes)
{
    while (!bytes.empty()) {
        const ssize_t written = ::write(fd, bytes.data(), bytes.size());
        if (written < 0) {
            if (errno == EINTR)
                continue;
            return false;
        }
        bytes.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
}

std::optional<TempFile> TempFile::create(std::string pattern)
{
    UniqueFd fd(::mkostemp(pattern.data(), O_CLOEXEC));
    if (!fd.valid())
        return std::nullopt;
    return TempFile(std::move(pattern), std::move(fd));
}

TempFile::TempFile(std::string path, UniqueFd fd) : m_path(std::move(path)), m_fd(std::move(fd)), m_creator(::getpid())
{
}

TempFile::TempFile(TempFile&& other) noexcept
    : m_path(std::exchange(other.m_path, {})), m_fd(std::move(other.m_fd)), m_creator(other.m_creator)
{
}

TempFile& TempFile::operator=(TempFile&& other) noexcept
{
    if (this != &other) {
        discard();
        m_path = std::exchange(other.m_path, {});
        m_fd = std::move(other.m_fd);
        m_creator = other.m_creator;
    }
    return *this;
}

void TempFile::discard()
{
    m_fd.close();
    if (!m_path.empty() && m_creator == ::getpid())
        ::unlink(m_path.c_str());
    m_path.clear();
}

namespace {

// Copies the file at `source` to `target` through a file staged in the target's
// directory, so that nobody ever sees `target` half written.
bool copy_into_place(const std::string& source, const std::string& target)
{
    const UniqueFd in(::open(source.c_str(), O_RDONLY | O_CLOEXEC));
    if (!in.valid())
        return false;
    auto staged = TempFile::create(target + ".XXXXXX");
    if (!staged)
        return false;
    std::array<char, 64 * 1024> chunk;
    for (;;) {
        const ssize_t got = ::read(in.get(), chunk.data(), chunk.size());
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0)
            return false;
        if (got == 0)
            break;
        if (!staged->write({chunk.data(), static_cast<std::size_t>(got)}))
            return false;
    }
    return staged->finish() && staged->move_to(target);
}

} // namespace

bool TempFile::move_to(const std::string& target)
{
    if (m_path.empty() || target.empty())
        return false;
    m_fd.close();
    if (std::rename(m_path.c_str(), target.c_str()) != 0) {
        if (errno != EXDEV || !copy_into_place(m_path, target))
            return false;
        ::unlink(m_path.c_str());
    }
    m_path.clear();
    return true;
}

} // namespace cgilib
