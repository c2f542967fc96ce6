#include "account_files.h"

#include <cstring>
#include <ctime>
#include <unistd.h>

#include "cgi/crypt_library.h"
#include "text_file.h"

ColonFile ColonFile::load(const char* path)
{
    ColonFile file{path, {}};
    for (const std::string& line : read_lines(path)) {
        if (!line.empty())
            file.rows.push_back(split(line, ':'));
    }
    return file;
}

bool ColonFile::save() const
{
    std::vector<std::string> lines;
    lines.reserve(rows.size());
    for (const ColonRow& row : rows)
        lines.push_back(join(row, ':'));
    return write_lines(path, lines);
}

ColonRow* ColonFile::find(std::string_view name)
{
    for (ColonRow& row : rows) {
        if (!row.empty() && row[0] == name)
            return &row;
    }
    return nullptr;
}

const ColonRow* ColonFile::find(std::string_view name) const
{
    return const_cast<ColonFile*>(this)->find(name);
}

void ColonFile::erase(std::string_view name)
{
    std::erase_if(rows, [&](const ColonRow& row) { return !row.empty() && row[0] == name; });
}

std::string field(const ColonRow& row, std::size_t index)
{
    return index < row.size() ? row[index] : std::string();
}

void set_field(ColonRow& row, std::size_t index, std::string value)
{
    if (row.size() <= index)
        row.resize(index + 1);
    row[index] = std::move(value);
}

std::vector<std::string> gecos_fields(const ColonRow& passwd_row)
{
    std::vector<std::string> gecos = split(field(passwd_row, 4), ',');
    gecos.resize(std::max<std::size_t>(gecos.size(), 5));
    return gecos;
}

void set_gecos_field(ColonRow& passwd_row, std::size_t index, const std::string& value)
{
    std::vector<std::string> gecos = gecos_fields(passwd_row);
    gecos[index] = value;
    set_field(passwd_row, 4, join(gecos, ','));
}

std::vector<std::string> group_members(const ColonRow& group_row)
{
    const std::string text = field(group_row, 3);
    if (text.empty())
        return {};
    return split(text, ',');
}

void set_group_members(ColonRow& group_row, const std::vector<std::string>& members)
{
    set_field(group_row, 3, join(members, ','));
}

bool is_member(const ColonRow& group_row, std::string_view user)
{
    return group_row.size() > 3 && member_text_lists(group_row[3], user);
}

bool member_text_lists(std::string_view text, std::string_view user)
{
    // Looks for the name in the member text without splitting it (allaccount lists
    // every user): a place where it stands between commas or the ends is a member.
    if (text.empty())
        return false;
    if (user.empty())
        return text.front() == ',' || text.back() == ',' || text.find(",,") != std::string_view::npos;
    // A member is the whole text, or stands at its start before a comma, at its end
    // after one, or between two. The last is looked for with the commas in the needle:
    // memmem() skips along the text by the needle's last bytes, and ",NAME," ends in a
    // pair that the other members' names seldom hold.
    if (text == user)
        return true;
    if (text.size() <= user.size())
        return false;
    if ((text.starts_with(user) && text[user.size()] == ',') ||
        (text.ends_with(user) && text[text.size() - user.size() - 1] == ','))
        return true;
    std::string needle;
    needle.reserve(user.size() + 2);
    needle += ',';
    needle += user;
    needle += ',';
    return memmem(text.data(), text.size(), needle.data(), needle.size()) != nullptr;
}

std::string joined_groups(const ColonFile& groups, std::string_view user)
{
    std::vector<std::string> names;
    for (const ColonRow& row : groups.rows) {
        if (row[0] != kAllAccountGroup && is_member(row, user))
            names.push_back(row[0]);
    }
    return join(names, ',');
}

std::string hash_password(const std::string& password)
{
    if (password.empty())
        return {};
    const char* salt = libcrypt::crypt_gensalt("$6$", 0);
    if (!salt)
        return {};
    const char* hash = libcrypt::crypt(password.c_str(), salt);
    return hash && hash[0] != '*' ? std::string(hash) : std::string();
}

long today_in_days()
{
    return static_cast<long>(std::time(nullptr) / 86400);
}

std::optional<std::string> load_hint(std::string_view user)
{
    for (const std::string& line : read_lines(kHintFile)) {
        const auto tab = line.find('\t');
        if (tab != std::string::npos && std::string_view(line).substr(0, tab) == user)
            return line.substr(tab + 1);
    }
    return std::nullopt;
}

namespace {

void rewrite_hints(std::string_view user, const std::optional<std::string>& new_line)
{
    const std::vector<std::string> before = read_lines(kHintFile);
    std::vector<std::string> lines;
    for (const std::string& line : before) {
        const auto tab = line.find('\t');
        if (tab == std::string::npos || std::string_view(line).substr(0, tab) != user)
            lines.push_back(line);
    }
    if (new_line)
        lines.push_back(*new_line);
    // A file that would stay as it is is not written again (most users have no hint).
    if (lines == before && access(kHintFile, F_OK) == 0)
        return;
    write_lines(kHintFile, lines);
}

} // namespace

void store_hint(std::string_view user, const std::string& hint)
{
    if (hint.empty())
        rewrite_hints(user, std::nullopt);
    else
        rewrite_hints(user, std::string(user) + '\t' + hint);
}

void rename_hint(std::string_view old_name, std::string_view new_name)
{
    if (const auto hint = load_hint(old_name)) {
        rewrite_hints(old_name, std::nullopt);
        store_hint(new_name, *hint);
    }
}
