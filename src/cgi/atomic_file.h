// Rewriting the device's files so that a reader, a crash or a full
// disk never leaves a file half written.
#pragma once

#include <string>
#include <string_view>

// Replaces the file at `path` with `content`: a uniquely named temporary file in the
// same folder gets every byte (each write checked), is flushed to the disk and closed
// (checked), takes the old file's permissions (0644 for a new file), and is renamed
// over the old one; then the folder itself is synced. On any failure the old file
// stays byte for byte as it was, the temporary file is removed, and the result is false.
bool replace_file(const std::string& path, std::string_view content);

// The whole file, or nothing (false) when it cannot be read.
bool read_whole_file(const std::string& path, std::string& content);
