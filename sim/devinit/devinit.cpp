// The first process inside a simulated device. It receives the system log on
// /dev/log and writes it to /var/log/messages, starts the command it was given,
// and waits until that command and everything it left running in the background
// have ended. Then it writes what is still queued on /dev/log and exits with the
// command's status.
//
//   devinit CMD [ARG...]
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <poll.h>
#include <string>
#include <string_view>
#include <sys/prctl.h>
#include <sys/signalfd.h>
#include <sys/stat.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

class FileDescriptor {
public:
    explicit FileDescriptor(int fd = -1) : m_fd(fd) { }
    ~FileDescriptor()
    {
        if (m_fd >= 0)
            close(m_fd);
    }
    FileDescriptor(const FileDescriptor&) = delete;
    FileDescriptor& operator=(const FileDescriptor&) = delete;
    int get() const { return m_fd; }

private:
    int m_fd;
};

// A syslog datagram is "<PRI>Mmm dd hh:mm:ss IDENT: MESSAGE". The device's log keeps
// the priority, the ident and the message; the time stamp is left out so that the
// log reads the same on every run.
std::string log_line(std::string_view datagram)
{
    while (!datagram.empty() && (datagram.back() == '\n' || datagram.back() == '\0'))
        datagram.remove_suffix(1);
    const auto close = datagram.find('>');
    if (datagram.empty() || datagram.front() != '<' || close == std::string_view::npos)
        return std::string(datagram) + '\n';
    // Only the kernel logs with the kernel facility (0): like the device's syslog
    // daemon, a program's message with facility 0 is taken as the user facility.
    int priority = std::atoi(std::string(datagram.substr(1, close - 1)).c_str());
    if (priority < 8)
        priority += 8;
    std::string line = "<" + std::to_string(priority) + ">";
    std::string_view rest = datagram.substr(close + 1);
    // "Nov 23 00:48:00 " is 16 characters.
    if (rest.size() >= 16 && rest[3] == ' ' && rest[6] == ' ' && rest[9] == ':' && rest[12] == ':' && rest[15] == ' ')
        rest.remove_prefix(16);
    line += rest;
    line += '\n';
    return line;
}

void write_log(int socket_fd)
{
    std::string datagram(8192, '\0');
    for (;;) {
        const ssize_t n = recv(socket_fd, datagram.data(), datagram.size(), MSG_DONTWAIT);
        if (n < 0)
            return;
        const std::string line = log_line(std::string_view(datagram.data(), static_cast<std::size_t>(n)));
        const int fd = open("/var/log/messages", O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
        if (fd < 0)
            continue;
        [[maybe_unused]] const ssize_t written = write(fd, line.data(), line.size());
        close(fd);
    }
}

int open_log_socket()
{
    const int fd = socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    if (fd < 0)
        return -1;
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, "/dev/log", sizeof(address.sun_path) - 1);
    unlink(address.sun_path);
    if (bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0) {
        close(fd);
        return -1;
    }
    chmod(address.sun_path, 0666);
    return fd;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fprintf(stderr, "usage: devinit CMD [ARG...]\n");
        return 2;
    }

    // Orphans of the command (background tools) must become our children, so we can wait
    // for them: as the first process of the sandbox they are anyway; otherwise we ask to be
    // their reaper (which an emulator such as qemu-user may refuse).
    if (getpid() != 1 && prctl(PR_SET_CHILD_SUBREAPER, 1) != 0) {
        std::fprintf(stderr, "devinit: cannot become the reaper of background jobs: %s\n", std::strerror(errno));
        return 1;
    }

    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGCHLD);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGTERM);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    const FileDescriptor signal_fd(signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK));
    const FileDescriptor log_fd(open_log_socket());

    const pid_t command = fork();
    if (command < 0) {
        std::perror("devinit: fork");
        return 1;
    }
    if (command == 0) {
        sigprocmask(SIG_UNBLOCK, &signals, nullptr);
        execvp(argv[1], argv + 1);
        std::fprintf(stderr, "devinit: cannot run %s: %s\n", argv[1], std::strerror(errno));
        _exit(127);
    }

    int exit_status = 0;
    bool children_left = true;
    while (children_left) {
        std::array<pollfd, 2> waiting{{{signal_fd.get(), POLLIN, 0}, {log_fd.get(), POLLIN, 0}}};
        if (poll(waiting.data(), log_fd.get() >= 0 ? 2 : 1, -1) < 0 && errno != EINTR)
            break;
        if (log_fd.get() >= 0)
            write_log(log_fd.get());

        signalfd_siginfo info{};
        while (read(signal_fd.get(), &info, sizeof(info)) == static_cast<ssize_t>(sizeof(info))) {
            if (info.ssi_signo == SIGINT || info.ssi_signo == SIGTERM)
                kill(command, static_cast<int>(info.ssi_signo));
        }
        for (;;) {
            int status = 0;
            const pid_t pid = waitpid(-1, &status, WNOHANG);
            if (pid < 0) {
                children_left = false;   // ECHILD: nothing left running
                break;
            }
            if (pid == 0)
                break;
            if (pid == command)
                exit_status = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
        }
    }
    if (log_fd.get() >= 0)
        write_log(log_fd.get());
    return exit_status;
}
