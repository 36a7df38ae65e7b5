#!/usr/bin/env bash
# list, get and count in all formats.
source "$(dirname "$0")/Check.sh"
make_shop

expect 0 '[{"id":-3,"name":"漢字","price":0.5},
 {"id":1,"name":"tea, \"green\"","on":true,"price":5.0,"tags":["a","b"]},
 {"id":2,"name":"","price":0.1}]' '' -- list shop.db product
expect 0 '[]' '' -- list shop.db product id=77
expect 0 'id,name,on,price,tags
-3,漢字,,0.5,
1,"tea, ""green""",true,5.0,"[""a"",""b""]"
2,"",,0.1,' '' -- list shop.db product --format csv
expect 0 $'2\t""\t\t0.1\t' '' -- list shop.db product id=2 --format tsv --no-headers
expect 0 '{"name":"tea, \"green\"","id":1}' '' -- \
    list shop.db product on=true --members name,id --format jsonl
expect 0 '{"id":1,"name":"tea, \"green\"","on":true,"price":5.0,"tags":["a","b"]}
{"id":-3,"name":"漢字","on":null,"price":0.5,"tags":null}' '' -- \
    list shop.db product --format jsonl --nulls keep --sort -price --limit 2
expect 0 '[{"id":1}]' '' -- list shop.db product --sort id --offset 1 --limit 1 --members id
expect 0 'id  name          on    price  tags
--  ------------  ----  -----  ---------
-3  漢字                  0.5
 1  tea, "green"  true    5.0  ["a","b"]
 2                        0.1' '' -- list shop.db product --format table
expect 3 'on' \
    'error: standard output: one column with NULL cannot be written in this format; take --format jsonl, or more members' \
    -- list shop.db product --members on --format csv

expect 0 '{"id":-3,"name":"漢字","price":0.5}' '' -- get shop.db product -3
expect 5 '' 'error: shop.db: table "product" has no record with the key "9"' -- \
    get shop.db product 9

expect 0 3 '' -- count shop.db product
expect 0 2 '' -- count shop.db product --where '{"id": {"$gte": 1}}'
finish
