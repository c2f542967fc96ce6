// The NFS export rules of folders and the two stores that hold each of them:
//   - "/etc/exports", the system file the NFS server reads on "exportfs -r", written
//     in the share-link form ("/nfs/NAME") and holding at most one host per folder;
//   - the store that travels with the disk: for a hard-disk folder the volume's
//     "exports" copy (staged in "/tmp/exports"), for a folder under "/mnt/isoMount/"
//     the "exports_iso" copy kept identically on every hard-disk volume (staged in
//     "/tmp/exports_iso"), for a USB folder its own one-line "<folder>/.exports".
// Each operation returns 0 on success and -1 on failure; nothing reaches the answer,
// failures leave only a developer trace.
#pragma once

#include <vector>

#include "cgi/fixed_text.h"

// On "/etc/exports".
int add_config_string(const char* folder, const char* host, int rw, int root_squash);
int modify_config_string(const char* folder, const char* host, const char* newip, int rw, int root_squash);
int delete_config_string(const char* folder, const char* host);

// On the folder's second store.
int add_hidden_config_string(const char* folder, const char* host, int rw, int root_squash);
int modify_hidden_config_string(const char* folder, const char* host, const char* newip, int rw, int root_squash);
int delete_hidden_config_string(const char* folder, const char* host);

// The engines behind them. `newip` may be null (no new host); `del` is 1 or 0.
int modify_config_string_base(const char* folder, const char* host, const char* newip, int rw, int root_squash,
                              int del);
int modify_hidden_config_string_base(const char* folder, const char* host, const char* newip, int rw,
                                     int root_squash, int del);

// Every mount directory of "/etc/mtab" that contains "/mnt/HD/", in table order (256
// bytes each). 0, or -1 when there is none.
int list_hd_mounts(std::vector<FixedText<256>>& mounts);

// Saves "/tmp/exports_iso" as the "exports_iso" copy of every hard-disk volume and
// removes it. -1 (the staging file stays) when no hard-disk volume is mounted.
int save_iso_exports_to_volumes();

// 1 when getfacl shows default entries for the folder, 0 when not, -1 when it cannot run.
int has_default_acl(const char* folder);
