// NFS export lines: the parsed record of one line, the parser of a whole exports
// file, the line formatter, and the two look-ups the formatter rests on (the share
// link that points at a folder, and the vfat test that picks the ids of USB rules).
//
// An export line, as the NFS server reads it:
//     "/nfs/Public" 192.168.1.0/24(rw,all_squash,sync,no_wdelay,...,anonuid=501,anongid=1000)
// The folder text between the first and the last double quote, then a blank, the host,
// and the options in parentheses: the access word first, the squash word second.
#pragma once

#include <cstddef>
#include <cstdio>
#include <memory>

#include "cgi/fixed_text.h"

// One parsed export line. A record whose `volume` is empty is a cleared record: a line
// that could not be parsed, or the unparsed last line of a file without a final newline.
struct exports_entry {
    FixedText<256> volume;      // the folder text between the first and the last double quote
    FixedText<64> ip;           // the host pattern before "("
    int rw = 0;                 // 1 when the first option begins with "rw"
    int root_squash = 0;        // 0 when the second option is "no_root_squash", else 1
    std::unique_ptr<exports_entry> next;

    exports_entry() = default;
    exports_entry(const exports_entry&) = delete;
    exports_entry& operator=(const exports_entry&) = delete;
    // Releases the rest of the list one record at a time, so that a long file does
    // not release itself recursively.
    ~exports_entry();
};

// A parsed exports file: a head record that carries no rule, then one record per line
// read. The caller owns it; dropping it frees every record.
using ExportsList = std::unique_ptr<exports_entry>;

// A new cleared record, or nothing when memory runs out.
ExportsList new_exports_entry();

// Parses an exports file. Nothing when the file cannot be opened or memory runs out.
ExportsList load_exports_config(const char* path);
// The same for a file already open for reading, from its current position.
ExportsList parse_exports_config(FILE* file);

// The records after the head, counted (the share overview tells one record from many).
int count_records(const ExportsList& list);

// Formats one export line of `folder` (a canonical path) into `out` (cleared to
// `out_size` bytes first). `hidden` 1 gives the line of a per-volume copy or of a USB
// folder's own file, 0 the line of "/etc/exports", which may be empty: a folder that
// is neither on USB nor behind a share link has no line there.
void make_config_string(const char* folder, const char* host, int rw, int root_squash, char* out,
                        std::size_t out_size, int hidden);

template <std::size_t N>
void make_config_string(const char* folder, const char* host, int rw, int root_squash, FixedText<N>& out,
                        int hidden)
{
    make_config_string(folder, host, rw, root_squash, out.data(), N, hidden);
}

// The share link name: the entry of `directory` ("/shares") that resolves to `folder`.
// 0 with the name copied out, -1 when no entry resolves to it.
int find_share_link_name(const char* directory, const char* folder, FixedText<512>& name);

// 1 when the mount table holds a file system of `type` that counts for the folder,
// -1 otherwise or without a mount table. See the definition for how wide it reads.
int is_mount_type(const char* folder, const char* type);

// The device's mount table "/etc/mtab", open for getmntent(); closed with endmntent().
struct MountTableCloser {
    void operator()(FILE* table) const;
};
using UniqueMountTable = std::unique_ptr<FILE, MountTableCloser>;
UniqueMountTable open_mount_table();

// The canonical path of `path`; false (and `out` untouched) when it cannot be resolved.
bool canonical_path(const char* path, FixedText<4096>& out);
