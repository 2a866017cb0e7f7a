# The two commands of a fresh Debian 12 machine: `make run` and `make test`.
.PHONY: build run test bench clean

build:
	scripts/setup.sh

run:
	scripts/run.sh

test:
	scripts/test.sh

bench:
	scripts/bench.sh

clean:
	rm -rf build build-rel
