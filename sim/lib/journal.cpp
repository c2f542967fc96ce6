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

// The journal stays open for the rest of the process after its first event, as a real
// platform library keeps its log: one write per event instead of an open, a write and
// a close. Every write appends, so the lines of other processes still fall in order.
class JournalFile {
public:
    ~JournalFile()
    {
        if (m_fd >= 0)
            close(m_fd);
    }
    void append(const std::string& line)
    {
        if (m_fd < 0)
            m_fd = open(kJournalPath, O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
        if (m_fd < 0)
            return;
        [[maybe_unused]] const ssize_t written = write(m_fd, line.data(), line.size());
    }

private:
    int m_fd = -1;
};

void append_line(const std::string& line)
{
    static JournalFile journal;
    journal.append(line);
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
