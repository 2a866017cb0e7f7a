# The two commands of a fresh Debian 12 machine: `make run` and `make test`.
# `make check` adds what CI runs beside the tests: the layout check, clang-tidy
# (after `make test`, which makes the compile commands) and the sanitizer build
# with the fuzz targets. `make package` builds the Debian package of an
# installation.
.PHONY: build run test check check-sanitize check-tidy check-format bench package clean

build:
	scripts/setup.sh

run:
	scripts/run.sh

test:
	scripts/test.sh

check: check-format check-tidy check-sanitize

check-sanitize:
	scripts/check-sanitize.sh

check-tidy:
	scripts/check-tidy.sh

check-format:
	scripts/check-format.sh

bench:
	scripts/bench.sh

package:
	scripts/setup.sh
	cmake --build build --target package

clean:
	rm -rf build build-rel build-sanitize
