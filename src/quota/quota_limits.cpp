// The bounds the quota pages show beside their boxes: the largest quota a user may
// get, the smallest a group may get. The rules live in the quota library; these
// handlers choose the call by the page's context, ask once per internal volume and
// write the numbers as the library returns them (kilobytes, no conversion).
#include <array>
#include <cstdlib>
#include <string_view>

#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "platform/quota.h"
#include "volumes/internal_volumes.h"

namespace {

constexpr int kGroupQuota = 103;   // 'g': LIB_Quota asks for a group's limit

using VolumeValues = std::array<unsigned long long, kQuotaVolumes>;

// Asks `bound` for each of the internal volumes 1 to 4 with the device directory
// of its table line; a volume the table does not have stays 0.
template <typename Bound>
VolumeValues ask_per_volume(Bound bound)
{
    VolumeValues values{};
    for_each_internal_volume([&](const VolumeLine& volume) {
        if (volume.number <= kQuotaVolumes)
            values[volume.number - 1] = bound(volume.device_dir.c_str());
    });
    return values;
}

void write_quota_answer_header()
{
    write_xml_header(Charset::Utf8);
    write_xml_prologue();
}

// The developer trace of the two single-volume queries, under their own heading.
void trace_single_volume_query(const char* heading, const FixedText<8>& hdd, const FixedText<64>& name,
                               const VolumePaths& paths, unsigned long long value)
{
    printf_out_text(heading);
    printf_out("hdd=%s\n", hdd.c_str());
    printf_out("name=%s\n", name.c_str());
    printf_out("path1=%s\n", device_dir_of(paths[0]));
    printf_out("path2=%s\n", device_dir_of(paths[1]));
    printf_out("maxsize=%lld\n", static_cast<long long>(value));
    printf_out("---------------------------\n");
}

} // namespace

// While a user is being added. "name" is what the page has chosen so far: in the
// plain mode it is taken as a group name, and the maximum on each volume is that
// group's limit; in mode "ad" it is a user name for the library's bound.
void cgi_adduser_get_user_quota_maxsize()
{
    const auto name = form_value<64>("name");
    const auto type = form_value<8>("type");

    const VolumeValues max = ask_per_volume([&](const char* device_dir) -> unsigned long long {
        if (type == "ad")
            return Lib_Get_Max_User_Quota(device_dir, name.c_str());
        unsigned long long limit = 0, other = 0;
        LIB_Quota(kGroupQuota, device_dir, name.c_str(), &limit, &other);
        return limit;
    });

    write_quota_answer_header();
    printf_out("------get user max quota--------\n");
    printf_out("name=%s\n", name.c_str());
    printf_out("maxsize=%llu:%llu:%llu:%llu\n", max[0], max[1], max[2], max[3]);
    printf_out("---------------------------\n");
    out("<quota_info>\n");
    out("<max_size>\n");
    out("%llu:%llu:%llu:%llu", max[0], max[1], max[2], max[3]);
    out("</max_size>\n");
    out("</quota_info>\n");
}

// The maximum of an existing user on the volume "hdd" names. "hdd" must be exactly
// "1" to "4" here ("01" answers 0), unlike the group minimum below, which reads it
// as a number; the pages send plain digits to both, so both readings stay.
void cgi_get_user_quota_maxsize()
{
    const auto name = form_value<64>("name");
    const auto hdd = form_value<8>("hdd");
    const VolumePaths paths = map_internal_volume_paths();

    unsigned long long max = 0;
    constexpr std::array<std::string_view, kQuotaVolumes> kNumbers{"1", "2", "3", "4"};
    for (int k = 0; k < kQuotaVolumes; ++k) {
        if (hdd == kNumbers[k])
            max = Lib_Get_Max_User_Quota(device_dir_of(paths[k]), name.c_str());
    }

    write_quota_answer_header();
    trace_single_volume_query("------get user max quota--------\n", hdd, name, paths, max);
    out("<quota_info>\n");
    out("<max_size>%llu</max_size>\n", max);
    out("</quota_info>\n");
}

// While a group is being added. "name" is the page's member list of the new group
// (comma-separated user names), hence its large buffer. In mode "ad" the library is
// asked as for an existing group of that name.
void cgi_addgroup_get_group_quota_minsize()
{
    const auto members = form_value<55296>("name");
    const auto type = form_value<16>("type");

    const VolumeValues min = ask_per_volume([&](const char* device_dir) {
        if (type == "ad")
            return Lib_Get_Min_Group_Quota(device_dir, members.c_str());
        return LIB_Get_Add_New_Group_Min_Quota(device_dir, members.c_str());
    });

    write_quota_answer_header();
    out("<quota_info>\n");
    out("<min_size>%llu:%llu:%llu:%llu</min_size>\n", min[0], min[1], min[2], min[3]);
    out("</quota_info>\n");
}

// The minimum of an existing group on the volume "hdd" names, read as a number:
// leading blanks, a sign, leading zeros and trailing text pass ("01", "2x").
void cgi_get_group_quota_minsize()
{
    const auto name = form_value<64>("name");
    const auto hdd = form_value<8>("hdd");
    const VolumePaths paths = map_internal_volume_paths();

    unsigned long long min = 0;
    const long volume = std::strtol(hdd.c_str(), nullptr, 10);
    if (volume >= 1 && volume <= kQuotaVolumes)
        min = Lib_Get_Min_Group_Quota(device_dir_of(paths[volume - 1]), name.c_str());

    write_quota_answer_header();
    trace_single_volume_query("------get group min quota--------\n", hdd, name, paths, min);
    // The page reads the minimum under the maximum's element name, on one line; the
    // name and the shape stay as the page expects them.
    out("<quota_info><max_size>%llu</max_size></quota_info>", min);
}
