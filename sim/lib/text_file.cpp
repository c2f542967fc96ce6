#include "text_file.h"

#include <cerrno>
#include <sys/stat.h>

#include "cgi/atomic_file.h"

// Hot, as read_whole_file: every request that reads the config file runs it.
[[gnu::hot]] std::string read_text(const std::string& path)
{
    std::string text;
    if (!read_whole_file(path, text))
        text.clear();
    return text;
}

void for_each_line(std::string_view text, const std::function<void(std::string_view line)>& visit)
{
    while (!text.empty()) {
        const auto newline = text.find('\n');
        std::string_view line = text.substr(0, newline);
        text = newline == std::string_view::npos ? std::string_view() : text.substr(newline + 1);
        if (!line.empty() && line.back() == '\r')
            line.remove_suffix(1);
        visit(line);
    }
}

std::vector<std::string> read_lines(const std::string& path)
{
    std::vector<std::string> lines;
    for_each_line(read_text(path), [&](std::string_view line) { lines.emplace_back(line); });
    return lines;
}

bool write_lines(const std::string& path, const std::vector<std::string>& lines)
{
    std::string content;
    for (const std::string& line : lines) {
        content += line;
        content += '\n';
    }
    return replace_file(path, content);
}

bool make_directories(const std::string& path)
{
    for (std::size_t slash = path.find('/', 1);; slash = path.find('/', slash + 1)) {
        const std::string folder = path.substr(0, slash);
        if (!folder.empty() && ::mkdir(folder.c_str(), 0777) != 0 && errno != EEXIST)
            return false;
        if (slash == std::string::npos)
            break;
    }
    struct stat status {};
    return ::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

std::vector<std::string> split(std::string_view text, char separator)
{
    std::vector<std::string> fields;
    std::size_t begin = 0;
    for (;;) {
        const auto end = text.find(separator, begin);
        fields.emplace_back(text.substr(begin, end - begin));
        if (end == std::string_view::npos)
            return fields;
        begin = end + 1;
    }
}

std::string join(const std::vector<std::string>& fields, char separator)
{
    std::string text;
    for (std::size_t i = 0; i < fields.size(); ++i) {
        if (i)
            text += separator;
        text += fields[i];
    }
    return text;
}

std::vector<std::pair<std::string, std::string>> read_settings(const std::string& path)
{
    std::vector<std::pair<std::string, std::string>> settings;
    for (const std::string& line : read_lines(path)) {
        const auto equals = line.find('=');
        if (line.empty() || line[0] == '#' || equals == std::string::npos)
            continue;
        settings.emplace_back(line.substr(0, equals), line.substr(equals + 1));
    }
    return settings;
}
