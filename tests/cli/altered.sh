#!/usr/bin/env bash
# Tables that another program altered since their definition was kept, or that need care.
source "$(dirname "$0")/Check.sh"
make_shop

# The columns count, with what is kept of them.
sqlite3 shop.db 'ALTER TABLE product RENAME COLUMN name TO label; ALTER TABLE product DROP COLUMN price;
    ALTER TABLE product ADD COLUMN size INTEGER DEFAULT 5'
expect 0 '{"id":1,"label":"tea, \"green\"","tags":["a","b"],"on":true,"size":5}' '' -- get shop.db product 1
expect 0 '' 'updated 1 record' -- upsert shop.db product id=1 size=6
echo '[{"id": 8, "label": "new", "size": 7}]' >new.json
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (new.json: JSON)' -- insert shop.db product new.json
expect 0 1 '' -- count shop.db product size=7
# lint and sync still compare it with what is kept; sync with the present one keeps that.
"$VORNJSONDB" lint shop.db --format tsv >found
same 'lint' "$(cut -f 3,4 found)" 'code	path
missing-column	/product/member/name
missing-column	/product/member/price
extra-column	/product/member
extra-column	/product/member'
"$VORNJSONDB" schema shop.db product --json >present.def
expect 0 '' 'nothing to do' -- sync shop.db product --def present.def
expect 0 '' 'no findings' -- lint shop.db
# Another table of the same name, without the member of the key.
sqlite3 shop.db 'DROP TABLE product; CREATE TABLE product (code TEXT PRIMARY KEY, x); INSERT INTO product VALUES (7, 8)'
expect 0 '[{"code":"7","x":8}]' '' -- list shop.db product
expect 0 '{"code":"7","x":8}' '' -- get shop.db product 7

# To SQLite a table is the same in any letter case.
make_shop 2>/dev/null
rm shop.db
make_shop
expect 0 '{"id":1,"name":"tea, \"green\"","price":5.0,"tags":["a","b"],"on":true}' '' -- get shop.db PRODUCT 1
echo '{"id": 9, "name": "x", "more": [1]}' >more.json
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (more.json: JSON)' -- \
    insert shop.db Product more.json --add-members
expect 0 '[{"more":[1]}]' '' -- list shop.db product id=9 --members more
same 'one definition is kept' "$(sqlite3 shop.db 'SELECT count(*) FROM vornjsondb_definition')" 1
"$VORNJSONDB" dump shop.db Product >dump
"$VORNJSONDB" dump shop.db product | cmp - dump
same 'dump in another letter case' $? 0

# --dry-run shows what makes the table, or extends the one that is there.
echo '[{"id": 9, "name": "x", "size": 5}]' >size.json
"$VORNJSONDB" insert shop.db product size.json --add-members --dry-run >out
same 'exit of --dry-run' $? 0
same 'what would be added' "$(tail -n 1 out)" 'ALTER TABLE "product" ADD COLUMN "size" INTEGER;'
"$VORNJSONDB" insert shop.db product more.json --add-members --dry-run >out
same 'what needs nothing' "$(tail -n 1 out)" '}'
"$VORNJSONDB" insert shop.db product size.json --add-members --dry-run --json >out
same 'what would be added, in JSON' "$(python3 -c 'import json; print(json.load(open("out"))["alter"])')" \
    "['ALTER TABLE \"product\" ADD COLUMN \"size\" INTEGER']"
expect 2 '' 'error: table "product" has no member "size"; see vornjsondb schema' -- \
    count shop.db product size=5

# One table that cannot be opened does not hide the others from lint.
sqlite3 shop.db 'CREATE TABLE odd ("$x"); CREATE TABLE zoo (a INTEGER)'
echo '{"zoo": {"member": {"a": {"cpptype": "int"}, "b": {"cpptype": "int"}}}}' >zoo.def
sqlite3 shop.db "INSERT INTO vornjsondb_definition VALUES ('zoo', readfile('zoo.def'))"
"$VORNJSONDB" lint shop.db --format tsv >found
same 'exit of lint' $? 3
same 'lint goes on' "$(cut -f 1,3,4 found)" 'table	code	path
odd	bad-name	/odd/member/$x
zoo	missing-column	/zoo/member/b'

# A text that SQLite would store as a number comes back as another value: it is refused.
sqlite3 number.db 'CREATE TABLE t (id INTEGER PRIMARY KEY, code NUMERIC, price DECIMAL(5,2), day DATE, free);
    CREATE TABLE strict (id INTEGER PRIMARY KEY, code ANY, "a/b~c" any) STRICT'
