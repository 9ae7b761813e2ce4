#!/bin/sh
# icu_equality.sh CONVERTER COMPARER DATA_DIR RELEASE SCRATCH
# Converts tz release RELEASE (DATA_DIR/tzdataRELEASE.tar.gz) with the
# converter, compiles it with genrb beside ICU's other three resources of
# that release, and compares it with ICU's own zoneinfo64 of the release.
set -eu
converter=$1 comparer=$2 data=$3 release=$4 scratch=$5
rm -rf "$scratch"
mkdir -p "$scratch/release" "$scratch/res"
tar -xzf "$data/tzdata$release.tar.gz" -C "$scratch/release"
"$converter" "$scratch/release" "$scratch/zoneinfo64.txt"
genrb -q -d "$scratch/res" "$scratch/zoneinfo64.txt"
for other in metaZones timezoneTypes windowsZones; do
  cp "$data/icu/$release/le/$other.res" "$scratch/res/"
done
exec "$comparer" "$scratch/zoneinfo64.txt" "$data/icu/$release/zoneinfo64.txt" \
  "$scratch/res" "$data/icu/$release/le"
