// AFP shares, ISO mounts and per-volume data items of the simulated device.
//
// Per-volume data items: the device keeps small files with each volume (the NFS
// rules of its folders, "exports", and the ISO rules copied to every volume,
// "exports_iso"). Here each item is a plain file inside the volume:
//     <volume>/.systemfile/<name>        e.g. "/mnt/HD/HD_a2/.systemfile/exports"
// saveDataToHiddenByVolume copies the given file there under the file's base name;
// getDataLocationByVolume gives that path when the file exists.
#include "platform/storage.h"

#include <cstdlib>
#include <cstring>
#include <string>
#include <sys/stat.h>

#include "cgi/atomic_file.h"
#include "journal.h"
#include "text_file.h"

namespace {

std::string item_path(std::string_view volume, std::string_view name)
{
    return std::string(volume) + "/.systemfile/" + std::string(name);
}

} // namespace

extern "C" int afpIf_delShareByPath(const char* path)
{
    journal_record("afpIf_delShareByPath", {path});
    return 0;
}

extern "C" int isoMount_user_rename(const char* old_name, const char* new_name)
{
    journal_record("isoMount_user_rename", {old_name, new_name});
    return 0;
}

extern "C" char* getDataLocationByVolume(const char* name, const char* volume)
{
    journal_record("getDataLocationByVolume", {name, volume});
    const std::string path = item_path(volume, name);
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode))
        return nullptr;
    return strdup(path.c_str());
}

extern "C" int saveDataToHiddenByVolume(const char* file, const char* volume)
{
    journal_record("saveDataToHiddenByVolume", {file, volume});
    const std::string_view path(file);
    const std::string target = item_path(volume, path.substr(path.rfind('/') + 1));
    const auto slash = target.rfind('/');
    if (!make_directories(slash == 0 ? "/" : target.substr(0, slash)))
        return -1;
    // The volume's copy is replaced at once: a reader sees the old or the new rules.
    std::string content;
    if (!read_whole_file(file, content))
        return -1;
    return replace_file(target, content) ? 0 : -1;
}
