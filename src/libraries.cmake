# Libraries beyond Qt that the subsystems link.
# libcsv (Debian's libcsv-dev, installed by scripts/setup.sh): the RFC 4180
# parser behind the CSV import source.
target_link_libraries(quotas PRIVATE csv)
