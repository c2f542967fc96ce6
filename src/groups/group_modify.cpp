// Changing a group's quotas, members or name, one per request.
#include <cstdlib>

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "platform/flash.h"
#include "platform/ftp.h"
#include "platform/quota.h"
#include "platform/share.h"
#include "volumes/internal_volumes.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

namespace {

// Unlike the user rename, nothing checks that the old name exists or that the rename
// worked: the follow-up calls and restarts always run.
void rename_group(const FixedText<64>& old_name, const FixedText<64>& new_name)
{
    const char* old_word = cgi_escapeshellarg(old_name.c_str());
    const char* new_word = cgi_escapeshellarg(new_name.c_str());
    run_shell_command("account -g %s -o %s", old_word, new_word);
    // The trace line has no line end of its own.
    printf_out("account -g %s -o %s", old_word, new_word);
    cgi_escapeshellarg_free();
    change_user_group_name(old_name.c_str(), new_name.c_str());
    LIB_FTP_Change_User_Group(1, old_name.c_str(), new_name.c_str());
    run_system("makedav start > /dev/null 2>&1 &");
    run_system("afpcom >/dev/null 2>&1");
}

// The field whose value this change may not take, or null. A name that can never be
// a group is refused for every type; a reserved group is never renamed (onto or away
// from) and its members never change, nor does a member list name a reserved user.
// Quotas stay the quota library's business.
const char* refused_field(long mtype, const FixedText<64>& group, const FixedText<64>& old_group,
                          const char* member)
{
    if (!is_acceptable_name(group.view()))
        return "group";
    switch (mtype) {
    case 2:
        if (is_reserved_group(group.c_str()))
            return "group";
        return lists_reserved_user(member) ? "member" : nullptr;
    case 3:
        if (is_reserved_group(group.c_str()))
            return "group";
        return !is_acceptable_name(old_group.view()) || is_reserved_group(old_group.c_str()) ? "oldGroup" : nullptr;
    default:
        return nullptr;
    }
}

} // namespace

void cgi_modify_group()
{
    const auto mtype = form_value<8>("mtype");
    const auto group = form_value<64>("group");
    const auto member = form_value<55296>("member");
    const VolumeLimitFields available = read_volume_limit_fields();
    const auto old_group = form_value<64>("oldGroup");

    const long type = std::strtol(mtype.c_str(), nullptr, 10);
    if (const char* field = refused_field(type, group, old_group, member.c_str())) {
        log_refusal("cgi_modify_group", field);
        answer_empty_html();
        return;
    }
    switch (type) {
    case 1:
        set_internal_volume_limits(group.c_str(), available, LIB_Set_Group_Quota);
        break;
    case 2:
        run_shell_command("account -m -g %s -l %s", cgi_escapeshellarg(group.c_str()),
                          cgi_escapeshellarg(member.c_str()));
        cgi_escapeshellarg_free();
        break;
    case 3:
        // "group" holds the new name here.
        rename_group(old_group, group);
        break;
    default:
        break;
    }
    LIB_CP_Config_To_MTD(0x400002);
    answer_empty_html();
}
