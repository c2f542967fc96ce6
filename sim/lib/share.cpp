// The share and account library of the simulated device. Not built yet: each call
// is only an event.
#include "platform/share.h"

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "journal.h"
#include "share_store.h"

extern "C" int set_default_deny(const char* name)
{
    journal_record("set_default_deny", {name});
    return 0;
}

extern "C" int chk_share(const char* name)
{
    journal_record("chk_share", {name});
    return 1;
}

extern "C" int add_share(const struct share_record* share)
{
    journal_record("add_share", {share->name, share->path, share->read_only, share->browseable,
                                 std::to_string(share->recycle_bin), std::to_string(share->public_access),
                                 std::to_string(share->media_serving), std::to_string(share->remote_access)});
    return 0;
}

extern "C" int public_off_share(const char* name)
{
    journal_record("public_off_share", {name});
    return 0;
}

extern "C" int insert_acnt_node(struct acnt_list* list, const char* name, int access)
{
    journal_record("insert_acnt_node", {list->share, name, std::to_string(access)});
    return 0;
}

extern "C" int acnt_mod_share(const struct acnt_list* list, int mode)
{
    journal_record("acnt_mod_share", {list->share, std::to_string(mode)});
    return 0;
}

extern "C" void free_acnt_list(struct acnt_list* list)
{
    list->head = nullptr;
}

// Removes the share's line from the share store and its /shares link (the folder stays).
extern "C" int del_share(const char* name)
{
    journal_record("del_share", {name});
    std::vector<ShareEntry> shares = load_shares();
    std::erase_if(shares, [name](const ShareEntry& share) { return share.name == name; });
    save_shares(shares);
    unlink_share(name);
    return 0;
}

extern "C" int delete_user_group_name(const char* name)
{
    journal_record("delete_user_group_name", {name});
    return 0;
}

extern "C" int change_user_group_name(const char* old_name, const char* new_name)
{
    journal_record("change_user_group_name", {old_name, new_name});
    return 0;
}

extern "C" int LIB_Web_Get_User_Join_Group(const char* user, char* buffer)
{
    journal_record("LIB_Web_Get_User_Join_Group", {user});
    buffer[0] = '\0';
    return 0;
}

extern "C" int LIB_Get_User_First_Group_Name(const char* user, char* buffer)
{
    journal_record("LIB_Get_User_First_Group_Name", {user});
    buffer[0] = '\0';
    return 0;
}

extern "C" void remove_0D_0A(char* text)
{
    text[std::strcspn(text, "\r\n")] = '\0';
}
