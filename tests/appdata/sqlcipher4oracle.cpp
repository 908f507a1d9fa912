// SPDX-License-Identifier: MIT
// An independent reader and writer of the application database for the tests: SQLCipher 4's own
// amalgamation, never libsqlcipher (the two export the same symbols). `sqlcipher4_oracle FILE SQL...`
// runs each statement in turn and prints the rows, columns joined by "|"; it exits 1 with the engine's
// message at the first statement that fails.
#include "sqlite3.h"

#include <cstdio>

namespace {

int printRow(void*, int columns, char** values, char**) {
  for (int i = 0; i < columns; ++i)
    std::printf("%s%s", i ? "|" : "", values[i] ? values[i] : "");
  std::printf("\n");
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 2) return 2;
  sqlite3* db = nullptr;
  if (sqlite3_open(argv[1], &db) != SQLITE_OK) return 1;
  for (int i = 2; i < argc; ++i) {
    char* error = nullptr;
    if (sqlite3_exec(db, argv[i], printRow, nullptr, &error) != SQLITE_OK) {
      std::fprintf(stderr, "%s\n", error ? error : "failed");
      sqlite3_free(error);
      sqlite3_close(db);
      return 1;
    }
  }
  return sqlite3_close(db) == SQLITE_OK ? 0 : 1;
}
