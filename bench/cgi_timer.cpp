// Times whole CGI processes inside a device: starts PROGRAM RUNS times with the
// caller's environment (the CGI variables), its output thrown away, and prints the
// median wall-clock time of one run in microseconds.
//
//   cgi-timer RUNS PROGRAM
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

extern char** environ;

int main(int argc, char** argv)
{
    if (argc != 3) {
        std::fprintf(stderr, "usage: cgi-timer RUNS PROGRAM\n");
        return 2;
    }
    const int runs = std::max(1, std::atoi(argv[1]));
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 0, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    std::vector<long long> times;
    std::vector<char*> args{argv[2], nullptr};
    for (int i = 0; i < runs; ++i) {
        const auto start = std::chrono::steady_clock::now();
        pid_t pid = 0;
        if (posix_spawn(&pid, argv[2], &actions, nullptr, args.data(), environ) != 0) {
            std::perror("cgi-timer");
            return 1;
        }
        int status = 0;
        waitpid(pid, &status, 0);
        const auto end = std::chrono::steady_clock::now();
        times.push_back(std::chrono::duration_cast<std::chrono::microseconds>(end - start).count());
    }
    posix_spawn_file_actions_destroy(&actions);
    std::sort(times.begin(), times.end());
    std::printf("%lld\n", times[times.size() / 2]);
    return 0;
}
