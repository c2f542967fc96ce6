// The users page: its paged table of accounts, and the totals and names its dialogs need.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <strings.h>
#include <vector>

#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/grid.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "platform/config_store.h"
#include "platform/share.h"
#include "volumes/account_names.h"
#include "volumes/helpers.h"
#include "volumes/reserved_accounts.h"
#include "volumes/volume_table.h"

namespace {

// At most this many domain users are counted; the page pages through no more.
constexpr int kMaxDomainUsers = 800;

struct UserFilter {
    const FixedText<64>& query;
    bool active;
    // The query anywhere in the text, case-sensitive.
    bool passes(const char* text) const { return !active || std::strstr(text, query.c_str()); }
    bool passes(std::string_view text) const { return !active || text.find(query.view()) != std::string_view::npos; }
};

// The device's own accounts, as the domain service reports them ("NETBIOS+name", in
// any letter case), and the domain's ticket account are not domain users to list.
bool is_own_or_ticket_account(const char* line, const FixedText<128>& local_prefix)
{
    if (const char* plus = std::strchr(line, '+')) {
        const std::size_t length = static_cast<std::size_t>(plus - line) + 1;
        if (length == local_prefix.length() && strncasecmp(line, local_prefix.c_str(), length) == 0)
            return true;
    }
    return std::strcmp(line, "krbtgt") == 0;
}

// While the device is joined to a domain the table shows the domain's users, as
// WORKGROUP\name and without groups, in the order "wbinfo -u" gives them.
void list_domain_users(const FixedText<4>& page, FilteredPageCounter& counter, const UserFilter& filter)
{
    const UniquePipe users = open_pipe("wbinfo -u");
    if (!users) {
        write_grid_end(page.c_str(), 0);
        return;
    }
    FixedText<64> workgroup;
    FixedText<64> netbios_name;
    xml_get_str("/system_mgr/samba/ads_workgroup", workgroup.size(), workgroup.data());
    xml_get_str("/system_mgr/samba/netbios_name", netbios_name.size(), netbios_name.data());
    FixedText<128> local_prefix;
    std::snprintf(local_prefix.data(), local_prefix.size(), "%s+", netbios_name.c_str());

    FixedText<55296> line;
    while (counter.total() < kMaxDomainUsers && read_line(users.get(), line)) {
        // The last character goes whatever it is: a final line without a newline
        // loses a letter, as it always has.
        const std::size_t length = line.length();
        if (length > 0)
            line[length - 1] = '\0';
        if (is_own_or_ticket_account(line.c_str(), local_prefix))
            continue;
        // The search looks at the whole line, without the workgroup.
        if (const int id = counter.offer(filter.passes(line.c_str()))) {
            const std::string shown = std::string(workgroup.view()) + "\\" + line.c_str();
            write_grid_row(id, {shown.c_str(), ""});
        }
    }
    write_grid_end(page.c_str(), counter.total());
}

void list_local_users(const FixedText<4>& page, FilteredPageCounter& counter, const UserFilter& filter)
{
    // One zeroed buffer serves every row: the library writes a C string into it, and
    // what it wrote is cleared again after the row.
    ZeroedBuffer<55296> groups;
    for_each_account_name("/etc/passwd", AccountFile::Passwd, [&](std::string_view entry) {
        if (is_reserved_user(entry))
            return;
        if (const int id = counter.offer(filter.passes(entry))) {
            const std::string name(entry);
            if (!groups)
                throw std::bad_alloc();
            LIB_Web_Get_User_Join_Group(name.c_str(), groups.data());
            write_grid_row(id, {name.c_str(), groups.c_str()});
            groups.clear_string();
        }
    });
    write_grid_end(page.c_str(), counter.total());
}

// Copies a name of a few bytes without a call: from 4 to 16 bytes, two overlapping
// pieces (the name's first and last bytes) cover it, and nothing outside it is read.
void copy_name(char* to, std::string_view name)
{
    const char* from = name.data();
    const std::size_t length = name.size();
    const auto copy_ends = [&](auto piece) {
        constexpr std::size_t width = sizeof piece;
        decltype(piece) tail;
        std::memcpy(&piece, from, width);
        std::memcpy(&tail, from + length - width, width);
        std::memcpy(to, &piece, width);
        std::memcpy(to + length - width, &tail, width);
    };
    if (length >= 8 && length <= 16)
        copy_ends(std::uint64_t{});
    else if (length >= 4 && length < 8)
        copy_ends(std::uint32_t{});
    else
        std::memcpy(to, from, length);
}

// The names of the user list, '#' after each, kept in blocks that never move: the list
// of 50,000 users is half a megabyte, which a string grown by doubling would hold one
// and a half times over while it grows. A name is copied into its block's free room.
class NameList {
public:
    void add(std::string_view name)
    {
        if (static_cast<std::size_t>(m_limit - m_cursor) < name.size() + 1)
            start_block(name.size() + 1);
        copy_name(m_cursor, name);
        m_cursor += name.size();
        *m_cursor++ = '#';
    }

