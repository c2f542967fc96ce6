// The quota library (limits in kilobytes; 0 means no limit) and the disk-space call.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// kind 117 ('u') asks for a user's quota, 103 ('g') for a group's. `limit` receives the
// limit on that volume in kilobytes, `used` the space in use. Returns 0.
int LIB_Quota(int kind, const char* device_dir, const char* name,
              unsigned long long* limit, unsigned long long* used);

int LIB_Set_User_Quota(const char* device_dir, const char* user, long long limit_kb);
int LIB_Set_Group_Quota(const char* device_dir, const char* group, long long limit_kb);

// Largest limit the user's group memberships allow on the volume (0: no bound).
unsigned long long Lib_Get_Max_User_Quota(const char* device_dir, const char* user);
// Largest limit for the user, as the user edit dialog shows it (0: no bound).
unsigned long long Lib_Gen_Get_Max_User_Quota(const char* device_dir, const char* user);
// Smallest limit compatible with the group's members' present limits (0: no bound).
unsigned long long Lib_Get_Min_Group_Quota(const char* device_dir, const char* group);
// The same for a group not yet created, over its member list as the page sends it.
unsigned long long LIB_Get_Add_New_Group_Min_Quota(const char* device_dir, const char* members);

// Brings the user's limits within what its primary group allows.
int LIB_Compare_User_and_Group_Quota(const char* user, const char* group);
// Re-joins the remaining groups' quotas after groups were removed.
int LIB_Rejoin_Other_Group_Quota(void);

// Sizes of the volume mounted at `mount_path`, in the disk library's unit.
int LIB_Get_Disk_Size(const char* mount_path, unsigned long long* total,
                      unsigned long long* used, unsigned long long* free_space);

#ifdef __cplusplus
}
#endif
