// The names of the entries of the password and group files, in file order, found as
// the C library's entry readers (fgetpwent, and getgrent over the files database)
// find them, but without building a whole entry per line: a device of 50,000 users
// holds a password file of megabytes and a group line ("allaccount") of half a
// megabyte, and the pages only need the names.
//
// An entry is a line that the readers would return: leading white space is skipped,
// empty lines and lines starting with "#" are comments, the text ends at a NUL (and
// a line whose text ends before its line end gets the readers' quirk of a line moved
// over its leading white space: its last characters twice, as many as were skipped),
// the numeric fields (uid and gid of a password line, gid of a group line) must hold
// a number ending at ":" or at the end of the line. A name beginning with "+" or "-"
// (a name-service compatibility line) is taken with an empty or missing number, and
// alone on its line. The name is the text before the first ":".
#pragma once

#include <array>
#include <cstddef>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "cgi/file.h"

enum class AccountFile {
    Passwd,     // NAME:PASSWORD:UID:GID:...
    Group,      // NAME:PASSWORD:GID:MEMBERS
};

// One line of the file without its line end; `ended` when a line end followed it,
// `may_hold_nul` unless the line is known to hold no NUL.
struct AccountLine {
    std::string_view text;
    bool ended = true;
    bool may_hold_nul = true;
};

// The name of the entry on one line, or nothing when the entry reader would pass the
// line over. The name may point into `scratch`.
std::optional<std::string_view> account_entry_name(AccountLine line, AccountFile kind, std::string& scratch);

// Reads a file line by line in large blocks; of a line longer than a block only the
// part that decides its entry is kept.
class AccountLineReader {
public:
    AccountLineReader(const char* path, AccountFile kind);
    explicit operator bool() const { return m_fd >= 0; }
    // The next line, or its head; nothing at the end of the file.
    std::optional<AccountLine> next();
    // Fills `names` with the names of the next entries, as many as fit or as the block
    // in hand holds; none at the end of the file. The names stay valid until the next
    // call, and may point into `scratch`.
    std::size_t next_names(std::string& scratch, std::span<std::string_view> names);
    ~AccountLineReader();
    AccountLineReader(const AccountLineReader&) = delete;
    AccountLineReader& operator=(const AccountLineReader&) = delete;

private:
    bool refill();
    // Keeps the part of a piece of a long line that decides its entry, counting its
    // colons; true once the entry is decided.
    bool keep_head(const char* piece, std::size_t length, std::size_t& colons);
    int m_fd = -1;
    AccountFile m_kind;
    std::size_t m_colons;       // the colons up to the last field the entry depends on
    // kBlockSize bytes that read() fills, never cleared, then a few zeroed ones after the
    // bytes read, so that a line's first bytes are looked at without a bound to check
    std::unique_ptr<char[]> m_block;
    std::size_t m_begin = 0;
    std::size_t m_end = 0;
    bool m_block_holds_nul = false;
    std::string m_long_line;
};

// Calls visit(name) (a std::string_view, valid during the call) for each entry of the
// file, in file order. False when the file cannot be opened.
template <typename Visit>
bool for_each_account_name(const char* path, AccountFile kind, Visit visit)
{
    AccountLineReader reader(path, kind);
    if (!reader)
        return false;
    std::string scratch;
    // Names are taken a batch at a time: a file of 50,000 lines is walked without a
    // call per line.
    std::array<std::string_view, 64> names;
    while (const std::size_t count = reader.next_names(scratch, names)) {
        for (std::size_t i = 0; i < count; ++i)
            visit(names[i]);
    }
    return true;
}
