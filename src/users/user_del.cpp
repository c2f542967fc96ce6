// Deleting the users chosen in the user list.
#include <cstring>

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/service.h"
#include "cgi/shell.h"
#include "cgi/text_escape.h"
#include "platform/flash.h"
#include "platform/ftp.h"
#include "platform/quota.h"
#include "platform/share.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

namespace {

// A name that can never be an account, or a reserved account, is skipped with a
// warning; the others are deleted.
bool deletable(const char* user)
{
    if (is_acceptable_name(user) && !is_reserved_user(user))
        return true;
    log_refusal("cgi_user_del", "name");
    return false;
}

} // namespace

// "name" lists the users separated by commas; a run of commas counts as one. No step
// looks at a result: an unknown name still gets its event, quota and FTP calls.
void cgi_user_del()
{
    auto names = form_value<512>("name");

    LIB_WEB_STOP_FTP();
    char* rest = nullptr;
    bool first_deletable = true;
    for (char* user = strtok_r(names.data(), ",", &rest); user; user = strtok_r(nullptr, ",", &rest)) {
        const bool is_first = user == names.data();
        if (!deletable(user)) {
            if (is_first)
                first_deletable = false;
            continue;
        }
        // The name stands inside the line's single quotes; a quote in it is escaped.
        run_shell_command("account -d -u '%s'", inside_single_quotes(user).c_str());
        log_event("Account \"%s\" has been deleted.", user);
        // Every volume slot is cleared, whether or not the volume exists.
        LIB_Set_User_Quota("HD_a2", user, 0);
        LIB_Set_User_Quota("HD_b2", user, 0);
        LIB_Set_User_Quota("HD_c2", user, 0);
        LIB_Set_User_Quota("HD_d2", user, 0);
        LIB_FTP_Del_User(user);
        // Always the start of the split buffer, that is the FIRST name of the list,
        // once per listed user. The platform's clean-up has always been called so;
        // do not pass `user` here. A refused first name is never handed on.
        if (first_deletable)
            delete_user_group_name(names.c_str());
    }
    LIB_WEB_START_FTP();
    reload_share_services();
    LIB_CP_Config_To_MTD(4390950);

    answer_empty_html();
    // WebDAV restarts only once the answer is written.
    run_system("makedav start > /dev/null 2>&1 &");
}
