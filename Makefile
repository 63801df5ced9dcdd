# The front doors. Everything behind them is CMake (CMakePresets.json), CTest and the scripts in tools/. On a
# bare Debian each door installs what it needs and is missing. The words behind ## are what `make help` says.
TOOLS := moriv-image moriv-machine
BENCH_PRESETS := bench bench-win32 bench-win64

.PHONY: all help demo demo-dialog tests-built test check bench fuzz mutate screenshots win32-emulated dist try-dist clean

all: ## the setup program for Windows (32 and 64 bits) and for Linux, and the tools
	@tools/bootstrap build
	@tools/build win32 MorivSetup samples
	@tools/build win64 MorivSetup moriv-image
	@tools/build native MorivSetup $(TOOLS)
	@echo 'make help says what else there is.'

help: ## these lines
	@sed -n 's/^\([a-z0-9-]*\):.*## \(.*\)/\1|\2/p' $(MAKEFILE_LIST) | \
	  while IFS='|' read -r door words; do printf 'make %-16s %s\n' "$$door" "$$words"; done

demo: ## an install and a removal of sample programs on a machine that is a folder; a minute
	@tools/bootstrap demo
	@tools/build win32 samples
	@tools/build native MorivSetup $(TOOLS)
	@tools/demo

demo-dialog: ## the same by the dialog, with a scripted user
	@tools/bootstrap demo
	@tools/build win32 samples
	@tools/build native MorivSetup $(TOOLS)
	@tools/demo-dialog

tests-built:
	@tools/bootstrap test
	@for preset in win32 win64 native; do tools/build --tests $$preset all || exit 1; done

test: tests-built ## every test, natively and under Wine; five minutes the first time
	@tools/test

check: tests-built ## format, lint, sanitizers, imports, sizes, two builds compared
	@tools/bootstrap check
	@tools/check

bench: ## the figures of docs/performance.md; BENCH=quick gives a first look and leaves that page alone
	@tools/bootstrap bench
	@for preset in $(BENCH_PRESETS); do \
	  cmake --preset $$preset --log-level=WARNING >/dev/null && cmake --build --preset $$preset || exit 1; \
	done
	@bench/run_bench.py $(BENCH)

MINUTES := 5
fuzz: ## goes on from the corpus of the fuzz targets, or of one: make fuzz MINUTES=10 TARGET=image
	@tools/bootstrap fuzz
	@tools/fuzz $(MINUTES) $(TARGET)

MUTATE := -n 300
mutate: tests-built ## faults put into src/ one at a time: who notices; MUTATE='-n 50 src/engine' for its options
	@tools/bootstrap check
	@tools/mutate $(MUTATE)

screenshots: all ## every page in five languages, from the real program under Wine, into docs/screenshots/
	@tools/bootstrap pictures
	@tools/build win64 all
	@tools/screenshots

win32-emulated: tests-built ## the 32-bit program in scenarios, in an emulator where the kernel runs no 32-bit code
	@tools/win32-emulated

dist: all ## the release, build/dist/: programs without a package, tools, documents, SHA-256 sums
	@tools/bootstrap dist
	@tools/dist

try-dist: dist ## uses the release as one who has nothing else: in a fresh Debian, and under Wine
	@tools/try-dist

clean: ## takes build/ away
	rm -rf build
