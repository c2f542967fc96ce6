// What the NFS commands accept before a rule reaches an exports file: a host in the
// exports host grammar and a folder inside the volumes whose path fits in a line.
#pragma once

#include <string_view>

// "*"; a host name, optionally with "*" and "?" wildcards; an IPv4 address, alone or
// with "/prefix" (0-32) or "/netmask"; an IPv6 address, alone or with "/prefix"
// (0-128); "@netgroup". The empty host passes: the engine writes it as "*".
bool is_export_host(std::string_view host);

// Whether the folder, once resolved, lies below "/mnt/HD/", "/mnt/USB/" or
// "/mnt/isoMount/" and its path holds no double quote and no control character (either
// would break its export line). A folder that does not resolve is judged by its text,
// which may then hold no "." or ".." component. The empty folder passes: it matches
// no rule.
bool is_export_folder(const char* folder);
