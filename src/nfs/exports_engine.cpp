#include "nfs/exports_engine.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <mntent.h>
#include <new>
#include <string>
#include <unistd.h>

#include "cgi/file.h"
#include "cgi/shell.h"
#include "cgi/text_escape.h"
#include "cgi/trace.h"
#include "nfs/exports_parser.h"
#include "platform/cgic.h"
#include "platform/storage.h"

namespace {

constexpr const char* kSystemExports = "/etc/exports";
constexpr const char* kVolumeStaging = "/tmp/exports";
constexpr const char* kIsoStaging = "/tmp/exports_iso";

struct FreeDeleter {
    void operator()(char* text) const { std::free(text); }
};
// A location the storage library allocated.
using DataLocation = std::unique_ptr<char, FreeDeleter>;

// The volume prefix of a hard-disk folder: the first 13 characters of its path, the
// length of "/mnt/HD/HD_a2", and the terminator.
using VolumePrefix = FixedText<14>;

FixedText<4096> resolve_folder(const char* folder)
{
    FixedText<4096> folder_realp;
    if (!canonical_path(folder, folder_realp))
        folder_realp.assign(folder);
    return folder_realp;
}

bool is_usb_folder(const FixedText<4096>& folder)
{
    return std::strncmp(folder.c_str(), "/mnt/USB/", 9) == 0;
}

bool is_iso_folder(const FixedText<4096>& folder)
{
    return std::strncmp(folder.c_str(), "/mnt/isoMount/", 14) == 0;
}

// A trace that shows a formatted export line, whose own line end stays; the values
// around it are escaped by the caller.
template <std::size_t N>
void trace_export_line(const std::string& before, const FixedText<N>& line, const char* after)
{
    if (trace_enabled())
        printf_out_text((before + line.c_str() + after).c_str());
}

void write_text(FILE* file, const char* text)
{
    std::fputs(text, file);
}

// A folder that got its first rule in "/etc/exports": the "/nfs" root of the share-link
// lines is made again, and the folder gets default ACLs unless it has some already
// (in the background; it may still run when the request has been answered).
void follow_up_new_rule(const FixedText<4096>& folder_realp)
{
    run_system("rm -rf /nfs ; ln -s /shares /nfs");
    if (folder_realp.empty() || has_default_acl(folder_realp.c_str()) != 0)
        return;
    run_bounded_command(1024, "setfacl -m d:u::rwx,d:o::rwx,d:g::rwx %s > /dev/null 2>&1 &",
                        cgi_escapeshellarg(folder_realp.c_str()));
    cgi_escapeshellarg_free();
}

// The USB folder's own ".exports": exactly one line, the folder's one rule.
int modify_usb_exports(const FixedText<4096>& folder_realp, const char* host, const char* newip, int rw,
                       int root_squash, int del)
{
    FixedText<4096 + sizeof("/.exports")> store;     // the canonical path always fits
    std::snprintf(store.data(), store.capacity, "%s/.exports", folder_realp.c_str());
    if (del != 0) {
        std::remove(store.c_str());
        if (access(store.c_str(), F_OK) == 0)
            return -1;
        printf_out("delete hidden folder_realp[%s] host[%s]  !!!\n\n", folder_realp.c_str(), host);
        return 0;
    }

    UniqueFile file = open_file(store.c_str(), "w");
    if (!file) {
        printf_out("Cannot open file[%s]!!!\n", store.c_str());
        return -1;
    }
    FixedText<1024> line;
    make_config_string(folder_realp.c_str(), newip != nullptr ? newip : host, rw, root_squash, line, 1);
    write_text(file.get(), line.c_str());
    file.reset();
    trace_export_line("write to USB hidden conf file, bufs\n[", line, "]\n\n");
    return 0;
}

// Hands the staged copy to the storage library: to the folder's volume, or for ISO
// folders to every hard-disk volume.
int publish_staged_copy(bool iso, const VolumePrefix& volume)
{
    if (iso)
        return save_iso_exports_to_volumes();
    saveDataToHiddenByVolume(kVolumeStaging, volume.c_str());
    std::remove(kVolumeStaging);
    return 0;
}

} // namespace

