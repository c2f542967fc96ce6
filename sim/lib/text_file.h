// Whole-file reading and writing for the simulated platform's stores.
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

// The whole file; empty when the file is missing or cannot be read.
std::string read_text(const std::string& path);
// Each line of the text without its line end (LF, and a CR before it), as read_lines
// gives them.
void for_each_line(std::string_view text, const std::function<void(std::string_view line)>& visit);
// The file's lines without their line ends; empty when the file is missing.
std::vector<std::string> read_lines(const std::string& path);
// Replaces the file with these lines, each ending in LF, atomically (replace_file in
// cgi/atomic_file.h): on failure the old file stays as it was. The caller holds the
// file's lock when it read the lines it now writes back.
bool write_lines(const std::string& path, const std::vector<std::string>& lines);
// Makes the folder and its missing parents, as `mkdir -p` does; false when one of them
// cannot be made or is not a folder.
bool make_directories(const std::string& path);
// Splits at every `separator`; "a\t\tb" gives three fields.
std::vector<std::string> split(std::string_view text, char separator);
std::string join(const std::vector<std::string>& fields, char separator);
// The KEY=VALUE lines of a settings file, in file order; empty lines, lines starting
// with "#" and lines without "=" are skipped. Empty when the file is missing.
std::vector<std::pair<std::string, std::string>> read_settings(const std::string& path);
