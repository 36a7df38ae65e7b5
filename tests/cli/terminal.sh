#!/usr/bin/env bash
# What only a terminal gets: a table, cut to its width, and colours.
source "$(dirname "$0")/Check.sh"
make_shop
"$VORNJSONDB" update shop.db product 1 'name=漢字漢字漢字漢字漢字' --quiet
"$VORNJSONDB" update shop.db product 2 $'name=a\tb\e[31m' --quiet

on_terminal() {
    script -qec "stty cols $1; $2" /dev/null </dev/null | tr -d '\r'
}
same 'cut at 30 columns' "$(on_terminal 30 "NO_COLOR=1 '$VORNJSONDB' list shop.db product")" \
'id  name   price  tags   on
--  -----  -----  -----  ----
-3  漢字     0.5
 1  漢字…    5.0  ["a"…  true
 2  a\tb…    0.1'
same 'a bold header' "$(on_terminal 80 "'$VORNJSONDB' tables shop.db" | head -n 1)" \
    $'\e[1mtable'
same 'a red error' "$(on_terminal 80 "'$VORNJSONDB' lst")" \
    $'\e[1;31merror:\e[0m unknown subcommand "lst"; did you mean "list"?'
same 'a dumb terminal' "$(on_terminal 80 "TERM=dumb '$VORNJSONDB' lst")" \
    'error: unknown subcommand "lst"; did you mean "list"?'

# A bar for what takes longer than a second, erased before the summary. Records are fed until it is there.
mkfifo feed
"$VORNJSONDB" init bar.db t a:int --quiet

# bar COLUMNS prints the first bar on a terminal of that width; log keeps all.
bar() {
    script -qfec "stty cols $1; '$VORNJSONDB' insert bar.db t feed --format jsonl" log >/dev/null </dev/null &
    exec 3>feed
    until grep -q inserting log; do
        printf '{"a": 1}\n' >&3
    done
    exec 3>&-
    wait
    tr '\r' '\n' <log | grep -a inserting | head -n 1 | sed 's/[0-9][0-9,]*/N/g; s/\x1b\[K$/<erase>/'
}
same 'a bar' "$(bar 80)" 'inserting N MB  N records  N/s<erase>'
same 'a narrow bar' "$(bar 12)" 'inserting N<erase>'
same 'the summary' "$(tr -d '\r' <log | grep -a skipped | sed 's/^.*\x1b\[K/<erase>/; s/[0-9][0-9]*/N/')" \
    '<erase>N inserted, 0 replaced, 0 skipped, 0 failed (feed: JSON Lines)'
finish
