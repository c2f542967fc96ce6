// The share and account library of the simulated device, over the share store
// (share_store.h) and the account files (account_files.h).
//
//   set_default_deny(name)         every share that does not list the account ("user"
//                                  or "@group") yet lists it with level 0 (deny)
//   chk_share(name)                1 when no share has that name (compared without
//                                  regard to case, as Samba does), else 0
//   add_share(record)              adds the share, creates its folder and /shares/NAME;
//                                  -1 (and no change) when the name is taken
//   public_off_share(name)         the share stops being public
//   insert_acnt_node(list, n, a)   appends account n with access a to the list
//   acnt_mod_share(list, mode)     mode 0: sets each listed account's level on the share
//                                  named in the list, adding the missing ones; any other
//                                  mode: the list replaces the share's whole access list
//   free_acnt_list(list)           releases the nodes insert_acnt_node made
//   del_share(name)                removes the share of exactly that name and its link
//                                  (never the folder)
//   delete_user_group_name(name)   removes "name" and "@name" from every access list
//   change_user_group_name(o, n)   renames "o" to "n" and "@o" to "@n" in every list
//   LIB_Web_Get_User_Join_Group    the user's groups besides allaccount, comma-separated
//                                  in /etc/group order (the account tool's -l format)
//   LIB_Get_User_First_Group_Name  the name of the user's primary group (at most 63
//                                  bytes); empty for an unknown user or group id
// A name, path or account the store cannot hold (share_store.h) is refused with -1
// and nothing changes. Each call records itself in the journal first; the list helpers and remove_0D_0A,
// which touch no store, do not.
#include "platform/share.h"

#include <cstdlib>
#include <cstring>
#include <string>
#include <strings.h>

#include "account_files.h"
#include "group_memberships.h"
#include "journal.h"
#include "share_store.h"

namespace {

ShareEntry* find_share(std::vector<ShareEntry>& shares, std::string_view name)
{
    for (ShareEntry& share : shares) {
        if (share.name.size() == name.size() && strncasecmp(share.name.c_str(), name.data(), name.size()) == 0)
            return &share;
    }
    return nullptr;
}

void set_level(ShareEntry& share, const std::string& account, int level)
{
    for (auto& [name, existing] : share.access) {
        if (name == account) {
            existing = level;
            return;
        }
    }
    share.access.emplace_back(account, level);
}

void copy_cut(char* buffer, const std::string& text, std::size_t size)
{
    const std::size_t n = std::min(text.size(), size - 1);
    std::memcpy(buffer, text.data(), n);
    buffer[n] = '\0';
}

} // namespace

extern "C" int set_default_deny(const char* name)
{
    journal_record("set_default_deny", {name});
    if (!is_storable_account(name))
        return -1;
    std::vector<ShareEntry> shares = load_shares();
    for (ShareEntry& share : shares) {
        bool listed = false;
        for (const auto& entry : share.access)
            listed = listed || entry.first == name;
        if (!listed)
            share.access.emplace_back(name, 0);
    }
    return save_shares(shares) ? 0 : -1;
}

extern "C" int chk_share(const char* name)
{
    journal_record("chk_share", {name});
    std::vector<ShareEntry> shares = load_shares();
    return find_share(shares, name) ? 0 : 1;
}

extern "C" int add_share(const struct share_record* share)
{
    journal_record("add_share", {share->name, share->path, share->read_only, share->browseable,
                                 std::to_string(share->recycle_bin), std::to_string(share->public_access),
                                 std::to_string(share->media_serving), std::to_string(share->remote_access)});
    std::vector<ShareEntry> shares = load_shares();
    if (!is_storable_share_name(share->name) || !is_storable_share_path(share->path) || find_share(shares, share->name))
        return -1;
    ShareEntry entry{share->name, share->path, share->read_only, share->browseable, share->recycle_bin,
                     share->public_access, share->media_serving, share->remote_access, {}};
    shares.push_back(entry);
    if (!save_shares(shares))
        return -1;
    link_share(entry);
    return 0;
}

