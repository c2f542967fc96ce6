// Creating a group with its members, and deleting groups.
#include <cstdio>
#include <cstring>
#include <grp.h>

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/service.h"
#include "cgi/shell.h"
#include "platform/cgic.h"
#include "platform/flash.h"
#include "platform/ftp.h"
#include "platform/quota.h"
#include "platform/share.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

// Whether an existing group is decided by the account tool; only a name that can
// never be a group, a reserved group, or a member list naming a reserved user is
// refused here (nothing is created).
void cgi_group_add()
{
    const auto group = form_value<64>("group");
    const auto member = form_value<55296>("member");
    if (!is_acceptable_name(group.view()) || is_reserved_group(group.c_str())
        || lists_reserved_user(member.c_str())) {
        log_refusal("cgi_group_add", is_acceptable_name(group.view()) && !is_reserved_group(group.c_str())
                                         ? "member" : "group");
        answer_empty_html();
        return;
    }

    run_shell_command("account -a -g %s -l %s", cgi_escapeshellarg(group.c_str()),
                      cgi_escapeshellarg(member.c_str()));
    cgi_escapeshellarg_free();
    log_event("Group \"%s\" has been created.", group.c_str());

    // One 128-byte buffer for both texts: a long quota line is cut at 127 characters.
    FixedText<128> buffer;
    std::snprintf(buffer.data(), buffer.size(), "(quota_set -g %s -s 0 -a >/dev/null 2>&1) &",
                  cgi_escapeshellarg(group.c_str()));
    cgi_escapeshellarg_free();
    run_system(buffer.c_str());
    std::snprintf(buffer.data(), buffer.size(), "@%s", group.c_str());
    set_default_deny(buffer.c_str());

    reload_share_services();
    LIB_CP_Config_To_MTD(0x400026);
    answer_empty_html();
}

// "group" lists the groups separated by commas; empty items are skipped.
void cgi_group_del()
{
    auto names = form_value<1024>("group");

    LIB_WEB_STOP_FTP();
    char* rest = nullptr;
    bool first_deletable = true;
    for (char* name = strtok_r(names.data(), ",", &rest); name; name = strtok_r(nullptr, ",", &rest)) {
        // A name that can never be a group, or a reserved group, is skipped with a
        // warning; the others are deleted.
        if (!is_acceptable_name(name) || is_reserved_group(name)) {
            log_refusal("cgi_group_del", "group");
            if (name == names.data())
                first_deletable = false;
            continue;
        }
        // The members' entries are kept for the platform's quota tools, which read the
        // file after the group is gone. A name that is no group has no id to look for,
        // so it gets no file.
        if (const group* entry = getgrnam(name)) {
            run_bounded_command(512, "more /etc/passwd | grep :%d: > /tmp/tmp_old_group_etc_passwd_user.quota",
                                static_cast<int>(entry->gr_gid));
        }
        // Every volume slot is cleared, whether or not the volume exists.
        LIB_Set_Group_Quota("HD_a2", name, 0);
        LIB_Set_Group_Quota("HD_b2", name, 0);
        LIB_Set_Group_Quota("HD_c2", name, 0);
        LIB_Set_Group_Quota("HD_d2", name, 0);
        run_shell_command("account -d -g %s", cgi_escapeshellarg(name));
        cgi_escapeshellarg_free();
        log_event("Group \"%s\" has been deleted.", name);
        LIB_FTP_Del_Group(name);
        // Always the start of the split buffer, that is the FIRST name of the list,
        // once per deleted group. The platform's clean-up has always been called so;
        // do not pass `name` here. A refused first name is never handed on.
        if (first_deletable)
            delete_user_group_name(names.c_str());
    }
    LIB_Rejoin_Other_Group_Quota();
    LIB_WEB_START_FTP();
    reload_share_services();
    LIB_CP_Config_To_MTD(0x400026);

    answer_empty_html();
    // WebDAV restarts only once the answer is written.
    run_system("makedav start > /dev/null 2>&1 &");
}
