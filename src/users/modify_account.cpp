// Changing one property of a user per request, and clearing a user's e-mail.
#include <cstdio>
#include <cstdlib>
#include <grp.h>
#include <pwd.h>

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
#include "platform/storage.h"
#include "users/admin_password.h"
#include "volumes/helpers.h"
#include "volumes/internal_volumes.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

namespace {

// Accounts whose password change needs the old password: the administrators group
// (primary group id 1001) and the built-in administrator (user id 500).
bool is_protected(const passwd* account)
{
    return account->pw_gid == 1001 || account->pw_uid == 500;
}

// Returns the status the page gets: the admin password change's result, else 0.
int change_password(const FixedText<64>& username, const FixedText<256>& old_pw, const FixedText<256>& pw,
                    const FixedText<64>& pw_hit)
{
    const passwd* account = getpwnam(username.c_str());
    if (!account)
        return 0;
    if (is_protected(account))
        return change_admin_password(account, old_pw.c_str(), pw.c_str());
    FixedText<256> password;
    // 255 of the 256 bytes: the decoded password keeps its terminator.
    decode_base64_field(reinterpret_cast<unsigned char*>(password.data()), pw.c_str(), password.size() - 1);
    run_shell_command("account -m -u %s -p %s -h %s", cgi_escapeshellarg(username.c_str()),
                      cgi_escapeshellarg(password.c_str()), cgi_escapeshellarg(pw_hit.c_str()));
    cgi_escapeshellarg_free();
    return 0;
}

void set_group_list(const FixedText<64>& username, const FixedText<1024>& group)
{
    run_shell_command("account -m -u %s -l %s", cgi_escapeshellarg(username.c_str()),
                      cgi_escapeshellarg(group.c_str()));
    cgi_escapeshellarg_free();
    // The user's limits must fit what its primary group now allows.
    const passwd* account = getpwnam(username.c_str());
    if (!account)
        return;
    const gid_t gid = account->pw_gid;
    if (const struct group* primary = getgrgid(gid))
        LIB_Compare_User_and_Group_Quota(username.c_str(), primary->gr_name);
}

// The rename only starts from an existing account, and its follow-up calls only run
// once the new name resolves.
void rename_user(const FixedText<64>& old_name, const FixedText<64>& new_name)
{
    if (!getpwnam(old_name.c_str()))
        return;
    run_bounded_command(512, "account -u %s -n %s", cgi_escapeshellarg(old_name.c_str()),
                        cgi_escapeshellarg(new_name.c_str()));
    cgi_escapeshellarg_free();
    if (!getpwnam(new_name.c_str()))
        return;
    isoMount_user_rename(old_name.c_str(), new_name.c_str());
    change_user_group_name(old_name.c_str(), new_name.c_str());
    LIB_FTP_Change_User_Group(0, old_name.c_str(), new_name.c_str());
    // Two blanks after "start": the line is the device's own; keep it byte for byte.
    run_system("makedav start  > /dev/null 2>&1 &");
    run_system("afpcom >/dev/null 2>&1");
}

void set_expiry(const FixedText<64>& username, const FixedText<32>& expires_time)
{
    FixedText<512> line;
    std::snprintf(line.data(), line.size(), "account -m -u %s -x %s", cgi_escapeshellarg(username.c_str()),
                  cgi_escapeshellarg(expires_time.c_str()));
    cgi_escapeshellarg_free();
    run_system(line.c_str());
    printf_out("cmd=[%s]\n", line.c_str());
}

// With a list the user joins exactly those groups; with none it leaves the
// administrators and falls back to the all-accounts group as its primary group.
void replace_group_list(const FixedText<64>& username, const FixedText<1024>& group)
{
    if (!group.empty()) {
        const char* user = cgi_escapeshellarg(username.c_str());
        const char* groups = cgi_escapeshellarg(group.c_str());
        run_shell_command("account -m -u %s -l %s", user, groups);
        printf_out("account -m -u %s -l %s\n", user, groups);
        cgi_escapeshellarg_free();
        return;
    }
    run_bounded_command(512, "gpasswd -d %s administrators >/dev/null", cgi_escapeshellarg(username.c_str()));
    cgi_escapeshellarg_free();
    run_bounded_command(512, "usermod -g 1000 %s >/dev/null", cgi_escapeshellarg(username.c_str()));
    cgi_escapeshellarg_free();
    run_system("account");
}

// Whether the change of this type may be made to this user: never for a name that can
// never be an account; for a reserved account, no rename (onto or away from it), no
// change of its groups and no password but the administrator's own change, which
// needs the old password.
bool may_change(long mtype, const FixedText<64>& username, const FixedText<64>& old_name)
{
    if (!is_acceptable_name(username.view()))
        return false;
    const bool reserved = is_reserved_user(username.c_str());
    switch (mtype) {
    case 3:
        if (!reserved)
            return true;
        if (const passwd* account = getpwnam(username.c_str()))
            return is_protected(account);
        return true;
    case 4:
    case 9:
        return !reserved;
    case 7:
        return !reserved && is_acceptable_name(old_name.view()) && !is_reserved_user(old_name.c_str());
    default:
        return true;
    }
}

} // namespace

