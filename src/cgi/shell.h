// Running platform tools through the shell.
#pragma once

// Formats a command line into a zero-filled 8192-byte heap buffer and runs it with
// system(); the tool's exit status is not looked at. Returns 1 when the buffer
// cannot be allocated (nothing runs), else 0. Callers keep their arguments within
// the form buffers they read, all far below 8192 bytes; a longer line is cut.
int run_shell_command(const char* format, ...) __attribute__((format(printf, 1, 2)));

// Formats a command line into a buffer of `size` bytes (cut at size-1 characters)
// and runs it with system(): the lines whose length the device bounds explicitly.
void run_bounded_command(int size, const char* format, ...) __attribute__((format(printf, 2, 3)));

// system() with a literal command line; the tool's exit status is not looked at.
void run_system(const char* line);