lost() {
    echo "member \"code\": its column would turn the text \"$1\" into a number: give a number, or make the column TEXT"
}
at='cannot load record 1 into table "t": '
remedy='; correct the record where it comes from (nothing is stored)'
for text in 007 5 +5 ' 5 ' .5 5. -5e1 12345678901234567890; do
    echo "[{\"id\": 1, \"code\": \"$text\"}]" >number.json
    expect 3 '' "error: number.json:1: $at$(lost "$text")$remedy" -- insert number.db t number.json
    expect 3 '' "error: $(lost "$text")" -- upsert number.db t "{\"id\": 1, \"code\": \"$text\"}"
done
echo '[{"id": 1, "code": 12345678901234567890}]' >number.json
expect 3 '' "error: number.json:1: $at$(lost 12345678901234567890)$remedy" -- insert number.db t number.json
printf 'id,code,price,day,free\n1,A7,9.50,2020-01-01,007\n2,7,7,1e3,x\n3,0x10,inf,1 2,5e\n4,e5,.,,-\n' >number.csv
expect 3 '' 'error: number.csv:3: cannot load record 2 into table "t": member "day": its column would turn the text "1e3" into a number: give a number, or make the column TEXT; correct the record where it comes from (nothing is stored)' \
    -- insert number.db t number.csv
expect 3 '' '3 inserted, 0 replaced, 0 skipped, 1 failed (number.csv: CSV)' -- \
    insert number.db t number.csv --errors bad.jsonl
expect 0 '{"id":1,"code":"A7","price":9.5,"day":"2020-01-01","free":"007"}
{"id":3,"code":"0x10","price":"inf","day":"1 2","free":"5e"}
{"id":4,"code":"e5","price":".","free":"-"}' '' -- list number.db t --format jsonl
expect 3 '' "error: $(lost 08)" -- update number.db t 1 code=08
expect 0 '' 'updated 1 record' -- update number.db t 1 code=8 day=2021 free:='"08"'
expect 0 '{"id":1,"code":8,"price":9.5,"day":2021,"free":"08"}' '' -- get number.db t 1
# A column of the type ANY keeps all in a STRICT table, and lint knows.
expect 0 '' 'inserted 1 record' -- upsert number.db strict id=1 code=007
expect 0 '{"id":1,"code":"007"}' '' -- get number.db strict 1
expect 0 '' 'no findings' -- lint number.db strict
echo '[{"id": 2, "code": "1e3"}]' >strict.json
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (strict.json: JSON)' -- insert number.db strict strict.json
expect 0 '{"id":2,"code":"1e3"}' '' -- get number.db strict 2

# Nor does a number become another one.
sqlite3 wide.db 'CREATE TABLE t (id INTEGER PRIMARY KEY, free, whole INTEGER, price REAL, text TEXT, json JSON)'
wide='the number 18446744073709551616 has more than 64 bits; write it as a text, in quotes, or as a real number, with .0 at its end'
for member in free whole json; do
    expect 2 '' "error: $member: $wide" -- upsert wide.db t id=1 $member=18446744073709551616
    expect 2 '' "error: $member: $wide" -- count wide.db t $member=18446744073709551616
    expect 2 '' "error: member \"$member\": 18446744073709551615 has more than 63 bits; write it as a text, in quotes" \
        -- upsert wide.db t id=1 $member=18446744073709551615
done
expect 2 '' "error: whole: ${wide/18446744073709551616/-9223372036854775809}" -- \
    upsert wide.db t id=1 whole=-9223372036854775809
expect 2 '' "error: record: $wide" -- upsert wide.db t '{"id": 1, "json": [18446744073709551616]}'
expect 2 '' "error: --where: $wide" -- list wide.db t --where '{"free": {"$in": [1, 18446744073709551616]}}'
expect 2 '' "error: id: $wide" -- get wide.db t 18446744073709551616
expect 2 '' "error: --default \"18446744073709551616\": $wide" -- init wide.db u a:any --default a=18446744073709551616
expect 0 '' 'inserted 1 record' -- upsert wide.db t id=1 free=18446744073709551616.0 \
    price=-100000000000000000000 text=18446744073709551616 'json=[18446744073709551615,"\"18446744073709551616",1.5]'
expect 0 '{"id":1,"free":18446744073709551616.0,"price":-1e+20,"text":"18446744073709551616","json":[18446744073709551615,"\"18446744073709551616",1.5]}' \
    '' -- get wide.db t 1