// The edit page sends one request per changed property, chosen by "mtype". Every
// field is read whatever the type. The status is 0 except for the password change of
// a protected account, which reports whether the old password verified.
void cgi_modify_account()
{
    const auto mtype = form_value<8>("mtype");
    const auto username = form_value<64>("username");
    const auto description = form_value<256>("description");
    const auto old_pw = form_value<256>("old_pw");
    const auto pw = form_value<256>("pw");
    const auto pw_hit = form_value<64>("pw_hit");
    const auto mail = form_value<128>("mail");
    const auto group = form_value<1024>("group");
    const VolumeLimitFields available = read_volume_limit_fields();
    [[maybe_unused]] const auto old_mail = form_value<512>("oldMail");   // sent by the page, not used
    const auto old_name = form_value<64>("oldName");
    const auto expires_time = form_value<32>("expires_time");

    printf_out("username=[%s]\n", username.c_str());
    printf_out("description=[%s]\n", description.c_str());

    const long type = std::strtol(mtype.c_str(), nullptr, 10);
    if (!may_change(type, username, old_name)) {
        // Nothing changes; the page gets the answer it always gets.
        log_refusal("cgi_modify_account", type == 7 && is_acceptable_name(username.view())
                                              && !is_reserved_user(username.c_str()) ? "oldName" : "username");
        write_xml_header(Charset::Plain);
        write_xml_prologue();
        out("<info><status>%d</status></info>\n", 0);
        return;
    }

    int status = 0;
    switch (type) {
    case 1:
        run_shell_command("account -m -u %s -f %s", cgi_escapeshellarg(username.c_str()),
                          cgi_escapeshellarg(description.c_str()));
        cgi_escapeshellarg_free();
        break;
    case 2:
        run_shell_command("account -m -u %s -e %s", cgi_escapeshellarg(username.c_str()),
                          cgi_escapeshellarg(mail.c_str()));
        cgi_escapeshellarg_free();
        break;
    case 3:
        status = change_password(username, old_pw, pw, pw_hit);
        break;
    case 4:
        set_group_list(username, group);
        break;
    case 5:
        set_internal_volume_limits(username.c_str(), available, LIB_Set_User_Quota);
        break;
    case 7:
        // "username" holds the new name here.
        rename_user(old_name, username);
        break;
    case 8:
        set_expiry(username, expires_time);
        break;
    case 9:
        replace_group_list(username, group);
        break;
    default:
        break;
    }
    LIB_CP_Config_To_MTD(0x430026);

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<info><status>%d</status></info>\n", status);
}

// The e-mail is the "other" field of the account entry: chfn empties it.
void cgi_remove_email()
{
    const auto username = form_value<64>("username");
    if (!is_acceptable_name(username.view())) {
        log_refusal("cgi_remove_email", "username");
        answer_empty_html();
        return;
    }
    run_bounded_command(256, "chfn -o \"%s\" %s", "", cgi_escapeshellarg(username.c_str()));
    cgi_escapeshellarg_free();
    run_system("account >/dev/null");
    LIB_CP_Config_To_MTD(4);
    answer_empty_html();
}
