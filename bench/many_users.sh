#!/usr/bin/env bash
# Fills a device's account files with COUNT users (user00001 ...), written directly:
# each in allaccount, every tenth also in one of ten groups, and all with a password
# hash and an empty one alternately. Every line is written as it is formed (the long
# allaccount line piece by piece), so 50,000 users take a fraction of a second.
#
#   bench/many_users.sh DEVICE_ROOT COUNT
set -euo pipefail
dev=$1 count=$2
awk -v n="$count" -v dev="$dev" 'BEGIN {
  passwd = dev "/etc/passwd"; shadow = dev "/etc/shadow"; group = dev "/etc/group"
  print "root:x:0:0:root:/home/root:/bin/sh" > passwd
  print "admin:x:500:1001:Administrator,,,,:/shares:/bin/sh" > passwd
  print "root:*:20000:0:99999:7:::" > shadow
  print "root:x:0:" > group
  printf "allaccount:x:1000:admin" > group
  for (i = 1; i <= n; i++) {
    name = sprintf("user%05d", i)
    printf "%s:x:%d:1000:User %d,,,,%s@example.com:/shares/%s:/bin/sh\n", name, 1000 + i, i, name, name > passwd
    printf "%s:%s:20000:0:99999:7:::\n", name, (i % 2 ? "$6$bench$x" : "") > shadow
    printf ",%s", name > group
  }
  printf "\n" > group
  print "administrators:x:1001:admin" > group
  # Team g holds the users 10 * (10 * k + g), k = 0, 1, ... (user 10 is in team 1).
  for (g = 0; g < 10; g++) {
    printf "team%d:x:%d:", g, 1100 + g > group
    sep = ""
    for (i = (g == 0 ? 100 : 10 * g); i <= n; i += 100) { printf "%s%s", sep, sprintf("user%05d", i) > group; sep = "," }
    printf "\n" > group
  }
}'