expect 0 1 '' -- count wide.db t price=-100000000000000000000
expect 0 '' 'updated 1 record' -- update wide.db t 1 free=-1e999
expect 0 1 '' -- count wide.db t free=-1e999
rounded='member "whole": with a point or an exponent a whole number from 2^53 on may be rounded: give its digits alone'
expect 3 '' "error: $rounded" -- update wide.db t 1 whole=9007199254740993.0
echo '{"id": 2, "whole": 9007199254740993.0}' >wide.json
expect 3 '' "error: wide.json:1: $at$rounded$remedy" -- insert wide.db t wide.json
expect 0 '' 'updated 1 record' -- update wide.db t 1 whole=9007199254740991.0
expect 0 '{"whole":9007199254740991}' '' -- get wide.db t 1 --members whole

# A variable that is not set makes neither a database that is gone afterwards nor a table without a name.
for database in '' :memory: file::memory: 'file:new.db?mode=memory'; do
    for words in 'insert more.json' 'list'; do
        expect 2 '' "error: \"$database\" names no file; name the file of a database" -- \
            "${words% *}" "$database" t ${words#"${words% *}"}
    done
done
expect 2 '' 'error: the name of the new table is empty; give it one (nothing is stored)' -- \
    insert shop.db '' more.json
expect 2 '' 'error: the name of the new table is empty; give it one' -- init shop.db '' a:int

# Who holds a database that nobody else can read is what doctor is for.
mkfifo go
(
    echo 'BEGIN EXCLUSIVE; SELECT 1;'
    cat go
) | sqlite3 shop.db >held &
until [[ -s held ]]; do sleep 0.01; done
"$VORNJSONDB" doctor shop.db --wait 10 >out 2>err
same 'exit of doctor' $? 6
same 'who holds it' "$(sed 's/[0-9]\+ (/N (/' out | grep writes)" 'lock   process N (sqlite3) writes, and nobody else may read'
same 'doctor waited' "$(cat err)" \
    'error: shop.db: database is locked (waited 10 ms); try again, or wait longer with --wait MS'
: >go
wait

# A definition that outlived its table governs nothing, is told, and is replaced.
echo '[{"id": 1, "code": "a"}]' >old.json
echo '[{"n": "text"}]' >other.json
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (old.json: JSON)' -- insert gone.db prod old.json --key id
sqlite3 gone.db 'DROP TABLE prod'
left='a definition of table "prod" is kept, but the table is gone'
remedy='it is replaced when the table is made anew; a table that was renamed gets one by vornjsondb sync --def'
expect 0 "table,severity,code,path,message,remedy
prod,warning,left-over,/prod,\"${left//\"/\"\"}\",$remedy" '' -- lint gone.db --format csv
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (other.json: JSON)' -- insert gone.db prod other.json
expect 0 '[{"n":"text"}]' '' -- list gone.db prod
expect 0 '' 'no findings' -- lint gone.db
sqlite3 gone.db 'ALTER TABLE prod RENAME TO p2'
expect 0 "table,severity,code,path,message,remedy
prod,warning,left-over,/prod,\"${left//\"/\"\"}\",$remedy" '' -- lint gone.db --format csv

# A default that its type cannot hold is one of no table.
echo '{"t": {"member": {"a": {"cpptype": "int", "cppDefaultValue": "x"}}}}' >default.def
expect 3 '' 'error: default of table "t": member "a" cannot be "x": expected is a whole number from -2147483648 to 2147483647; give one that the type can hold (nothing is stored)' \
    -- insert default.db t old.json --def default.def

# One that is no JSON is named, with the way out.
expect 0 '' '1 inserted, 0 replaced, 0 skipped, 0 failed (old.json: JSON)' -- insert bad.db t old.json --key id
"$VORNJSONDB" schema bad.db t --json >t.def
for definition in 5 null '{"member": 5}'; do
    echo "{\"t\": $definition}" >odd.def
    for options in '' --dry-run '--add-members --dry-run' '--key id --upsert'; do
        # shellcheck disable=SC2086  # several words
        found=$("$VORNJSONDB" insert bad.db t old.json --def odd.def $options 2>&1)
        same "exit with the definition $definition and $options" $? 3
        same "said with the definition $definition and $options" "${found% (nothing is stored)}" \
            'error: bad.db: the definition of table "t" is no object with an object "member"; give one by --def FILE'
    done
done
sqlite3 bad.db "UPDATE vornjsondb_definition SET definition = '{'"
expect 3 '' 'error: bad.db: the kept definition of "t": Line 1, Column 2: Missing '"'}'"' or object member name; it must be JSON; give one by --def FILE, which vornjsondb sync keeps in its place' \
    -- list bad.db t
expect 0 '' 'nothing to do' -- sync bad.db t --def t.def
expect 0 '[{"id":1,"code":"a"}]' '' -- list bad.db t
finish
