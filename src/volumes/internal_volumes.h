// The internal volume numbering: volume k (1, 2, ...) is the k-th line of the volume
// table "/etc/shared_name" whose volume name does not contain "USB", in file order.
// USB disks listed between hard-disk volumes take no number. The quota form fields
// "available1" to "available4", the "%llu:%llu:%llu:%llu" answers and the volume name
// lists of the account and quota pages all count volumes this way. Also here: the
// pages' quota sizes (megabytes) in the quota library's unit (kilobytes).
#pragma once

#include <array>
#include <functional>

#include "cgi/fixed_text.h"

// One line of the table, split with "%63s = %15s".
struct VolumeLine {
    int number = 0;                 // k: 1 for the first internal volume
    FixedText<64> name;             // "Volume_1"
    FixedText<16> device_dir;       // "HD_a2"
};

// Whether the split buffers are cleared before each line, or once before the first.
// When they are cleared once, a line that does not match the pattern (a blank line)
// keeps the previous line's name and directory, and so repeats that volume; some
// pages rely on that.
enum class SplitBuffers { ClearedPerLine, ClearedOnce };

// Calls `visit` for every internal volume line in file order (lines read in pieces of
// at most 255 characters). Returns false, visiting nothing, when the table cannot be
// opened. The quota pages clear the buffers per line; the user and group dialogs
// clear them once.
bool for_each_internal_volume(const std::function<void(const VolumeLine&)>& visit,
                              SplitBuffers buffers = SplitBuffers::ClearedPerLine);

// The quota pages work on the first four internal volumes; further ones are ignored.
inline constexpr int kQuotaVolumes = 4;

// A quota size as the pages send it (megabytes) in the quota library's kilobytes: the
// base-10 value of the text, shifted left by 10 bits as a signed 64-bit number.
// Trailing text is ignored ("100MB" is 100), text without leading digits (an empty or
// missing field) is 0, which means no limit, and a negative value stays negative. A
// value beyond what 64 bits of kilobytes hold is held at the nearest one that fits.
long long kilobytes_from_megabytes(const char* megabytes);

// The form fields "available1" to "available4": the new limits in megabytes on
// internal volumes 1 to 4, 64 bytes each.
using VolumeLimitFields = std::array<FixedText<64>, kQuotaVolumes>;
VolumeLimitFields read_volume_limit_fields();

// The account dialogs' quota change: for each of the first four internal volumes,
// set_limit(device directory from the table line, name, limit in kilobytes). There is
// no "null" test: every one of those volumes is set, a missing field removing its
// limit. The buffers are cleared once, so a blank table line sets the volume before it
// again, with the next field.
using SetQuotaLimit = int (*)(const char* device_dir, const char* name, long long limit_kb);
void set_internal_volume_limits(const char* name, const VolumeLimitFields& available, SetQuotaLimit set_limit);

// The volume paths of internal volumes 1 to 4, each in its own 64-byte buffer:
// "/mnt/HD/" and the device directory as `resolve_volume_path` finds it for the
// volume's name, "null" when it does not find it, empty for a volume the table does
// not have (or when the table cannot be opened).
using VolumePaths = std::array<FixedText<64>, kQuotaVolumes>;
VolumePaths map_internal_volume_paths();

// The device directory of a volume path: the text after its first 8 characters
// ("/mnt/HD/"). An empty path or "null" gives the empty text, since the buffer's
// remaining bytes are zero.
inline const char* device_dir_of(const FixedText<64>& path)
{
    return path.c_str() + 8;
}
