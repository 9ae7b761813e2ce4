#!/bin/sh
# glibc_agreement.sh CONVERTER CHECKER RELEASE_DIR OTHER_RES_DIR SCRATCH
# Converts the release in RELEASE_DIR (tzdata.zi and zone.tab), compiles it
# with genrb beside the other three ICU resources of OTHER_RES_DIR and the
# zic input it was converted from (negative savings folded) with zic, and
# checks that ICU and glibc agree on every zone.
set -eu
converter=$1 checker=$2 release=$3 others=$4 scratch=$5
rm -rf "$scratch"
mkdir -p "$scratch/res" "$scratch/zoneinfo"
"$converter" "$release" "$scratch/zoneinfo64.txt" "$scratch/tzdata.zi"
genrb -q -d "$scratch/res" "$scratch/zoneinfo64.txt"
for other in metaZones timezoneTypes windowsZones; do
  cp "$others/$other.res" "$scratch/res/"
done
zic -d "$scratch/zoneinfo" "$scratch/tzdata.zi"
cp "$scratch/tzdata.zi" "$scratch/zoneinfo/"
exec "$checker" "$scratch/res" "$scratch/zoneinfo"
