#!/usr/bin/env python3
"""Databases that others made: every table is listed, counted, dumped and loaded, and one is updated.

What the command says is compared with what SQLite says by itself.
"""

import base64
import glob
import json
import math
import shutil
import sqlite3
import sys

sys.dont_write_bytecode = True
from Compare import *  # noqa: F403

check = Checks()
SITE = 'usr/lib/python3/dist-packages/'
R = 'usr/lib/R/site-library/'
# File and how many tables it has.
DATABASES = [
    (f'r-cran-rsqlite/{R}RSQLite/db/datasets.sqlite', 42),
    (f'python3-xraydb/{SITE}xraydb/xraydb.sqlite', 13),
    ('birdfont-common/usr/share/birdfont/ucd.sqlite', 2),
    ('birdfont-common/usr/share/birdfont/codepages.sqlite', 1),
    ('libcangjie2-data/usr/share/libcangjie/cangjie.db', 2),
    ('codfis/usr/share/codfis/codfis.db3', 1),
    (f'fail2ban/{SITE}fail2ban/tests/files/database_v1.db', 4),
    (f'fail2ban/{SITE}fail2ban/tests/files/database_v2.db', 4),
    ('brewtarget/usr/share/brewtarget/default_db.sqlite', 40),
    (f'r-cran-sf/{R}sf/gpkg/b_pump.gpkg', 12),
    (f'r-cran-sf/{R}sf/gpkg/buildings.gpkg', 12),
    (f'r-cran-sf/{R}sf/gpkg/nc.gpkg', 13),
    (f'r-cran-sf/{R}sf/gpkg/nospatial.gpkg', 10),
    (f'r-cran-sf/{R}sf/gpkg/tl.gpkg', 13),
    (f'r-cran-sf/{R}sf/sqlite/b.sqlite', 3),
    (f'r-cran-sf/{R}sf/sqlite/meuse.sqlite', 3),
    (f'r-cran-sf/{R}sf/sqlite/nc.sqlite', 3),
    (f'r-cran-sf/{R}sf/sqlite/test3.sqlite', 5),
    (f'python3-mapproxy/{SITE}mapproxy/test/unit/fixture/cache.gpkg', 5),
    (f'python3-mapproxy/{SITE}mapproxy/test/system/fixture/cache.mbtiles', 1),
    ('other-hands.sql', 10),
]

