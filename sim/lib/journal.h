// The simulated device's journal, "/var/log/platform.log": one line per event, the
// event's name and then each argument after a TAB, ending in LF. Inside an argument
// a backslash, TAB and LF are written as \\, \t and \n. Simulated library calls and
// simulated tools append to it in the order things happen on the device.
#pragma once

#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

inline constexpr const char* kJournalPath = "/var/log/platform.log";

// Escapes one argument for the journal.
std::string journal_escape(std::string_view argument);

// Appends one event with one write, so that lines of concurrent processes never mix.
void journal_record(std::string_view name, const std::vector<std::string>& arguments);
void journal_record(std::string_view name, std::initializer_list<std::string_view> arguments);
