# Libraries beyond Qt that the subsystems link.
# libcsv (Debian's libcsv-dev, installed by scripts/setup.sh): the RFC 4180
# parser behind the CSV import source.
target_link_libraries(quotas PRIVATE csv)
# libpq (libpq-dev): the server's COPY, which Qt's PostgreSQL driver does not
# offer, on the driver's own connection handle.
find_path(LIBPQ_INCLUDE_DIR libpq-fe.h PATH_SUFFIXES postgresql REQUIRED)
find_library(LIBPQ_LIBRARY pq REQUIRED)
target_include_directories(quotas PRIVATE ${LIBPQ_INCLUDE_DIR})
target_link_libraries(quotas PRIVATE ${LIBPQ_LIBRARY})
# SQLite's own library (libsqlite3-dev): the Portuguese collation is
# registered on the connection Qt's driver opened.
find_package(SQLite3 REQUIRED)
target_link_libraries(quotas PRIVATE SQLite::SQLite3)