# File: call, what it says, a query and the row that it gives afterwards.
CHANGES = {
    f'r-cran-rsqlite/{R}RSQLite/db/datasets.sqlite': [
        (['update', 'iris', '--where', '{"Sepal.Length": 7.9}', 'Sepal.Length=8.5', "Species=it's 100 %"],
         'updated 1 record', 'SELECT "Sepal.Length", Species FROM iris WHERE "Petal.Length" = 6.4',
         (8.5, "it's 100 %"))],
    f'python3-xraydb/{SITE}xraydb/xraydb.sqlite': [
        (['update', 'elements', '--where', '{"element": "H"}', 'molar_mass=1', 'density:=1e-3'],
         'updated 1 record', "SELECT molar_mass, typeof(molar_mass), density FROM elements "
         "WHERE element = 'H'", (1.0, 'real', 0.001))],
    'libcangjie2-data/usr/share/libcangjie/cangjie.db': [
        (['delete', 'chars', '3'], 'deleted 1 record', 'SELECT count(*) FROM chars', (75248,)),
        (['update', 'chars', '4', 'chchar=𠀀'],
         'error: {db}: cannot update records of table "chars": UNIQUE constraint failed: chars.chchar',
         'SELECT chchar FROM chars WHERE char_index = 4', ('±',))],
    'codfis/usr/share/codfis/codfis.db3': [
        (['update', 'CodFis', '5', "desc_cod=L'AQUILA 50%"], 'updated 1 record',
         'SELECT desc_cod, core_cod FROM CodFis WHERE id_cod = 5', ("L'AQUILA 50%", '030'))],
    f'fail2ban/{SITE}fail2ban/tests/files/database_v2.db': [
        (['update', 'bans', '--where', '{"data.failures": 3}', 'timeofban=7'], 'updated 2 records',
         'SELECT min(timeofban), max(timeofban) FROM bans', (7, 7))],
    'brewtarget/usr/share/brewtarget/default_db.sqlite': [
        (['update', 'equipment', '1', 'deleted=true', 'boil_size=21'], 'updated 1 record',
         'SELECT deleted, typeof(boil_size) FROM equipment WHERE id = 1', (1, 'real'))],
    f'r-cran-sf/{R}sf/gpkg/nc.gpkg': [
        (['update', 'nc.gpkg', '1', 'NAME=x'],
         'error: {db}: cannot update records of table "nc.gpkg": no such function: ST_IsEmpty',
         'SELECT NAME FROM "nc.gpkg" WHERE fid = 1', ('Ashe',)),
        (['update', 'gpkg_contents', 'nc.gpkg', 'description=hm'], 'updated 1 record',
         'SELECT description FROM gpkg_contents', ('hm',))],
    f'python3-mapproxy/{SITE}mapproxy/test/system/fixture/cache.mbtiles': [
        (['update', 'tiles', '--where', '{"zoom_level": 1}', 'tile_row=9'], 'updated 1 record',
         'SELECT tile_row, typeof(tile_data) FROM tiles', (9, 'blob'))],
    'birdfont-common/usr/share/birdfont/ucd.sqlite': [
        (['delete', 'Words', '--where', '{"word": "grave"}'], 'deleted 85 records',
         "SELECT count(*) FROM Words WHERE word = 'grave'", (0,))],
    'other-hands.sql': [
        (['update', 'moz_places', '1', 'hidden:=1'], 'updated 1 record',
         'SELECT hidden, visit_count FROM moz_places WHERE id = 1', (1, 0)),
        (['update', 'message\'s "parts"', '{"order": 1, "group by": "a"}', 'select=2', '= x'],
         'updated 1 record',
         'SELECT "select", "" FROM "message\'s ""parts""" WHERE "order" = 1', (2.0, ' x')),
        (['upsert', 'counted', 'id=901', 'name=new'], 'inserted 1 record',
         'SELECT id, doubled, kept FROM counted ORDER BY id DESC', (901, 'newnew', 3)),
        (['upsert', 'typed', 'id=1', 't=y'], 'updated 1 record', 'SELECT t, r FROM typed WHERE id = 1',
         ('y', 5.0)),
        (['delete', 'empty', '--all', '--yes'], 'deleted 0 records', 'SELECT count(*) FROM empty', (0,))],
}


def Quoted(name):
    return '"' + name.replace('"', '""') + '"'


def Open(path):
    database = sqlite3.connect(path)
    database.text_factory = lambda raw: raw.decode('utf-8', 'surrogateescape')
    return database


def Tables(database):
    """Names, and whether a table can be dumped: a virtual one has no rows of its own."""
    return database.execute(
        "SELECT name, sql NOT LIKE 'CREATE VIRTUAL%' FROM sqlite_master WHERE type = 'table' "
        "AND name NOT LIKE 'sqlite\\_%' ESCAPE '\\' ORDER BY name").fetchall()


def IsJson(text):
    try:
        json.loads(text)
        return True
    except ValueError:
        return False


def IsValue(found, stored, declared):
    """Whether the exported value is what the column stores; found is None for a missing member."""
    if isinstance(stored, bytes):
        return found == {'$base64': ('boolean', True), 'encoded': base64.b64encode(stored).decode()}
    if isinstance(stored, str):
        raw = stored.encode('utf-8', 'surrogateescape')
        if raw.decode('utf-8', 'replace').encode() != raw:
            return found == {'$text': ('boolean', True), 'encoded': base64.b64encode(raw).decode()}
        if declared.upper() == 'JSON' and IsJson(stored):
            return found == Exact(stored)
    if stored in (math.inf, -math.inf):
        return found == {'$real': 'inf' if stored > 0 else '-inf'}
    if stored in (0, 1) and declared.upper() in ('BOOL', 'BOOLEAN'):
        return found == ('boolean', stored == 1)
    return found == stored and isinstance(found, float) == isinstance(stored, float)


