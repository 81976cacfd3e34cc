#!/bin/bash
# tour-test.sh CLI PROGRAM FOLDER: the tour in a new sample folder, which must come out of it whole.
set -eu
cli=$1 program=$2 folder=$3
rm -rf "$folder"
"$cli" setup "$folder/home" --sample --program "$program"
cp "$folder/home/invest.db" "$folder/home/portfol.db" "$folder"
"$(dirname "$0")/../../scripts/tour.sh" "$folder/home" "$folder/pictures"
# Looking changes no record, and what was opened at the start is closed and tidied at the end.
cmp "$folder/invest.db" "$folder/home/invest.db"
cmp "$folder/portfol.db" "$folder/home/portfol.db"
[ -z "$(find "$folder/home" -name '*.new' -o -name '*.bak' -o -name '*.tmp' -o -name '*.part')" ]
