#!/usr/bin/env bash
# Wrong command lines, files that are none, locks and outputs that take nothing.
source "$(dirname "$0")/Check.sh"
make_shop

expect 2 '' 'error: unknown subcommand "lst"; did you mean "list"?' -- lst shop.db
expect 2 '' 'error: unknown option "--limt" of list; did you mean "--limit"?' -- \
    list shop.db product --limt 5
sqlite3 shop.db 'CREATE TABLE heap (a TEXT PRIMARY KEY)'
expect 2 '' 'error: unknown option "-x" of get; see vornjsondb get --help, and put -- before words that begin with a dash' \
    -- get shop.db product -x
expect 5 '' 'error: shop.db: table "heap" has no record with the key "-x"' -- get shop.db heap -- -x
expect 2 '' 'error: list lacks TABLE; usage: vornjsondb list DB TABLE [member=value]...' -- list shop.db
expect 2 '' 'error: --limit: "x" is no whole number; give one from 0' -- \
    list shop.db product --limit x
expect 2 '' 'error: --format: unknown value "xml"; it is one of json|jsonl|csv|tsv|table' -- \
    list shop.db product --format xml
expect 2 '' 'error: table "product" has no member "nmae"; did you mean "name"?' -- \
    count shop.db product nmae=x
expect 2 '' 'error: "[1,2]" is not of the form member=value' -- list shop.db product '[1,2]'
expect 2 '' 'error: "price>1" is not of the form member=value; write --where '"'{\"price\": {\"\$gt\": 1}}'" -- \
    list shop.db product 'price>1'
expect 2 '' 'error: "name!=tea" is not of the form member=value; write --where '"'{\"name\": {\"\$ne\": \"tea\"}}'" -- \
    count shop.db product 'name!=tea'
expect 2 '' 'error: "tags[0]<=b" is not of the form member=value; write --where '"'{\"tags[0]\": {\"\$lte\": \"b\"}}'" -- \
    count shop.db product 'tags[0]<=b'
expect 0 0 '' -- count shop.db product 'tags[0]=a>b'
expect 2 '' 'error: "name" is not of the form member=value; write what the member is: name=VALUE' -- \
    list shop.db product name
sqlite3 shop.db 'CREATE TABLE e ("" INT)'
expect 2 '' 'error: "" is not of the form member=value; write what the member is: =VALUE' -- list shop.db e ''
expect 2 '' 'error: member "name" is set twice; set it once' -- update shop.db product 1 name=a name=b
expect 2 '' 'error: member "id" is set twice; set it once' -- upsert shop.db product id=1 id:=2
expect 2 '' 'error: --limit is given more than once; give it once' -- list shop.db product --limit 1 -l 2
expect 0 '[{"id":1,"name":"tea, \"green\""}]' '' -- \
    list shop.db product --members id --members name --sort name,id --sort -price --limit 1 --offset 1
expect 2 '' 'error: --where: "size=5" is no JSON object; write {"size": 5}, or size=5 without --where' -- \
    list shop.db product --where size=5
expect 2 '' 'error: --where: Line 1, Column 8: Missing '"','"' or '"'}'"' in object declaration; it must be JSON' \
    -- list shop.db product --where '{"id":5'
