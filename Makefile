# The everyday commands. Everything that is made lies under build/.
.DEFAULT_GOAL := help
.PHONY: help run test bench fuzz docs build install format check-format tidy clean

READER = text
SECONDS = 60
PREFIX = /usr/local
BENCH_OPTIONS =

# cmake names the prefix in the files it installs, so it is told while configuring.
RELEASE = build/release/build.ninja
SOURCES = $(shell find src include tests bench fuzz -name '*.cpp' -o -name '*.h' -o -name '*.c')

help:
	@echo 'make run                            convert the example table and show it'
	@echo 'make test                           build and run the tests'
	@echo 'make bench [BENCH_OPTIONS=...]      measure against the peers that are installed'
	@echo 'make fuzz READER=text SECONDS=60    feed a reader with hostile bytes'
	@echo 'make docs                           write docs/formats.md anew'
	@echo 'make build                          build everything in build/release'
	@echo 'make install [PREFIX=/usr/local]    install the command, the library and its header'
	@echo 'make format | check-format | tidy   clang-format in place, as a check; clang-tidy'
	@echo 'make clean                          remove build/'

run: $(RELEASE)
	@cmake --build build/release --target ingester_command
	@tools/run_example.sh build/release/ingester

test: $(RELEASE)
	@cmake --build build/release
	@ctest --test-dir build/release --output-on-failure -j "$$(nproc)"

bench: $(RELEASE)
	@tools/set_up.sh bench
	@cmake --build build/release --target ingester_command make_data time_text time_factor time_dates time_joins
	@python3 bench/run_bench.py --build build/release $(BENCH_OPTIONS)
	@python3 bench/run_stat.py --build build/release

fuzz:
	@tools/fuzz.sh $(READER) $(SECONDS)

docs: $(RELEASE)
	@cmake --build build/release --target ingester_command
	@tools/make_docs.sh build/release/ingester >build/formats.md
	@mv build/formats.md docs/formats.md

build: $(RELEASE)
	@cmake --build build/release

install: $(RELEASE)
	@cmake --preset release -DCMAKE_INSTALL_PREFIX='$(abspath $(PREFIX))'
	@cmake --build build/release --target ingester_library ingester_command
	@cmake --install build/release

format:
	@tools/set_up.sh format
	@clang-format -i $(SOURCES)

check-format:
	@tools/set_up.sh format
	@clang-format --dry-run -Werror $(SOURCES)

tidy:
	@tools/set_up.sh build tidy
	@cmake --preset debug -DCMAKE_EXPORT_COMPILE_COMMANDS=ON
	@find src -name '*.cpp' -print0 | xargs -0 -n 1 -P "$$(nproc)" clang-tidy --quiet -p build/debug

# Packages are looked at each time, which is quick; the build is configured once.
$(RELEASE): CMakePresets.json | packages
	@cmake --preset release
	@touch $@

.PHONY: packages
packages:
	@tools/set_up.sh build

clean:
	@rm -rf build
