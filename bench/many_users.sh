#!/usr/bin/env bash
# Fills a device's account files with COUNT users (user00001 ...), written directly:
# each in allaccount, every tenth also in one of ten groups, and all with a password
# hash and an empty one alternately.
#
#   bench/many_users.sh DEVICE_ROOT COUNT
set -euo pipefail
dev=$1 count=$2
awk -v n="$count" -v dev="$dev" 'BEGIN {
  passwd = dev "/etc/passwd"; shadow = dev "/etc/shadow"; group = dev "/etc/group"
  print "root:x:0:0:root:/home/root:/bin/sh" > passwd
  print "admin:x:500:1001:Administrator,,,,:/shares:/bin/sh" > passwd
  print "root:*:20000:0:99999:7:::" > shadow
  all = "admin"
  for (i = 1; i <= n; i++) {
    name = sprintf("user%05d", i)
    printf "%s:x:%d:1000:User %d,,,,%s@example.com:/shares/%s:/bin/sh\n", name, 1000 + i, i, name, name > passwd
    printf "%s:%s:20000:0:99999:7:::\n", name, (i % 2 ? "$6$bench$x" : "") > shadow
    all = all "," name
    if (i % 10 == 0) team[i / 10 % 10] = team[i / 10 % 10] (team[i / 10 % 10] == "" ? "" : ",") name
  }
  print "root:x:0:" > group
  print "allaccount:x:1000:" all > group
  print "administrators:x:1001:admin" > group
  for (g = 0; g < 10; g++) printf "team%d:x:%d:%s\n", g, 1100 + g, team[g] > group
}'
