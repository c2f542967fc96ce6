// Escaping a value for the context it is written into: a single- or double-quoted
// shell word whose quotes the command-line format holds, and one log or trace line.
// Each returns its input unchanged when the input holds nothing to escape.
#pragma once

#include <string>
#include <string_view>

// Inside '...': every ' becomes '\'' (close, an escaped quote, reopen).
std::string inside_single_quotes(std::string_view text);
// Inside "...": a backslash before every ", \, $ and backquote.
std::string inside_double_quotes(std::string_view text);
// One line of a log or trace: a control character is written as two or four
// characters ("\n", "\t", "\r", else "\xHH"), so a value never starts a new line.
std::string one_line(std::string_view text);
