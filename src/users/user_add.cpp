// Creating a user from the add-user dialog or the setup wizard.
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string_view>
#include <utility>

#include "cgi/event_log.h"
#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/service.h"
#include "cgi/shell.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "platform/flash.h"
#include "platform/share.h"
#include "users/users.h"
#include "volumes/helpers.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"
#include "volumes/volume_table.h"

namespace {

// The access list handed to the share library, released with its own call.
struct AccountList {
    acnt_list list{};
    AccountList(const AccountList&) = delete;
    AccountList& operator=(const AccountList&) = delete;
    explicit AccountList(const char* share) { std::snprintf(list.share, sizeof list.share, "%s", share); }
    ~AccountList() { free_acnt_list(&list); }
};

// The mount path of the first volume line named Volume_1 to Volume_4, by its slot:
// the device column of the line is not used. Empty when no line names a slot.
FixedText<64> first_volume_base_path(FILE* table)
{
    constexpr std::array<std::pair<std::string_view, const char*>, 4> kSlots{{
        {"Volume_1", "/mnt/HD/HD_a2"},
        {"Volume_2", "/mnt/HD/HD_b2"},
        {"Volume_3", "/mnt/HD/HD_c2"},
        {"Volume_4", "/mnt/HD/HD_d2"},
    }};
    FixedText<128> line;
    while (read_line(table, line)) {
        remove_0D_0A(line.data());
        FixedText<64> volume;
        FixedText<16> device_dir;
        std::sscanf(line.c_str(), "%63s = %15s", volume.data(), device_dir.data());
        for (const auto& [slot_name, mount_path] : kSlots) {
            if (volume == slot_name)
                return FixedText<64>(mount_path);
        }
    }
    return {};
}

} // namespace

void create_user_home_share(const char* user, const char* password_flag)
{
    const UniqueFile table = open_volume_table();
    if (!table)
        return;
    const FixedText<64> base = first_volume_base_path(table.get());
    // Without a Volume_1..4 line there is no volume to hold the folder; the device
    // makes no share rather than one at the root.
    if (base.empty())
        return;

    share_record share{};
    std::snprintf(share.name, sizeof share.name, "%s", user);
    std::snprintf(share.path, sizeof share.path, "%s/%s", base.c_str(), user);
    std::snprintf(share.read_only, sizeof share.read_only, "%s", "no");
    std::snprintf(share.browseable, sizeof share.browseable, "%s", "yes");
    share.recycle_bin = 0;
    share.public_access = 1;
    share.media_serving = 0;
    share.remote_access = 1;
    add_share(&share);

    // A user with a password gets a private share: only the user may read and write.
    if (std::strtol(password_flag, nullptr, 10) == 1) {
        public_off_share(user);
        AccountList access(user);
        insert_acnt_node(&access.list, user, 2);
        acnt_mod_share(&access.list, 0);
    }
}

// The user is made by the account tool; this adds default share rights, a home share,
// an unlimited quota, and re-runs the share services. The answer is always "ok":
// the pages do not learn whether the tool succeeded.
void cgi_user_add()
{
    const auto name = form_value<128>("name");
    const auto pw = form_value<256>("pw");
    const auto group = form_value<55296>("group");
    const auto description = form_value<256>("description");
    const auto pw_onoff = form_value<8>("pw_onoff");
    const auto mail = form_value<128>("mail");
    const auto pw_hit = form_value<128>("pw_hit");
    const auto type = form_value<16>("type");
    const auto is_admin = form_value<8>("isAdmin");

    printf_out("name=[%s]\n", name.c_str());
    printf_out("pw=[%s]\n", pw.c_str());
    printf_out("group=[%s]\n", group.c_str());
    printf_out("pw_onoff=[%s]\n", pw_onoff.c_str());
    printf_out("mail=[%s]\n", mail.c_str());
    printf_out("pw_hit=[%s]\n", pw_hit.c_str());
    printf_out("description=[%s]\n", description.c_str());

    // The password stays empty unless the dialog says one is given.
    FixedText<256> password;
    if (std::strtol(pw_onoff.c_str(), nullptr, 10) == 1)
        decode_base64_field(reinterpret_cast<unsigned char*>(password.data()), pw.c_str(), password.size() - 1);

    if (has_shell_metachars(name.c_str()) || has_shell_metachars(description.c_str())
        || has_shell_metachars(mail.c_str()))
        return;

    const bool wizard = type == "wizard";
    const bool becomes_admin = std::strtol(is_admin.c_str(), nullptr, 10) == 1;
    // A name that can never be an account, or a reserved one, is refused like a name
    // with shell metacharacters. The wizard may keep the administrator's own name.
    const bool keeps_admin_name = wizard && becomes_admin && name == "admin";
    if (!is_acceptable_name(name.view()) || (is_reserved_user(name.c_str()) && !keeps_admin_name)) {
        log_refusal("cgi_user_add", "name");
        answer_empty_html();
        return;
    }
    if (!wizard) {
        run_shell_command("account -a -u %s -p %s -l %s -f %s -h %s -e %s", cgi_escapeshellarg(name.c_str()),
                          cgi_escapeshellarg(password.c_str()), cgi_escapeshellarg(group.c_str()),
                          cgi_escapeshellarg(description.c_str()), cgi_escapeshellarg(pw_hit.c_str()),
                          cgi_escapeshellarg(mail.c_str()));
        cgi_escapeshellarg_free();
        log_event("Account \"%s\" has been created.", name.c_str());
    } else if (!becomes_admin) {
        // The wizard's user starts without password, groups or hint: the '' pairs
        // are empty words on purpose.
        run_shell_command("account -a -u %s -p '%s' -l '%s' -f %s -h '%s' -e %s", cgi_escapeshellarg(name.c_str()),
                          "", "", cgi_escapeshellarg(description.c_str()), "", cgi_escapeshellarg(mail.c_str()));
        cgi_escapeshellarg_free();
        log_event("Account \"%s\" has been created.", name.c_str());
    } else {
        // The built-in administrator takes the wizard's name: no new account, so no
        // "created" event.
        run_shell_command("account -u %s -n %s", "admin", cgi_escapeshellarg(name.c_str()));
        run_shell_command("account -m -u %s -f %s -e %s", cgi_escapeshellarg(name.c_str()),
                          cgi_escapeshellarg(description.c_str()), cgi_escapeshellarg(mail.c_str()));
        cgi_escapeshellarg_free();
    }

    set_default_deny(name.c_str());
    if (!becomes_admin && chk_share(name.c_str()) == 1)
        create_user_home_share(name.c_str(), pw_onoff.c_str());

    run_bounded_command(512, "quota_set -u %s -s 0 -a >/dev/null 2>&1", cgi_escapeshellarg(name.c_str()));
    cgi_escapeshellarg_free();
    reload_share_services();
    LIB_CP_Config_To_MTD(4390950);

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<adduser><status>ok</status></adduser>");
}
