# One command for each thing that one does with the project: `make` alone lists them.
SHELL := /bin/bash
.SHELLFLAGS := -eu -o pipefail -c
.DEFAULT_GOAL := help
MAKEFLAGS += --no-print-directory

JOBS ?= $(shell nproc)
export CTEST_PARALLEL_LEVEL ?= $(JOBS)
say = @printf '\n== %s\n'

.PHONY: help packages build demo test test-server test-long mutate sanitize bench fuzz docs package options format lint clean

help:  ## List the targets
	@grep -hE '^[a-z-]+:.*##' $(MAKEFILE_LIST) | sed -E 's/:.*## /\t/' | expand -t 12

packages:
	@tools/install-packages.sh

build: packages  ## Build the library, the console and the tests (build/release)
	$(say) 'Building (build/release)'
	@cmake --preset release -DQVSA_TESTS=ON --log-level=NOTICE
	@cmake --build --preset release -j $(JOBS)

demo:  ## Make an installation, fill it with an organisation, walk the road of a sign-on
	@tools/install-packages.sh demo
	$(say) 'Building the demonstration (build/release)'
	@cmake --preset release -DQVSA_TESTS=OFF --log-level=NOTICE
	@cmake --build --preset release -j $(JOBS) --target qvsa_console sign_on_road registration_road \
	  log_and_classes organisation_walk made_up_organisation
	@tools/demo.sh

test: build  ## Build and run all tests, then the quick ones once more under the sanitizers
	$(say) 'Testing'
	@red=0; ctest --preset release || red=1; \
	  $(MAKE) sanitize BUILD='--target quick_tests' TESTS='-LE slow' || red=1; \
	  exit $$red

test-server: packages  ## Test against a SQL Server: SERVER=host,port, the password of its sa in QVSA_TEST_PASSWORD
	@: "$${QVSA_TEST_PASSWORD:?the password of sa is wanted there}" '$(if $(SERVER),,$(error SERVER=host,port is wanted))'
	@cmake --preset release -DQVSA_TESTS=ON --log-level=NOTICE
	@cmake --build --preset release -j $(JOBS) --target server_tests
	$(say) 'Testing against $(SERVER)'
	@QVSA_TEST_SERVER='$(SERVER)' ctest --preset release -L server -j 1

test-long: build  ## Run every allocation of the operations out of memory, and not a sample of them
	$(say) 'Testing want of memory'
	@seq 0 $$(( $(JOBS) - 1 )) | xargs -P $(JOBS) -I{} env QVSA_ALLOCATIONS=all GTEST_TOTAL_SHARDS=$(JOBS) \
	  GTEST_SHARD_INDEX={} build/release/tests/memory/memory_tests --gtest_brief=1

mutate: packages  ## Put small faults into a copy of the sources, and look whether the tests notice
	$(say) 'Putting faults into the sources (build/mutate)'
	@tools/mutate.py $(ONLY)

sanitize: packages  ## Run all tests under the address and undefined behaviour sanitizers (build/sanitize)
	$(say) 'Building with the sanitizers (build/sanitize)'
	@cmake --preset sanitize --log-level=NOTICE
	@cmake --build --preset sanitize -j $(JOBS) $(BUILD)
	$(say) 'Testing with the sanitizers'
	@ctest --preset sanitize $(TESTS)

bench: packages  ## Run the benchmarks, each operation beside its floor, and Python (build/bench)
	$(say) 'Building the benchmarks (build/bench)'
	@cmake --preset bench --log-level=NOTICE
	@cmake --build --preset bench -j $(JOBS)
	@for program in $$(find build/bench/bench -maxdepth 1 -type f -executable | sort); do \
	  printf '\n== %s\n' "$$program"; "$$program"; done
	$(say) 'bench/python_binding.py'
	@QVSA_LIBRARY=build/bench/packaging/libqvsa.so PYTHONPATH=bindings/python python3 bench/python_binding.py

fuzz:  ## Fuzz statements of T-SQL up to SQLite, and the C interface, a minute each (build/fuzz)
	@tools/install-packages.sh fuzz
	$(say) 'Building the fuzz targets (build/fuzz)'
	@cmake --preset fuzz --log-level=NOTICE
	@cmake --build --preset fuzz -j $(JOBS) --target fuzzers
	@mkdir -p build/fuzz/calls
	@test -d build/fuzz/corpus || { mkdir build/fuzz/corpus; split -l 1 -a 3 tests/tsql/statements.txt build/fuzz/corpus/; }
	@build/fuzz/tests/fuzz/statement_fuzz -max_total_time=60 -dict=tests/fuzz/tsql.dict build/fuzz/corpus
	@build/fuzz/tests/fuzz/call_sequence_fuzz -max_total_time=60 build/fuzz/calls

package:  ## Build the Debian packages from the committed tree, check them, and try them in a bare root (build/packages)
	@tools/install-packages.sh package
	@packaging/make-packages.sh

options: packages  ## Build the library without each of its parts, and look whether that fails as it should
	@packaging/check-options.sh

docs:  ## Write the pages of the public headers (build/docs/html), and the table of docs/dialect.md
	@tools/install-packages.sh docs
	@mkdir -p build/docs
	@QVSA_VERSION=$$(sed -n 's/^project(QVSa VERSION \([0-9.]*\).*/\1/p' CMakeLists.txt) \
	  QVSA_HEADERS="$$(sed -n '/QVSA_PUBLIC_HEADERS/,/)/p' QVSa/CMakeLists.txt | grep -o 'QVSa/.*\.h' | tr '\n' ' ') bindings/c/qvsa.h" \
	  doxygen docs/Doxyfile
	@cmake --preset release --log-level=NOTICE
	@cmake --build --preset release -j $(JOBS) --target dialect_table
	@sed -i -e '/^<!-- table -->$$/,/^<!-- end of the table -->$$/{//!d}' docs/dialect.md
	@build/release/tools/dialect_table | sed -i '/^<!-- table -->$$/r /dev/stdin' docs/dialect.md

sources = $$(git ls-files --cached --others --exclude-standard '*.cpp' '*.h' '*.c')

format:  ## Format all sources
	@tools/install-packages.sh lint
	@clang-format -i $(sources)
	@echo 'The sources are formatted.'

lint:  ## Check layers and format, and run clang-tidy over all sources
	@tools/install-packages.sh lint
	$(say) 'Checking the layers'
	@tools/check_layers.py
	$(say) 'Checking the format'
	@clang-format --dry-run --Werror $(sources)
	$(say) 'Running clang-tidy'
	@cmake --preset release -B build/lint -DCMAKE_DISABLE_PRECOMPILE_HEADERS=ON --log-level=NOTICE
	@cmake --build build/lint -j $(JOBS) --target qvsa_database
	@git ls-files --cached --others --exclude-standard '*.cpp' | grep -v '^bench/\|Fuzz\|Missing' | \
	  xargs -P $(JOBS) -n 4 clang-tidy -p build/lint --quiet --extra-arg=-Wno-unknown-warning-option --warnings-as-errors='*'

clean:  ## Remove everything that was built
	@rm -rf build
	@echo 'build/ is removed.'
