# The front doors. Everything behind them is CMake (CMakePresets.json), CTest and the scripts in
# tools/. On a bare Debian the first of them to run installs what is missing.
PRESETS := native win32 win64
BENCH_PRESETS := bench bench-win32 bench-win64
CMAKE_QUIET := --log-level=WARNING

.PHONY: all demo demo-dialog test check bench fuzz mutate screenshots win32-emulated dist clean \
  bootstrap \
  $(PRESETS)

all: $(PRESETS)

bootstrap:
	@tools/bootstrap

$(PRESETS): bootstrap
	@cmake --preset $@ $(CMAKE_QUIET) >/dev/null
	@cmake --build --preset $@

demo: native win32
	@tools/demo

demo-dialog: native win32
	@tools/demo-dialog

# Unit tests, fault loops and scenarios, natively and under Wine; ends with CTest's own closing line.
test: all
	@tools/bootstrap --wow64
	@tools/test

# What keeps the house in order: tools/check says what it checks.
check: all
	@tools/check

# The figures of docs/performance.md; BENCH=quick gives a first look and leaves that page alone.
bench:
	@tools/bootstrap --bench
	@for preset in $(BENCH_PRESETS); do \
	  cmake --preset $$preset $(CMAKE_QUIET) >/dev/null && cmake --build --preset $$preset || exit 1; \
	done
	@bench/run_bench.py $(BENCH)

# Goes on from the corpus of the fuzz targets, or of one: make fuzz MINUTES=10 TARGET=image
MINUTES := 5
fuzz: bootstrap
	@tools/fuzz $(MINUTES) $(TARGET)

# Small faults in src/, one at a time: which tests notice, and which faults nobody does. The tool's
# options: make mutate MUTATE='-n 50 src/engine'
MUTATE := -n 300
mutate: all
	@tools/mutate $(MUTATE)

# Every page in five languages, from the real program under Wine, into docs/screenshots/.
screenshots: all
	@tools/screenshots

# The 32-bit program in scenarios, in an emulator where the kernel runs no 32-bit code.
win32-emulated: all
	@tools/win32-emulated

# The release folder, build/dist/: programs without a package, tools, documents, SHA-256 sums.
dist: all
	@tools/dist

clean:
	rm -rf build