def Listed(path, database, table):
    columns = database.execute(f'PRAGMA table_info({Quoted(table)})').fetchall()
    done = Run('list', path, table, '--format', 'jsonl', '--nulls', 'keep')
    check.Same(f'list {path} {table}', (done.code, done.errors), (0, ''))
    stored = database.execute(f'SELECT * FROM {Quoted(table)}').fetchall()
    found = done.records()
    check.Same(f'list {path} {table}: records', len(found), len(stored))
    for number, (record, row) in enumerate(zip(found, stored), 1):
        wrong = [(column[1], column[2], record.get(column[1]), value)
                 for column, value in zip(columns, row)
                 if not IsValue(record.get(column[1]), value, column[2])]
        if wrong or len(record) != len(columns):
            check.Same(f'list {path} {table}: record {number}', wrong, [])
            return


def Contents(database, table):
    """Every value with its storage class, and what was created."""
    columns = [row[1] for row in database.execute(f'PRAGMA table_info({Quoted(table)})')]
    exact = ', '.join(f'typeof({Quoted(name)}), hex({Quoted(name)}), quote({Quoted(name)})'
                      for name in columns)
    return (
        database.execute(f'SELECT {exact} FROM {Quoted(table)}').fetchall(),
        database.execute('SELECT type, name, sql FROM sqlite_master WHERE tbl_name = ? '
                         'AND sql IS NOT NULL ORDER BY 1, 2', (table,)).fetchall())


def Dumped(path, database, table, folder):
    dump = Run('dump', path, table)
    check.Same(f'dump {path} {table}', (dump.code, dump.errors), (0, ''))
    load = Run('load', folder + '/loaded.db', '--quiet', given=dump.out)
    check.Same(f'load {path} {table}', (load.code, load.out, load.errors), (0, b'', ''))
    again = Run('dump', folder + '/loaded.db', table)
    check.Same(f'dump again {path} {table}', again.out == dump.out, True)
    loaded = Open(folder + '/loaded.db')
    found, expected = Contents(loaded, table), Contents(database, table)
    check.Same(f'loaded {path} {table}: rows', len(found[0]), len(expected[0]))
    check.Same(f'loaded {path} {table}: values', found[0] == expected[0], True)
    check.Same(f'loaded {path} {table}: schema', found[1], expected[1])
    loaded.close()


def Whole(path, tables):
    with Folder() as folder:
        copy = folder + '/a.db'
        if path.endswith('.sql'):
            made = sqlite3.connect(copy)
            made.executescript(open(os.path.join(os.path.dirname(__file__), path)).read())
            made.close()
        else:
            shutil.copy(f'{FILES}/{path}', copy)
        database = Open(copy)
        names = Tables(database)
        check.Same(f'{path}: tables', len(names), tables)
        done = Run('tables', copy, '--counts', '--json')
        counts = [{'table': name, 'records': database.execute(
            f'SELECT count(*) FROM {Quoted(name)}').fetchone()[0]} for name, _ in names]
        check.Same(f'tables {path}', json.loads(done.out or b'[]'), counts)
        for each in counts:
            done = Run('count', copy, each['table'])
            check.Same(f'count {path} {each["table"]}', (done.out, done.errors),
                       (f'{each["records"]}\n'.encode(), ''))
        for name, can_be_dumped in names:
            Listed(copy, database, name)
            if can_be_dumped:
                Dumped(copy, database, name, folder)
        lint = Run('lint', copy, '--json')
        check.Same(f'lint {path}', (lint.code in (0, 3), lint.errors), (True, ''))
        database.close()
        for words, message, look, expected in CHANGES.get(path, []):
            done = Run(words[0], copy, *words[1:])
            check.Same(f'{path} {words}', (done.out, done.errors), (b'', message.replace('{db}', copy) + '\n'))
            database = Open(copy)
            check.Same(look, database.execute(look).fetchone(), expected)
            database.close()


for path, tables in DATABASES:
    if sys.argv[1:] and sys.argv[1] not in path:
        continue
    Whole(path, tables)
check.Finish()
