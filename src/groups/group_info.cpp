// What the new-group and edit-group pages show: the volumes and the group's limits.
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "platform/quota.h"
#include "volumes/internal_volumes.h"
#include "volumes/volume_table.h"

namespace {

void write_volume_count_and_sizes()
{
    out("<hddnum>%d</hddnum>", count_volumes());
    FixedText<256> sizes;
    list_volume_sizes(sizes);
    out("<hddsize>%s</hddsize>", sizes.c_str());
}

} // namespace

// The names of the internal volumes, then their number and sizes.
void cgi_get_group_info()
{
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<group_info>");
    // A blank table line repeats the volume name before it: the buffers are cleared once.
    for_each_internal_volume([](const VolumeLine& volume) { out("<v_name>%s</v_name>", volume.name.c_str()); },
                             SplitBuffers::ClearedOnce);
    write_volume_count_and_sizes();
    out("</group_info>");
}

// The volumes' number and sizes first, then the group's limit on each internal
// volume in megabytes. "type" is sent by the page and not used.
void cgi_get_modify_group_info()
{
    const auto group = form_value<512>("group");
    [[maybe_unused]] const auto type = form_value<16>("type");

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<group_info>");
    write_volume_count_and_sizes();
    for_each_internal_volume(
        [&](const VolumeLine& volume) {
            unsigned long long limit = 0;
            unsigned long long other = 0;
            LIB_Quota(103, volume.device_dir.c_str(), group.c_str(), &limit, &other);
            out("<quota>");
            out("<v_name>%s</v_name>", volume.name.c_str());
            out("<size>%lld</size>", static_cast<long long>(limit >> 10));
            out("</quota>");
        },
        SplitBuffers::ClearedOnce);
    out("</group_info>");
}
