# Velmar: set-up, build, test and demo entry points. Every target installs what it needs first.
SHELL := /bin/bash
.DEFAULT_GOAL := build

# The Debian packages the project builds and tests with. Qt Charts' CMake package needs Qt OpenGL's, which
# qt6-charts-dev does not pull in by itself. lintian checks the .deb; systemd brings systemd-analyze, which
# checks the user unit; clang-format checks the sources' style. The service reads ModemManager through sd-bus
# (libsystemd-dev); its tests run a private dbus-daemon.
DEBIAN_PACKAGES := build-essential cmake pkg-config clang libclang-rt-14-dev qt6-base-dev qt6-charts-dev \
                   libqt6opengl6-dev libexpat1-dev libncurses-dev googletest libgtest-dev libbenchmark-dev \
                   tmux lintian systemd clang-format libsystemd-dev dbus-daemon
SUDO := $(shell [ "$$(id -u)" = 0 ] || echo sudo)
FUZZ_SECONDS ?= 30
DEMO_TECHNOLOGY ?= lte

.PHONY: deps build build-asan build-fuzz test test-default test-asan fuzz package package-check bench demo format \
        format-check clean

deps:
	@missing=""; \
	for package in $(DEBIAN_PACKAGES); do \
	  dpkg-query -W -f='$${Status}' "$$package" 2>/dev/null | grep -q "install ok installed" || missing="$$missing $$package"; \
	done; \
	if [ -n "$$missing" ]; then \
	  echo "Installing:$$missing"; \
	  $(SUDO) apt-get update -qq && \
	  DEBIAN_FRONTEND=noninteractive $(SUDO) apt-get install -y -qq --no-install-recommends $$missing >/dev/null; \
	fi

build: deps
	cmake --preset default >/dev/null
	cmake --build --preset default

build-asan: deps
	cmake --preset asan >/dev/null
	cmake --build --preset asan

build-fuzz: deps
	cmake --preset fuzz >/dev/null
	cmake --build --preset fuzz --target fuzzers

test-default: build
	ctest --preset default

test-asan: build-asan
	ctest --preset asan

# Each fuzz target runs for FUZZ_SECONDS from its committed seed corpus; new inputs go to a scratch copy.
fuzz: build-fuzz
	@for target in build/fuzz/fuzz/fuzz_*; do \
	  [ -x "$$target" ] || continue; \
	  name=$$(basename "$$target"); scratch=$$(mktemp -d); log=$$(mktemp); \
	  echo "== $$name: $(FUZZ_SECONDS) s"; \
	  "$$target" -max_total_time=$(FUZZ_SECONDS) -print_final_stats=1 "$$scratch" "fuzz/corpus/$$name" >"$$log" 2>&1; \
	  status=$$?; \
	  grep -E "^(stat::number_of_executed_units|stat::peak_rss_mb|SUMMARY)|ERROR" "$$log" || true; \
	  if [ "$$status" != 0 ]; then tail -40 "$$log"; rm -rf "$$scratch" "$$log"; echo "$$name failed"; exit 1; fi; \
	  rm -rf "$$scratch" "$$log"; \
	done

# The .deb from the default build (no second build): build/package/velmar_<version>_<arch>.deb.
package: build
	rm -rf build/package
	cpack --config build/default/CPackConfig.cmake -B build/package
	@rm -rf build/package/_CPack_Packages
	@for deb in build/package/*.deb; do echo "$$deb: $$(du -k "$$deb" | cut -f1) KiB"; done

# lintian on the package: errors and warnings fail; informational tags are shown.
package-check: package
	lintian --fail-on error,warning --display-info build/package/*.deb

test: format-check test-default package-check test-asan fuzz

bench: build
	@for program in build/default/bench/bench_*; do [ -x "$$program" ] && "$$program"; done

# The live monitor: kxserverd on the simulated baseband (TECH=gsm|lte|utran|cdma|ifx, default lte) in the
# background, in a runtime directory of its own, and velmar in front (the GUI where a display exists, the
# terminal UI otherwise). The service stops when velmar ends.
demo: deps
	cmake --preset default >/dev/null
	cmake --build --preset default --target velmar kxserverd
	@set -u; \
	technology="$${TECH:-$(DEMO_TECHNOLOGY)}"; \
	runtime="$$(mktemp -d)"; export VELMAR_RUNTIME_DIR="$$runtime"; \
	service=""; \
	stop() { [ -n "$$service" ] && kill "$$service" 2>/dev/null && wait "$$service" 2>/dev/null; rm -rf "$$runtime"; }; \
	trap stop EXIT; trap 'exit 130' INT TERM; \
	./build/default/service/kxserverd --source sim --technology "$$technology" 2>"$$runtime/kxserverd.log" & \
	service=$$!; \
	for i in $$(seq 50); do [ -S "$$runtime/com.velmar.kxserver" ] && break; \
	  kill -0 "$$service" 2>/dev/null || break; sleep 0.1; done; \
	[ -S "$$runtime/com.velmar.kxserver" ] || { echo "make demo: kxserverd did not start:"; cat "$$runtime/kxserverd.log"; exit 1; }; \
	./build/default/ui/velmar

# Fails, naming each file and line, when a tracked source or header is off the style of .clang-format.
format-check: deps
	git ls-files -z '*.cpp' '*.h' | xargs -0 clang-format --dry-run -Werror

# Rewrites every tracked source and header in the style of .clang-format.
format: deps
	git ls-files -z '*.cpp' '*.h' | xargs -0 clang-format -i

clean:
	rm -rf build