int modify_config_string_base(const char* folder, const char* host, const char* newip, int rw, int root_squash,
                              int del)
{
    const FixedText<4096> folder_realp = resolve_folder(folder);

    // A missing "/etc/exports" fails every operation; it is not created here.
    const ExportsList list = load_exports_config(kSystemExports);
    if (!list) {
        printf_out("can't malloc memory.\n");
        return -1;
    }

    FixedText<512> line;
    if (!list->next) {
        if (del != 0)
            return 0;
        UniqueFile file = open_file(kSystemExports, "a");
        if (!file)
            return -1;
        make_config_string(folder_realp.c_str(), newip != nullptr ? newip : host, rw, root_squash, line, 0);
        write_text(file.get(), line.c_str());
        file.reset();
        follow_up_new_rule(folder_realp);
        return 0;
    }

    // The whole file is rewritten from the parsed rules.
    UniqueFile file = open_file(kSystemExports, "w+");
    if (!file) {
        printf_out("Failed to open config file!\n");
        return -1;
    }
    bool found = false;
    for (exports_entry* record = list->next.get(); record != nullptr; record = record->next.get()) {
        FixedText<4096> resolved;
        if (canonical_path(record->volume.c_str(), resolved))
            record->volume.assign(resolved.view());

        if (!(record->volume == folder_realp.view())) {
            make_config_string(record->volume.c_str(), record->ip.c_str(), record->rw, record->root_squash, line, 0);
            write_text(file.get(), line.c_str());
            continue;
        }
        // The folder keeps one host in this file: a rule of the folder for another
        // host is left out, so adding a second host replaces the first and deleting
        // one host removes the others too.
        if (host == nullptr || !(record->ip == host))
            continue;
        found = true;
        if (del != 0) {
            printf_out("found %s %s!!! delete!!!\n\n", folder_realp.c_str(), host);
            continue;
        }
        // Without a new host (an add of a rule that is already there) the rule keeps
        // its own host and takes the new access.
        if (newip != nullptr)
            record->ip.assign(newip);
        record->rw = rw;
        record->root_squash = root_squash;
        make_config_string(record->volume.c_str(), record->ip.c_str(), record->rw, record->root_squash, line, 0);
        write_text(file.get(), line.c_str());
        trace_export_line(one_line(folder_realp.view()) + " " + one_line(host) + " found!!!\nwrite buf\n[", line,
                          "]\n\n");
    }

    if (found)
        return 0;
    // Deleting a rule that is not there: the rewrite of the others stands.
    if (del != 0)
        return -1;
    if (newip != nullptr) {
        printf_out("folder_realp[%s] ip[%s] newip[%s] setting not exist, modify skip!!!\n\n", folder_realp.c_str(),
                   host, newip);
    } else {
        make_config_string(folder_realp.c_str(), host, rw, root_squash, line, 0);
        write_text(file.get(), line.c_str());
        trace_export_line("write new folder_realp[" + one_line(folder_realp.view()) + "] host[" + one_line(host)
                              + "]\n write buf\n[",
                          line, "]\n\n");
    }
    file.reset();
    follow_up_new_rule(folder_realp);
    return 0;
}

