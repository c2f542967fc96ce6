// The quota page: volumes, how many users and groups can get quotas, whether the
// quota service is on, and the names of internal volumes 1 to 4, which become the
// page's columns "available1" to "available4".
#include <array>

#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "platform/config_store.h"
#include "volumes/internal_volumes.h"
#include "volumes/reserved_accounts.h"
#include "volumes/volume_table.h"

void cgi_get_quota_info()
{
    FixedText<256> sizes;
    list_volume_sizes(sizes);

    write_xml_header(Charset::Utf8);
    write_xml_prologue();
    out("<quota_info>\n");
    out("<hddnum>%d</hddnum>", count_volumes());
    out("<hddsize>%s</hddsize>", sizes.c_str());
    out("<usernum>%d</usernum>", count_listed_users());
    out("<groupnum>%d</groupnum>", count_listed_groups());
    out("<enable>%d</enable>", xml_get_int("/system_mgr/quota/enable"));

    // 32-byte name slots: names are "Volume_" and a number; a longer one is cut to 31.
    std::array<FixedText<32>, kQuotaVolumes> names;
    for_each_internal_volume([&names](const VolumeLine& volume) {
        if (volume.number <= kQuotaVolumes)
            names[volume.number - 1].assign(volume.name.view());
    });
    out("<v_name>%s:%s:%s:%s</v_name>", names[0].c_str(), names[1].c_str(), names[2].c_str(), names[3].c_str());
    out("</quota_info>");

    printf_out("------get quota info--------\n");
    printf_out("num=%d\n", count_volumes());
    printf_out("hddsize=%s\n", sizes.c_str());
    printf_out("---------------------------\n");
}
