// Times whole CGI processes inside a device: starts PROGRAM and FLOOR in turn (A B A
// B ...) RUNS times each, with the caller's environment (the CGI variables) and their
// output thrown away, so that both see the same drift of a noisy machine. Prints one
// line of figures:
//
//   PROGRAM_MEDIAN PROGRAM_Q1 PROGRAM_Q3 FLOOR_MEDIAN FLOOR_Q1 FLOOR_Q3
//   RATIO_MEDIAN RATIO_Q1 RATIO_Q3 PROGRAM_PEAK_KIB FLOOR_PEAK_KIB
//
// Times are wall-clock microseconds of one whole process; the ratios are taken pair by
// pair (each program run over the floor run beside it); the peaks are the largest
// resident set of any run, as the kernel accounts it for the finished process.
//
//   cgi-timer RUNS PROGRAM FLOOR
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

extern char** environ;

namespace {

struct Run {
    double microseconds = 0;
    long peak_kib = 0;
};

class Spawner {
public:
    Spawner()
    {
        posix_spawn_file_actions_init(&m_actions);
        posix_spawn_file_actions_addopen(&m_actions, 0, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_addopen(&m_actions, 1, "/dev/null", O_WRONLY, 0);
    }
    ~Spawner() { posix_spawn_file_actions_destroy(&m_actions); }
    Spawner(const Spawner&) = delete;
    Spawner& operator=(const Spawner&) = delete;

    bool run(char* program, Run& result)
    {
        std::vector<char*> args{program, nullptr};
        const auto start = std::chrono::steady_clock::now();
        pid_t pid = 0;
        if (posix_spawn(&pid, program, &m_actions, nullptr, args.data(), environ) != 0)
            return false;
        int status = 0;
        rusage usage{};
        if (wait4(pid, &status, 0, &usage) != pid)
            return false;
        const auto end = std::chrono::steady_clock::now();
        result.microseconds = static_cast<double>(std::chrono::duration_cast<std::chrono::microseconds>(end - start).count());
        result.peak_kib = usage.ru_maxrss;
        return true;
    }

private:
    posix_spawn_file_actions_t m_actions{};
};

// The value at fraction `at` of the sorted figures (0.5: the median), interpolated.
double quantile(std::vector<double> values, double at)
{
    std::sort(values.begin(), values.end());
    const double position = at * static_cast<double>(values.size() - 1);
    const auto below = static_cast<std::size_t>(position);
    const std::size_t above = std::min(below + 1, values.size() - 1);
    const double part = position - static_cast<double>(below);
    return values[below] * (1 - part) + values[above] * part;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 4) {
        std::fprintf(stderr, "usage: cgi-timer RUNS PROGRAM FLOOR\n");
        return 2;
    }
    const int runs = std::max(1, std::atoi(argv[1]));
    Spawner spawner;
    // A few runs of each first, not counted: caches, and the page cache of the files.
    for (int i = 0; i < 3; ++i) {
        Run ignored;
        if (!spawner.run(argv[2], ignored) || !spawner.run(argv[3], ignored)) {
            std::perror("cgi-timer");
            return 1;
        }
    }
    std::vector<double> program_times, floor_times, ratios;
    long program_peak = 0, floor_peak = 0;
    for (int i = 0; i < runs; ++i) {
        Run program, floor;
        // Alternate which goes first, so that neither always follows the other.
        const bool program_first = i % 2 == 0;
        const bool ok = program_first ? spawner.run(argv[2], program) && spawner.run(argv[3], floor)
                                      : spawner.run(argv[3], floor) && spawner.run(argv[2], program);
        if (!ok) {
            std::perror("cgi-timer");
            return 1;
        }
        program_times.push_back(program.microseconds);
        floor_times.push_back(floor.microseconds);
        ratios.push_back(program.microseconds / std::max(1.0, floor.microseconds));
        program_peak = std::max(program_peak, program.peak_kib);
        floor_peak = std::max(floor_peak, floor.peak_kib);
    }
    std::printf("%.0f %.0f %.0f %.0f %.0f %.0f %.3f %.3f %.3f %ld %ld\n", quantile(program_times, 0.5),
                quantile(program_times, 0.25), quantile(program_times, 0.75), quantile(floor_times, 0.5),
                quantile(floor_times, 0.25), quantile(floor_times, 0.75), quantile(ratios, 0.5),
                quantile(ratios, 0.25), quantile(ratios, 0.75), program_peak, floor_peak);
    return 0;
}