int modify_hidden_config_string_base(const char* folder, const char* host, const char* newip, int rw,
                                     int root_squash, int del)
{
    const FixedText<4096> folder_realp = resolve_folder(folder);
    if (is_usb_folder(folder_realp))
        return modify_usb_exports(folder_realp, host, newip, rw, root_squash, del);

    // Where the copy comes from: for ISO folders the first hard-disk volume that has
    // one, else the folder's own volume.
    const bool iso = is_iso_folder(folder_realp);
    VolumePrefix volume;
    DataLocation source;
    if (iso) {
        std::vector<FixedText<256>> mounts;
        try {
            if (list_hd_mounts(mounts) != 0) {
                printf_out("no partition mount!!\n\n");
                return -1;
            }
        } catch (const std::bad_alloc&) {
            printf_out("can't malloc memory.\n");
            return -1;
        }
        for (const FixedText<256>& mount : mounts) {
            if (mount.empty())
                continue;
            source.reset(getDataLocationByVolume("exports_iso", mount.c_str()));
            if (source)
                break;
        }
    } else {
        volume.assign(folder_realp.view());
        source.reset(getDataLocationByVolume("exports", volume.c_str()));
    }
    const char* staging = iso ? kIsoStaging : kVolumeStaging;

    ExportsList list;
    if (source) {
        list = load_exports_config(source.get());
        if (!list) {
            printf_out("can't malloc memory.\n");
            return -1;
        }
    }

    FixedText<1024> line;
    if (!list || !list->next) {
        if (del != 0) {
            const void* first = list ? static_cast<const void*>(list->next.get()) : nullptr;
            printf_out("no conf to delete open_config_path[%s] cur[%p]\n", source ? source.get() : "(null)", first);
            return 0;
        }
        UniqueFile file = open_file(staging, "w+");
        if (!file) {
            printf_out(iso ? "can't open /tmp/exports_iso .\n" : "can't open /tmp/exports .\n");
            return -1;
        }
        make_config_string(folder_realp.c_str(), newip != nullptr ? newip : host, rw, root_squash, line, 1);
        write_text(file.get(), line.c_str());
        file.reset();
        return publish_staged_copy(iso, volume);
    }

    UniqueFile file = open_file(staging, "w+");
    if (!file) {
        printf_out("can't open /tmp/exports or /tmp/exports_iso file.\n");
        return -1;
    }
    bool found = false;
    for (exports_entry* record = list->next.get(); record != nullptr; record = record->next.get()) {
        if (record->volume.empty())
            continue;
        // The copy holds paths below the volume; the volume goes back in front.
        FixedText<4096> full_path;
        if (iso)
            std::snprintf(full_path.data(), full_path.capacity, "/mnt/isoMount%s", record->volume.c_str());
        else
            std::snprintf(full_path.data(), full_path.capacity, "%s%s", volume.c_str(), record->volume.c_str());

        bool match = false;
        if (full_path == folder_realp.view()) {
            printf_out("cur->volume[%s] cur->ip[%s] modify_hidden_config_string_base cgi\n\n", record->volume.c_str(),
                       record->ip.c_str());
            // Without a host every rule of the folder matches.
            match = host == nullptr || host[0] == '\0' || record->ip == host;
        }
        if (!match) {
            make_config_string(full_path.c_str(), record->ip.c_str(), record->rw, record->root_squash, line, 1);
            write_text(file.get(), line.c_str());
            continue;
        }
        found = true;
        if (del != 0) {
            printf_out("found!!! cur->volume[%s] cur->ip[%s] hidden delete cgi\n\n", record->volume.c_str(),
                       record->ip.c_str());
            continue;
        }
        if (newip != nullptr) {
            record->ip.clear();
            record->ip.assign(newip);
        } else {
            printf_out("hidden write new[%s] [%s] exist, skip!!!\n\n", folder_realp.c_str(), record->ip.c_str());
        }
        record->rw = rw;
        record->root_squash = root_squash;
        make_config_string(full_path.c_str(), record->ip.c_str(), record->rw, record->root_squash, line, 1);
        write_text(file.get(), line.c_str());
        trace_export_line("found!! hidden write bufs\n[", line, "]\n");
    }

    if (!found) {
        // The staging file stays behind; the next operation overwrites it.
        if (del != 0) {
            printf_out("conf string not found!!!\n");
            return -1;
        }
        if (newip != nullptr) {
            printf_out("folder_realp[%s] ip[%s] newip[%s] setting not exist, modify skip!!!\n\n",
                       folder_realp.c_str(), host, newip);
        } else {
            make_config_string(folder_realp.c_str(), host, rw, root_squash, line, 1);
            write_text(file.get(), line.c_str());
            trace_export_line("write new hidden, folder_realp[" + one_line(folder_realp.view()) + "] host["
                                  + one_line(host) + "]\n write buf\n[",
                              line, "]\n\n");
        }
    }
    file.reset();
    return publish_staged_copy(iso, volume);
}

int list_hd_mounts(std::vector<FixedText<256>>& mounts)
{
    const UniqueMountTable table = open_mount_table();
    if (!table)
        return -1;
    while (const mntent* mount = getmntent(table.get())) {
        if (std::strstr(mount->mnt_dir, "/mnt/HD/") != nullptr)
            mounts.emplace_back(mount->mnt_dir);
    }
    return mounts.empty() ? -1 : 0;
}

int save_iso_exports_to_volumes()
{
    std::vector<FixedText<256>> mounts;
    if (list_hd_mounts(mounts) != 0)
        return -1;
    for (const FixedText<256>& mount : mounts)
        saveDataToHiddenByVolume(kIsoStaging, mount.c_str());
    std::remove(kIsoStaging);
    return 0;
}

int has_default_acl(const char* folder)
{
    FixedText<512> command;
    std::snprintf(command.data(), command.capacity, "getfacl -p %s 2>/dev/null", cgi_escapeshellarg(folder));
    cgi_escapeshellarg_free();
    const UniquePipe pipe = open_pipe(command.c_str());
    if (!pipe)
        return -1;
    FixedText<1024> line;
    while (read_line(pipe.get(), line)) {
        if (std::strstr(line.c_str(), "default") != nullptr)
            return 1;
    }
    return 0;
}

int add_config_string(const char* folder, const char* host, int rw, int root_squash)
{
    return modify_config_string_base(folder, host, nullptr, rw, root_squash, 0);
}

int modify_config_string(const char* folder, const char* host, const char* newip, int rw, int root_squash)
{
    return modify_config_string_base(folder, host, newip, rw, root_squash, 0);
}

int delete_config_string(const char* folder, const char* host)
{
    return modify_config_string_base(folder, host, nullptr, 0, 0, 1);
}

int add_hidden_config_string(const char* folder, const char* host, int rw, int root_squash)
{
    return modify_hidden_config_string_base(folder, host, nullptr, rw, root_squash, 0);
}

int modify_hidden_config_string(const char* folder, const char* host, const char* newip, int rw, int root_squash)
{
    return modify_hidden_config_string_base(folder, host, newip, rw, root_squash, 0);
}

int delete_hidden_config_string(const char* folder, const char* host)
{
    return modify_hidden_config_string_base(folder, host, nullptr, 0, 0, 1);
}
