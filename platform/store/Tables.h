/// The tables of a host's database, and the forms that they had in earlier versions of this program.
#pragma once

#pragma GCC visibility push(default)

namespace store {

class Store;

/// The tables of a new database.
void CreateTables(Store& store);

/// False for a database that UpdateTables would bring up to date. An Error where it is not a host's, of a
/// newer version, or of none.
bool CheckVersion(Store& store);

/// Brings the database up to date, whole or not at all. An Error where it is not a host's, of a newer
/// version, or damaged.
void UpdateTables(Store& store);

}  // namespace store

#pragma GCC visibility pop
