"""What can have become of a host's database, and what is told of it."""

import contextlib
import os
import sqlite3

from support.program import write


def sql(path, statement):
    with contextlib.closing(sqlite3.connect(path, isolation_level=None)) as database:
        database.execute(statement)


# What is done to the file, and what the text says of it.
DAMAGES = {
    "a text": (lambda path: write(path, "#!/bin/sh\nexit 1\n" * 900), "is damaged: file is not a database"),
    "the first half": (lambda path: os.truncate(path, os.path.getsize(path) // 2), "is damaged: "),
    "nothing": (lambda path: os.truncate(path, 0), "is damaged: it is empty"),
    "another program's database": (lambda path: (os.remove(path), sql(path, "CREATE TABLE mine(x)")),
                                   "is not a host database"),
    "no rows": (lambda path: sql(path, "DROP TABLE object"), "no such table"),
    "a newer version": (lambda path: sql(path, "PRAGMA user_version=99"), "belongs to a newer version of this program"),
    "no version": (lambda path: sql(path, "PRAGMA user_version=0"), "is damaged: it has no schema version"),
    "records that are none": (lambda path: sql(path, "UPDATE object SET record = '[]'"), "is damaged: a record is not"),
    "records without keys": (lambda path: sql(path, "UPDATE object SET record = x'0500000000'"), "is damaged: a record has nothing"),
}
