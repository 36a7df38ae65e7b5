#!/usr/bin/env bash
# Every subcommand at work on a real file, step by step.
source "$(dirname "$0")/../Check.sh"
ln -s "$VORNJSONDB_REAL_FILES/iso-codes/usr/share/iso-codes/json/iso_3166-1.json" countries.json
ln -s "$VORNJSONDB_REAL_FILES/ieee-data/usr/share/ieee-data/oui.csv" oui.csv

create='CREATE TABLE "country" ("alpha_2" TEXT, "alpha_3" TEXT NOT NULL, "flag" TEXT, "name" TEXT, "numeric" TEXT, "official_name" TEXT, "common_name" TEXT, PRIMARY KEY ("alpha_3"))'
"$VORNJSONDB" insert iso.db country countries.json --key alpha_3 --dry-run >out
same 'a dry run ends with the statement' "$(tail -n 1 out)" "${create/TABLE/TABLE IF NOT EXISTS};"
same 'a dry run makes nothing' "$(ls iso.db 2>/dev/null)" ''
expect 0 '' '249 inserted, 0 replaced, 0 skipped, 0 failed (countries.json: JSON, the list "3166-1")' -- \
    insert iso.db country countries.json --key alpha_3
expect 4 '' 'error: countries.json:3: cannot load record 1 into table "country": UNIQUE constraint failed: country.alpha_3 (alpha_3 = "ABW"); --skip, --replace or --upsert tells what to do with it (nothing is stored)' \
    -- insert iso.db country countries.json
expect 0 '{"failed":0,"inserted":0,"replaced":0,"skipped":249}' '' -- \
    insert iso.db country countries.json --skip --json
expect 0 '[{"table":"country","records":249}]' '' -- tables iso.db --counts --json
expect 0 "$create;" '' -- schema iso.db country
expect 0 '{"alpha_2":"FR","alpha_3":"FRA","flag":"🇫🇷","name":"France","numeric":"250","official_name":"French Republic"}' \
    '' -- get iso.db country FRA
expect 0 32 '' -- count iso.db country --where '{"name": {"$prefix": "S"}}'
expect 0 'alpha_2,alpha_3,flag,name,numeric,official_name,common_name
AX,ALA,🇦🇽,Åland Islands,248,,' '' -- list iso.db country --where '{"name": {"$like": "Å%"}}' --format csv
expect 0 '' 'updated 1 record' -- update iso.db country FRA "common_name=l'Hexagone 100 %" official_name:=null
expect 0 '{"alpha_3":"FRA","common_name":"l'\''Hexagone 100 %","name":"France"}' '' -- \
    get iso.db country FRA --members alpha_3,common_name,name,official_name
expect 0 '' 'updated 1 record' -- upsert iso.db country alpha_3=FRA name=Gaule
expect 0 '' 'inserted 1 record' -- upsert iso.db country '{"alpha_3": "XXX", "name": "Nowhere"}'
expect 0 '' 'deleted 2 records' -- delete iso.db country XXX ABW
"$VORNJSONDB" index iso.db country alpha_2 --quiet >out
same 'an index is made' $? 0
expect 0 'index                       unique  members
--------------------------  ------  -------
country_alpha_2             false   alpha_2
sqlite_autoindex_country_1  true    alpha_3' '' -- index iso.db country
"$VORNJSONDB" explain iso.db country alpha_2=FR >out
same 'the index is used' "$(sed -n 2p out)" '  SEARCH country USING INDEX country_alpha_2 (alpha_2=?)'
expect 0 '' 'no findings' -- lint iso.db
expect 0 '' 'nothing to do' -- sync iso.db country
expect 0 '[{"check":"integrity","result":"ok"},
 {"check":"foreign keys","result":"ok"},
 {"check":"journal mode","result":"delete"},
 {"check":"encoding","result":"UTF-8"},
 {"check":"pages","result":"10"},
 {"check":"free pages","result":"0"}]' '' -- doctor iso.db --json
"$VORNJSONDB" schema iso.db country --json >country.def
expect 0 '' 'created table "country"' -- init same.db country --def country.def
# A definition knows no order: its columns are made in that of their names.
create=${create/, \"common_name\" TEXT/}
expect 0 "${create/\"flag\"/\"common_name\" TEXT, \"flag\"};" '' -- schema same.db country
"$VORNJSONDB" dump iso.db country >country.dump
expect 0 '' 'loaded 248 rows into table "country"' -- load loaded.db country.dump
"$VORNJSONDB" dump loaded.db country | cmp - country.dump
same 'dumped again' "${PIPESTATUS[*]}" '0 0'
expect 4 '' 'error: loaded.db: there is a table "country" already; load into another database' -- \
    load loaded.db country.dump
head -n -1 country.dump >cut.dump
expect 3 '' 'error: cut.dump:250: the end is missing; dump the table again' -- load cut.db cut.dump
sed '5s/Islands/islands/' country.dump >changed.dump
expect 3 '' 'error: changed.dump:250: count or checksum differ from what is above; dump the table again' -- \
    load changed.db changed.dump
same 'nothing is loaded' "$(sqlite3 cut.db .tables; sqlite3 changed.db .tables)" ''

# The registry of addresses has keys that come twice.
expect 4 '' 'error: oui.csv:24675: cannot load record 24663 into table "oui": UNIQUE constraint failed: oui.Assignment (Assignment = "080030"); --skip, --replace or --upsert tells what to do with it (nothing is stored)' \
    -- insert oui.db oui oui.csv --key Assignment
expect 0 '' '32527 inserted, 0 replaced, 3 skipped, 0 failed (oui.csv: CSV)' -- \
    insert oui.db oui oui.csv --key Assignment --skip
expect 0 '' '0 inserted, 32530 replaced, 0 skipped, 0 failed (oui.csv: CSV)' -- \
    insert oui.db oui oui.csv --replace
expect 0 '{"Assignment":"0001C8","Organization Address":"     "}' '' -- \
    get oui.db oui 0001C8 --members 'Assignment,Organization Address'

# The completion script asks the database for its tables.
mkdir bin && ln -s "$VORNJSONDB" bin/vornjsondb
"$VORNJSONDB" completion bash >completion
same 'tables are completed' "$(PATH=$PWD/bin:$PATH bash -c '
    source ./completion
    COMP_WORDS=(vornjsondb list iso.db c) COMP_CWORD=3
    _vornjsondb
    echo "${COMPREPLY[*]}"')" country
finish
