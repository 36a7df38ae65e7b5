#!/usr/bin/env bash
# Wrong command lines, files that are none, locks and outputs that take nothing.
source "$(dirname "$0")/Check.sh"
make_shop

expect 2 '' 'error: unknown subcommand "lst"; did you mean "list"?' -- lst shop.db
expect 2 '' 'error: unknown option "--limt" of list; did you mean "--limit"?' -- \
    list shop.db product --limt 5
expect 2 '' 'error: list lacks TABLE; usage: vornjsondb list DB TABLE [member=value]...' -- list shop.db
expect 2 '' 'error: --limit: "x" is no whole number; give one from 0' -- \
    list shop.db product --limit x
expect 2 '' 'error: --format: unknown value "xml"; it is one of json|jsonl|csv|tsv|table' -- \
    list shop.db product --format xml
expect 2 '' 'error: table "product" has no member "nmae"; did you mean "name"?' -- \
    count shop.db product nmae=x
expect 2 '' 'error: "[1,2]" sets no member; write member=value' -- list shop.db product '[1,2]'
expect 5 '' 'error: shop.db: there is no table "produkt"; did you mean "product"?' -- \
    list shop.db produkt
expect 7 '' 'error: none.db: No such file or directory; check the name, or make it with init or insert' \
    -- list none.db product
same 'a missing file stays missing' "$(ls none.db 2>&1)" \
    "ls: cannot access 'none.db': No such file or directory"
printf 'This is a text and no database, long enough to have a header of its own, as it were....%100s' ' ' >text
expect 7 '' 'error: text: file is not a database; name an SQLite database first' -- list text product

"$VORNJSONDB" list shop.db product >/dev/full 2>err
same 'exit with a full output' $? 7
same 'error with a full output' "$(cat err)" \
    'error: standard output: cannot write: No space left on device; what was written so far is not all'
"$VORNJSONDB" list shop.db product 2>err | true
same 'a closed pipe is quiet' "$(cat err)" ''

mkfifo go
(echo 'BEGIN EXCLUSIVE; SELECT 1;'; cat go) | sqlite3 shop.db >held &
until [[ -s held ]]; do sleep 0.05; done
expect 6 '' 'error: shop.db: database is locked (waited 10 ms); try again, or wait longer with --wait MS' \
    -- list shop.db product --wait 10
: >go
wait
finish