extern "C" int public_off_share(const char* name)
{
    journal_record("public_off_share", {name});
    std::vector<ShareEntry> shares = load_shares();
    ShareEntry* share = find_share(shares, name);
    if (!share)
        return -1;
    share->public_access = 0;
    return save_shares(shares) ? 0 : -1;
}

extern "C" int insert_acnt_node(struct acnt_list* list, const char* name, int access)
{
    journal_record("insert_acnt_node", {list->share, name, std::to_string(access)});
    // The nodes belong to the caller's list until free_acnt_list; the C interface
    // fixes their layout, so they are plain C allocations.
    auto* node = static_cast<acnt_node*>(std::calloc(1, sizeof(acnt_node)));
    if (!node)
        return -1;
    copy_cut(node->name, name, sizeof node->name);
    node->access = access;
    acnt_node** tail = &list->head;
    while (*tail)
        tail = &(*tail)->next;
    *tail = node;
    return 0;
}

extern "C" int acnt_mod_share(const struct acnt_list* list, int mode)
{
    journal_record("acnt_mod_share", {list->share, std::to_string(mode)});
    for (const acnt_node* node = list->head; node; node = node->next) {
        if (!is_storable_account(node->name))
            return -1;
    }
    std::vector<ShareEntry> shares = load_shares();
    ShareEntry* share = find_share(shares, list->share);
    if (!share)
        return -1;
    if (mode != 0)
        share->access.clear();
    for (const acnt_node* node = list->head; node; node = node->next)
        set_level(*share, node->name, node->access);
    return save_shares(shares) ? 0 : -1;
}

extern "C" void free_acnt_list(struct acnt_list* list)
{
    while (acnt_node* node = list->head) {
        list->head = node->next;
        std::free(node);
    }
}

// Removes the share's line from the share store and its /shares link (the folder stays).
extern "C" int del_share(const char* name)
{
    journal_record("del_share", {name});
    if (!is_storable_share_name(name))
        return -1;
    std::vector<ShareEntry> shares = load_shares();
    std::erase_if(shares, [name](const ShareEntry& share) { return share.name == name; });
    save_shares(shares);
    unlink_share(name);
    return 0;
}

extern "C" int delete_user_group_name(const char* name)
{
    journal_record("delete_user_group_name", {name});
    const std::string group = std::string("@") + name;
    std::vector<ShareEntry> shares = load_shares();
    for (ShareEntry& share : shares)
        std::erase_if(share.access, [&](const auto& entry) { return entry.first == name || entry.first == group; });
    return save_shares(shares) ? 0 : -1;
}

extern "C" int change_user_group_name(const char* old_name, const char* new_name)
{
    journal_record("change_user_group_name", {old_name, new_name});
    if (!is_storable_account(new_name))
        return -1;
    const std::string old_group = std::string("@") + old_name;
    std::vector<ShareEntry> shares = load_shares();
    for (ShareEntry& share : shares) {
        for (auto& entry : share.access) {
            if (entry.first == old_name)
                entry.first = new_name;
            else if (entry.first == old_group)
                entry.first = std::string("@") + new_name;
        }
    }
    return save_shares(shares) ? 0 : -1;
}

extern "C" int LIB_Web_Get_User_Join_Group(const char* user, char* buffer)
{
    journal_record("LIB_Web_Get_User_Join_Group", {user});
    copy_cut(buffer, joined_groups_of(user), 55296);
    return 0;
}

extern "C" int LIB_Get_User_First_Group_Name(const char* user, char* buffer)
{
    journal_record("LIB_Get_User_First_Group_Name", {user});
    buffer[0] = '\0';
    const ColonFile passwd = ColonFile::load(kPasswdFile);
    const ColonRow* entry = passwd.find(user);
    if (!entry)
        return -1;
    const std::string gid = field(*entry, 3);
    for (const ColonRow& group : ColonFile::load(kGroupFile).rows) {
        if (field(group, 2) == gid) {
            copy_cut(buffer, group[0], 64);
            return 0;
        }
    }
    return -1;
}

extern "C" void remove_0D_0A(char* text)
{
    text[std::strcspn(text, "\r\n")] = '\0';
}