    // A non-empty list loses its final '#'.
    void drop_final_separator()
    {
        if (!m_blocks.empty())
            --m_cursor;
    }

    std::string joined() const
    {
        std::string text;
        for_each_block([&](const char* bytes, std::size_t used) { text.append(bytes, used); });
        return text;
    }

    // The list goes to the answer as it is, block by block: a name is never a format.
    void write() const
    {
        for_each_block([](const char* bytes, std::size_t used) { std::fwrite(bytes, 1, used, cgiOut); });
    }

private:
    struct Block {
        std::unique_ptr<char[]> bytes;
        std::size_t used;   // of a block before the last; the last one's ends at the cursor
    };

    void start_block(std::size_t least)
    {
        if (!m_blocks.empty())
            m_blocks.back().used = static_cast<std::size_t>(m_cursor - m_blocks.back().bytes.get());
        const std::size_t size = std::max(kBlockSize, least);
        m_blocks.push_back({std::make_unique_for_overwrite<char[]>(size), 0});
        m_cursor = m_blocks.back().bytes.get();
        m_limit = m_cursor + size;
    }

    template <typename Visit>
    void for_each_block(Visit visit) const
    {
        for (const Block& block : m_blocks) {
            const bool last = &block == &m_blocks.back();
            visit(block.bytes.get(), last ? static_cast<std::size_t>(m_cursor - block.bytes.get()) : block.used);
        }
    }

    static constexpr std::size_t kBlockSize = 64 * 1024;
    std::vector<Block> m_blocks;
    char* m_cursor = nullptr;
    char* m_limit = nullptr;
};

} // namespace

void cgi_get_user_list()
{
    const auto query = form_value<64>("query");
    const auto qtype = form_value<64>("qtype");
    const auto page = form_value<4>("page");
    const auto rp = form_value<4>("rp");

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<rows>");

    const UserFilter filter{query, !query.empty() && qtype == "name"};
    FilteredPageCounter counter(paging_number(page.c_str()), paging_number(rp.c_str()));
    if (ads_enabled() == 1)
        list_domain_users(page, counter, filter);
    else
        list_local_users(page, counter, filter);
}

// The user and group name lists are written to the answer as text, never as a format:
// the same bytes for every name without "%", which the account tools never admit.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-security"

void cgi_get_user_info()
{
    FixedText<256> sizes;
    list_volume_sizes(sizes);
    const int volumes = count_volumes();

    int user_count = 0;
    NameList users;
    for_each_account_name("/etc/passwd", AccountFile::Passwd, [&](std::string_view name) {
        if (is_reserved_user(name))
            return;
        ++user_count;
        users.add(name);
    });
    std::string groups;
    for_each_account_name("/etc/group", AccountFile::Group, [&](std::string_view name) {
        if (!is_reserved_group(name)) {
            groups += name;
            groups += '#';
        }
    });
    users.drop_final_separator();
    if (!groups.empty())
        groups.pop_back();

    write_xml_header(Charset::Utf8);
    write_xml_prologue();
    out("<user_info>\n");
    out("<total>%d</total>", user_count);
    out("<all_user>");
    users.write();
    out("</all_user>");
    out("<all_group>");
    out("%s", groups.c_str());
    out("</all_group>");
    out("<hddnum>%d</hddnum>", volumes);
    out("<hddsize>%s</hddsize>", sizes.c_str());

    if (const UniqueFile table = open_volume_table()) {
        // Lines are read in 64-byte pieces; the fields keep their text from the
        // piece before when a piece does not split.
        FixedText<64> line;
        FixedText<64> volume;
        FixedText<16> device_dir;
        while (read_line(table.get(), line)) {
            std::sscanf(line.c_str(), "%63s = %15s", volume.data(), device_dir.data());
            if (!std::strstr(volume.c_str(), "USB"))
                out("<v_name>%s</v_name>", volume.c_str());
        }
    }
    out("</user_info>");

    printf_out("------get user info--------\n");
    printf_out("num=%d\n", user_count);
    if (trace_enabled())
        printf_out("alluser=%s\n", users.joined().c_str());
    printf_out("hd_num=%d\n", count_volumes());
    printf_out("hd_size=%s\n", sizes.c_str());
    printf_out("---------------------------\n");
}

#pragma GCC diagnostic pop
