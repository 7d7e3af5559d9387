# The two commands for a fresh machine: `make demo` and `make test`.
JOBS ?= $(shell nproc)

.PHONY: deps test-deps build demo test test-default test-asan test-tsan format clean

deps:
	@scripts/install-deps

test-deps:
	@scripts/install-deps test

build: deps
	cmake --preset default >/dev/null
	cmake --build --preset default -j $(JOBS)

demo: build
	@scripts/demo

test: test-default test-asan test-tsan

test-default: test-deps
	cmake --preset default >/dev/null
	cmake --build --preset default -j $(JOBS)
	ctest --preset default -j $(JOBS) --label-exclude threads

test-asan: test-deps
	cmake --preset asan >/dev/null
	cmake --build --preset asan -j $(JOBS)
	ctest --preset asan -j $(JOBS) --label-exclude threads

test-tsan: test-deps
	cmake --preset tsan >/dev/null
	cmake --build --preset tsan -j $(JOBS)
	ctest --preset tsan -j $(JOBS)

format:
	find src tests bench -name '*.cpp' -o -name '*.h' | xargs clang-format -i

clean:
	rm -rf build build-asan build-tsan
