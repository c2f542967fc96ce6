// What the edit dialog of one user shows.
#include <pwd.h>

#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "platform/quota.h"
#include "platform/share.h"
#include "volumes/internal_volumes.h"
#include "volumes/volume_table.h"

// The user's quota and largest allowed quota on each internal volume, the volumes'
// number and sizes, and the user's first group. Names and numbers are written raw.
void cgi_get_modify_user_info()
{
    const auto name = form_value<64>("name");
    FixedText<256> sizes;
    list_volume_sizes(sizes);
    const int volumes = count_volumes();

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<user_info>\n");

    // User id 500 is the built-in administrator: it is never edited through this
    // dialog, so it gets the same empty answer as an unknown name. Keep the test.
    const passwd* entry = getpwnam(name.c_str());
    if (!entry || entry->pw_uid == 500) {
        out("</user_info>");
        return;
    }

    // A blank table line repeats the volume before it: the buffers are cleared once.
    for_each_internal_volume(
        [&](const VolumeLine& volume) {
            const char* device_dir = volume.device_dir.c_str();
            unsigned long long limit = 0;
            unsigned long long used = 0;
            LIB_Quota(117, device_dir, name.c_str(), &limit, &used);
            const unsigned long long max_quota = Lib_Gen_Get_Max_User_Quota(device_dir, name.c_str());
            out("<quota_info>");
            out("<v_name>%s</v_name>", volume.name.c_str());
            out("<quota>%lld</quota>", static_cast<long long>(limit >> 10));
            out("<max_quota>%lld</max_quota>", static_cast<long long>(max_quota >> 10));
            out("</quota_info>");
        },
        SplitBuffers::ClearedOnce);

    out("<hddnum>%d</hddnum>", volumes);
    out("<hddsize>%s</hddsize>", sizes.c_str());
    FixedText<64> main_group;
    LIB_Get_User_First_Group_Name(name.c_str(), main_group.data());
    out("<main_group>%s</main_group>", main_group.c_str());
    out("</user_info>");
}
