# The two commands of a fresh Debian 12 machine: `make run` and `make test`.
# `make check` adds what CI runs beside the tests: the layout check and the
# sanitizer build with the fuzz targets. `make check-tidy` runs clang-tidy.
.PHONY: build run test check check-sanitize check-tidy check-format bench clean

build:
	scripts/setup.sh

run:
	scripts/run.sh

test:
	scripts/test.sh

check: check-format check-sanitize

check-sanitize:
	scripts/check-sanitize.sh

check-tidy:
	scripts/check-tidy.sh

check-format:
	scripts/check-format.sh

bench:
	scripts/bench.sh

clean:
	rm -rf build build-rel build-sanitize
