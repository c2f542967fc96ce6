// AFP shares, ISO mounts and per-volume data items of the simulated device. Not
// built yet: each call is only an event.
#include "platform/storage.h"

#include "journal.h"

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
    return nullptr;
}

extern "C" int saveDataToHiddenByVolume(const char* file, const char* volume)
{
    journal_record("saveDataToHiddenByVolume", {file, volume});
    return 0;
}
