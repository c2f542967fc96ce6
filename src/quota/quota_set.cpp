// Setting the quota limits of one user or one group on the internal volumes 1 to 4.
// The page sends whole megabytes per volume; the quota library takes kilobytes. The
// bounds the pages show beside the boxes are not checked here.
#include <array>

#include "cgi/event_log.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "platform/quota.h"
#include "volumes/internal_volumes.h"
#include "volumes/names.h"

namespace {

enum class Owner { User, Group };

// The one procedure behind both commands; they differ in the library call and the
// trace lines.
void set_quota(Owner owner)
{
    const auto name = form_value<64>("name");
    const VolumeLimitFields available = read_volume_limit_fields();

    const VolumePaths paths = map_internal_volume_paths();

    // A name that can never be an account reaches no quota store.
    if (!is_acceptable_name(name.view())) {
        log_refusal(owner == Owner::User ? "cgi_user_set_quota" : "cgi_group_set_quota", "name");
        answer_empty_html();
        return;
    }

    if (owner == Owner::User) {
        printf_out("path1=%s\n", device_dir_of(paths[0]));
        printf_out("path2=%s\n", device_dir_of(paths[1]));
    } else {
        printf_out("group=%s\n", name.c_str());
        printf_out("available1=%s\n", available[0].c_str());
        printf_out("available2=%s\n", available[1].c_str());
        printf_out("new_path1=%s\n", device_dir_of(paths[0]));
        printf_out("new_path2=%s\n", device_dir_of(paths[1]));
    }

    // "null" leaves a volume as it is; an empty or missing value is 0 and removes the
    // limit. Volumes the table does not have, or whose name does not resolve, are skipped.
    std::array<long long, kQuotaVolumes> limits{};
    for (int k = 0; k < kQuotaVolumes; ++k) {
        if (paths[k].empty() || paths[k] == "null" || available[k] == "null")
            continue;
        limits[k] = kilobytes_from_megabytes(available[k].c_str());
        if (owner == Owner::User)
            LIB_Set_User_Quota(device_dir_of(paths[k]), name.c_str(), limits[k]);
        else
            LIB_Set_Group_Quota(device_dir_of(paths[k]), name.c_str(), limits[k]);
    }

    if (owner == Owner::User) {
        printf_out("size1=[%lld]\n", limits[0]);
        printf_out("size2=[%lld]\n", limits[1]);
        printf_out("size3=[%lld]\n", limits[2]);
        printf_out("size4=[%lld]\n", limits[3]);
    }

    answer_empty_html();
}

} // namespace

void cgi_user_set_quota()
{
    set_quota(Owner::User);
}

void cgi_group_set_quota()
{
    set_quota(Owner::Group);
}
