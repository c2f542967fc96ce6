// Changing a group's quotas, members or name, one per request.
#include <cstdlib>

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

} // namespace

void cgi_modify_group()
{
    const auto mtype = form_value<8>("mtype");
    const auto group = form_value<64>("group");
    const auto member = form_value<55296>("member");
    const VolumeLimitFields available = read_volume_limit_fields();
    const auto old_group = form_value<64>("oldGroup");

    switch (std::strtol(mtype.c_str(), nullptr, 10)) {
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