expect 2 '' 'error: tags: Line 1, Column 2: Syntax error: value, object or array expected.; it must be JSON' -- \
    update shop.db product 1 tags=[
expect 2 '' 'error: record: Line 1, Column 2: Missing '"'}'"' or object member name; it must be JSON' -- \
    upsert shop.db product '{'
expect 5 '' 'error: shop.db: there is no table "produkt"; did you mean "product"?' -- \
    list shop.db produkt
expect 7 '' 'error: none.db: No such file or directory; check the name, or make it with init or insert' \
    -- list none.db product
same 'a missing file stays missing' "$(ls none.db 2>&1)" \
    "ls: cannot access 'none.db': No such file or directory"
printf 'This is a text and no database, long enough to have a header of its own, as it were....%100s' ' ' >text
expect 7 '' 'error: text: file is not a database; name an SQLite database first' -- list text product

expect 2 '' 'error: unknown option "--form" of list; did you mean "--format"?' -- list shop.db product --form csv
expect 2 '' 'error: there is no subcommand, and no option "--list"; see vornjsondb --help' -- --list
expect 2 '' 'error: there is no subcommand; see vornjsondb --help' -- --json
same 'other options beside --version' "$("$VORNJSONDB" --json --version)" "$("$VORNJSONDB" --version)"
same 'other options beside --help' "$("$VORNJSONDB" --quiet -h)" "$("$VORNJSONDB" --help)"
expect 2 '' 'error: unknown option "-x.jsonl" of insert; see vornjsondb insert --help, and put -- before words that begin with a dash' \
    -- insert shop.db product -x.jsonl
expect 5 '' 'error: shop.db: table "heap" has no record with the key "\x01[a]"' -- get shop.db heap $'\001[a]'
expect 2 '' 'error: --members: "id" is there twice; name it once' -- list shop.db product --members id,name,id
expect 2 '' 'error: --members: "id" is there twice; name it once' -- get shop.db product 1 --members id --members id
expect 2 '' 'error: "Vornjsondb_definition": definitions are kept there; take another name' -- \
    init new.db Vornjsondb_definition a:int
expect 2 '' 'error: --sql lacks its value; see vornjsondb explain --help' -- explain shop.db product --sql
expect 0 '[{"id":1,"price":5.0}]' '' -- list shop.db product id=1 --members 'id, price' --sort 'id, -price'
expect 2 '' 'error: --sort: no member "price desc"; write -price' -- list shop.db product --sort 'price desc'
expect 2 '' 'error: --sort: no member "price ASC"; write price' -- list shop.db product --sort 'id,price ASC'
expect 2 '' 'error: "sqlite_x": names that begin with sqlite_ are SQLite'"'"'s own; take another' -- init shop.db sqlite_x a:int
# Neither what turns the direction of a line nor bytes that are no text reach the terminal.
expect 2 '' 'error: table "product" has no member "s\xe2\x80\xae"; see vornjsondb schema' -- \
    list shop.db product $'s\xe2\x80\xae=1'
expect 5 '' 'error: shop.db: table "heap" has no record with the key "\xff漢\x1b\xc2\x9b"' -- \
    get shop.db heap $'\xff漢\x1b\xc2\x9b'
# The file is named as it was typed, by SQLite's own errors, too.
sqlite3 -cmd '.dbconfig defensive off' module.db "PRAGMA writable_schema = 1;
    INSERT INTO sqlite_master VALUES ('table', 'v', 'v', 0, 'CREATE VIRTUAL TABLE v USING unheard')" >out
expect 1 '' 'error: module.db: no such module: unheard' -- tables module.db --counts

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
"$VORNJSONDB" insert shop.db product /dev/null --wait 600000 2>err &
pid=$!
until_handles_interrupt "$pid"
kill -INT "$pid"
wait "$pid"
same 'exit after Ctrl-C while nobody may read' $? 130
same 'Ctrl-C while nobody may read' "$(cat err)" 'error: interrupted (nothing is stored)'
: >go
wait
rm go
mkfifo go
(echo 'BEGIN IMMEDIATE; SELECT 1;'; cat go) | sqlite3 shop.db >held_again &
until [[ -s held_again ]]; do sleep 0.05; done
expect 6 '' 'error: shop.db: cannot begin a transaction: database is locked (waited 10 ms); try again, or wait longer with --wait MS' \
    -- delete shop.db product 1 --wait 10
: >go
wait

# What a finding advises is a call of the library; here it is what to type.
refused='error: shop.db: cannot read records of table "product": '
expect 2 '' "$refused"'there is no operator "$foo" (did you mean "$or"?); see vornjsondb list --help' -- \
    list shop.db product --where '{"id": {"$foo": 1}}'
expect 2 '' "$refused"'"$contains" is not for member "name" of type "string"; $like and $prefix are for texts, $contains is for lists' \
    -- list shop.db product --where '{"name": {"$contains": "e"}}'
expect 2 '' "$refused"'table "product" has no member "size"; correct the name, or add the member by insert --add-members' \
    -- list shop.db product --sort size
expect 3 '' 'error: shop.db: cannot make a statement for table "shelf": member "a" has the unknown type "txt"; see vornjsondb init --help' \
    -- init shop.db shelf a:txt
expect 2 '' 'error: shop.db: cannot remove records from table "product": the query has no condition and would reach every record; give a condition; delete --all removes all records' \
    -- delete shop.db product --where '{}'

expect 2 '' "$refused"'"tags[0]" is a path; name members of the table, parted by commas' -- \
    list shop.db product --members 'tags[0]'
expect 2 '' "$refused"'pattern "50\x" has a \ before something else than %, _ and \; put \ before a %, _ or \ that stands for itself' \
    -- list shop.db product --where '{"name": {"$like": "50\\x"}}'
sqlite3 shop.db 'CREATE TABLE dollar ("$x", a); INSERT INTO dollar VALUES (1, 2); CREATE TABLE amount (a NUMERIC)'
expect 3 '' 'error: shop.db: cannot open table "dollar": "$x" cannot be a member: it begins with $ or holds a NUL byte; rename it, or give a definition without it by --def' \
    -- list shop.db dollar
echo '{"dollar": {"member": {"a": {"cpptype": "int"}}}}' >dollar.def
expect 0 '[{"a":2}]' '' -- list shop.db dollar --def dollar.def
"$VORNJSONDB" lint shop.db amount --format tsv >found
same 'lint of a numeric column' "$(tail -n 1 found | cut -f 3,6)" \
    $'other-affinity\tgive the member a type that fits its column, or copy the rows into a new table'
expect 3 '' 'error: standard input:1: it is empty; dump the table again' -- load shop.db

"$VORNJSONDB" init shop.db price product:int country:string --key product,country --quiet
expect 2 '' 'error: key "{"product": 1}": it must be an object with just these members: product, country' -- \
    get shop.db price '{"product": 1}'
expect 2 '' 'error: key "x": it must be an object with just these members: product, country' -- \
    get shop.db price x
sqlite3 shop.db 'DROP TABLE heap; CREATE TABLE heap (a)'
expect 2 '' 'error: table "heap" has no key; select by --where, which list, update and delete have' -- get shop.db heap 1
expect 3 '' 'error: shop.db: cannot save a record in table "heap": the table has no key that tells records apart; name the key in a definition, given by --def; or insert --key MEMBER' \
    -- upsert shop.db heap a=1
echo '[{"ID": 9, "size": 3}]' >near.json
expect 3 '' 'error: near.json:1: the table has no member "ID"; did you mean "id"? or add it by --add-members (nothing is stored)' \
    -- insert shop.db product near.json
expect 2 '' 'error: --delimiter: it must be one ASCII character, and no quote or newline; for tabs there is --format tsv' \
    -- insert shop.db product near.json --delimiter '\t'

# A table may demand that a bad record undoes all: then there is nothing to go on with.
sqlite3 shop.db 'CREATE TABLE undone (a INTEGER UNIQUE ON CONFLICT ROLLBACK)'
printf '{"a": %s}\n' 1 '"x"' 1 2 3 >undone.json
expect 4 '' 'error: undone.json:3: cannot load record 3 into table "undone": UNIQUE constraint failed: undone.a (a = 1); the transaction is undone; --skip, --replace or --upsert tells what to do with it (nothing is stored)' \
    -- insert shop.db undone undone.json --errors bad --format jsonl
same 'bad records' "$(grep -c . bad)" 1
expect 0 0 '' -- count shop.db undone

# What a message quotes does not steer the terminal.
expect 5 '' 'error: shop.db: there is no table "a\x1b[31m\xc2\x9b0m b"; see vornjsondb tables' -- \
    list shop.db $'a\e[31m\u009b0m\nb'
echo '[{"id": 9, "name": "x"}]' >$'a\e[31m.json'
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (a\x1b[31m.json: JSON)' -- \
    insert shop.db product $'a\e[31m.json'
finish
