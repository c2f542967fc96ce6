#include "journal.h"

#include <fcntl.h>
#include <unistd.h>

std::string journal_escape(std::string_view argument)
{
    std::string escaped;
    escaped.reserve(argument.size());
    for (char c : argument) {
        switch (c) {
        case '\\': escaped += "\\\\"; break;
        case '\t': escaped += "\\t"; break;
        case '\n': escaped += "\\n"; break;
        default: escaped += c;
        }
    }
    return escaped;
}

namespace {

void append_line(const std::string& line)
{
    const int fd = open(kJournalPath, O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
    if (fd < 0)
        return;
    [[maybe_unused]] const ssize_t written = write(fd, line.data(), line.size());
    close(fd);
}

} // namespace

void journal_record(std::string_view name, const std::vector<std::string>& arguments)
{
    std::string line(name);
    for (const std::string& argument : arguments) {
        line += '\t';
        line += journal_escape(argument);
    }
    line += '\n';
    append_line(line);
}

void journal_record(std::string_view name, std::initializer_list<std::string_view> arguments)
{
    std::string line(name);
    for (std::string_view argument : arguments) {
        line += '\t';
        line += journal_escape(argument);
    }
    line += '\n';
    append_line(line);
}
