// Small storage libraries: AFP shares, ISO mounts, per-volume data items.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// Removes the AFP share of a folder path.
int afpIf_delShareByPath(const char* path);

// Moves a user's ISO mounts to its new name.
int isoMount_user_rename(const char* old_name, const char* new_name);

// A newly allocated path of the data item `name` kept for `volume` (a mount path such
// as "/mnt/HD/HD_a2"), or NULL when the volume has none. The caller frees it.
char* getDataLocationByVolume(const char* name, const char* volume);
// Stores the content of `file` as the volume's item named after the file's base name.
int saveDataToHiddenByVolume(const char* file, const char* volume);

#ifdef __cplusplus
}
#endif
