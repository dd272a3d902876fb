# Build, test and run the Tcl binding of the task interfaces.
#   make build   configure and build into build/ (libraries and pkgIndex.tcl in build/lib)
#   make test    build and run every test, then again under AddressSanitizer and UBSan
#   make demo    build and run the tour of the reference tool on the sample design
#   make docs    build and write docs/commands.md, the command reference, running its examples
#   make install   install under PREFIX (/usr/local), below DESTDIR when given; make uninstall
#   make bench   build in Release into build-bench/ and measure one call against native, SWIG and Tcl,
#                then the tool on designs of 5,000 to 100,000 cells (bench/scale.tcl)
#   make bench-icount  the same cases in instructions per call, counted under valgrind's callgrind
#   make fuzz    seeded random command lines under the sanitizers, in build-fuzz/ (not part of make test)
#   make memcheck  the Tcl tests under valgrind's memcheck against build/ (not part of make test)
#   make clean   remove the build folders

BUILD      ?= build
SAN_BUILD  ?= build-san
JOBS       ?= 2
PACKAGES   := cmake g++ make tcl8.6 tcl8.6-dev tcl-thread libgtest-dev nlohmann-json3-dev libedit-dev expect \
              binutils pkg-config yosys tk8.6 xvfb xauth libfreetype-dev libfontconfig-dev fonts-dejavu-core
CMAKE_ARGS ?=

.PHONY: deps build build-sanitize test test-plain test-sanitize clean demo

deps:
	@missing=""; for p in $(PACKAGES); do \
	  dpkg-query -W -f='$${Status}' $$p 2>/dev/null | grep -q 'install ok installed' || missing="$$missing $$p"; \
	done; \
	if [ -n "$$missing" ]; then \
	  echo "installing:$$missing"; \
	  apt-get update && DEBIAN_FRONTEND=noninteractive apt-get install -y $$missing; \
	fi

build: deps
	cmake -S . -B $(BUILD) $(CMAKE_ARGS)
	cmake --build $(BUILD) -j $(JOBS)

test-plain: build
	ctest --test-dir $(BUILD) --output-on-failure -j $(JOBS)

build-sanitize: deps
	cmake -S . -B $(SAN_BUILD) -DKELMAR_SANITIZE=ON -DCMAKE_BUILD_TYPE=Debug $(CMAKE_ARGS)
	cmake --build $(SAN_BUILD) -j $(JOBS)

test-sanitize: build-sanitize
	ctest --test-dir $(SAN_BUILD) --output-on-failure -j $(JOBS)

test: test-plain test-sanitize

demo: build
	$(BUILD)/bin/kelmarsh -project examples/designs/counter.json examples/tour.tcl

# The command reference is made from the command tables, the package, the tool's help and
# docs/reference/entries.tcl; tests/tcl/reference.test fails when the checked-in one differs.
.PHONY: docs
docs: build
	tclsh8.6 docs/reference/generate.tcl $(BUILD)/lib docs/commands.md

# The install is placed relative to PREFIX (see cmake/install.cmake); uninstall removes what the
# last install listed in $(BUILD)/install_manifest.txt, below the same DESTDIR.
PREFIX  ?= /usr/local
DESTDIR ?=

.PHONY: install uninstall

install: build
	DESTDIR="$(DESTDIR)" cmake --install $(BUILD) --prefix "$(PREFIX)"

uninstall:
	DESTDIR="$(DESTDIR)" cmake -P $(BUILD)/uninstall.cmake

# The benchmark has its own Release build folder and its own packages: swig makes the
# generated-binding baseline, valgrind counts the instructions of bench-icount. The figures land in
# $(BENCH_BUILD)/bench.json, scale.json and bench-icount.json, copied to $(BUILD)/.
BENCH_BUILD    ?= build-bench
BENCH_PACKAGES := swig
ICOUNT_PACKAGES := valgrind

BENCH_CONFIGURE = cmake -S . -B $(BENCH_BUILD) -DCMAKE_BUILD_TYPE=Release -DKELMAR_BENCH=ON $(CMAKE_ARGS)

.PHONY: bench bench-deps bench-icount

bench-deps: deps
	@$(MAKE) --no-print-directory deps PACKAGES="$(BENCH_PACKAGES)"

bench: bench-deps
	$(BENCH_CONFIGURE)
	cmake --build $(BENCH_BUILD) -j $(JOBS) --target run_bench
	mkdir -p $(BUILD) && cp $(BENCH_BUILD)/bench.json $(BUILD)/bench.json
	cmake --build $(BENCH_BUILD) -j $(JOBS) --target run_scale
	cp $(BENCH_BUILD)/scale.json $(BUILD)/scale.json

# Valgrind goes in before the build is configured: the native extension finds its header then.
bench-icount: bench-deps
	@$(MAKE) --no-print-directory deps PACKAGES="$(ICOUNT_PACKAGES)"
	$(BENCH_CONFIGURE)
	cmake --build $(BENCH_BUILD) -j $(JOBS) --target run_bench_icount
	mkdir -p $(BUILD) && cp $(BENCH_BUILD)/bench-icount.json $(BUILD)/bench-icount.json

# The fuzzer runs FUZZ_LINES lines in batches of FUZZ_BATCH, one process and seed each, from
# FUZZ_SEED on; FUZZ_WITHOUT names classes of lines to leave out (see tests/fuzz/lines.tcl).
# A failure prints the make command that replays its batch.
FUZZ_LINES   ?= 1000000
FUZZ_SEED    ?= 1
FUZZ_BATCH   ?= 5000
FUZZ_TIMEOUT ?= 600
FUZZ_WITHOUT ?=

# Its build has the sanitizers of build-san/ on optimised code, which runs twice the lines a second.
FUZZ_BUILD   ?= build-fuzz

.PHONY: fuzz build-fuzz

build-fuzz: deps
	cmake -S . -B $(FUZZ_BUILD) -DKELMAR_SANITIZE=ON -DCMAKE_BUILD_TYPE=RelWithDebInfo $(CMAKE_ARGS)
	cmake --build $(FUZZ_BUILD) -j $(JOBS)

fuzz: build-fuzz
	tests/fuzz/run.sh $(FUZZ_BUILD) $(FUZZ_LINES) $(FUZZ_SEED) $(FUZZ_BATCH) $(FUZZ_TIMEOUT) '$(FUZZ_WITHOUT)'

# Every Tcl test file under valgrind's memcheck, against the plain build; valgrind is installed like
# the other packages when missing.
MEMCHECK_PACKAGES := valgrind

.PHONY: memcheck memcheck-deps

memcheck-deps: deps
	@$(MAKE) --no-print-directory deps PACKAGES="$(MEMCHECK_PACKAGES)"

memcheck: build memcheck-deps
	tests/memcheck.sh $(BUILD)

clean:
	rm -rf $(BUILD) $(SAN_BUILD) $(BENCH_BUILD) $(FUZZ_BUILD)
