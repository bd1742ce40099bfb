# The commands of daily work. Each sets up first what it needs; see CONTRIBUTING.md.

.PHONY: help setup build test demo format tidy clean

help:
	@echo 'make demo    build everything and see footage through the library and the native core'
	@echo 'make test    build everything and run all tests'
	@echo 'make setup   install packages and 32-bit Wine; the other commands do it by themselves'
	@echo 'make build   build the Windows library and the native programs into build/*/dist'
	@echo 'make format  bring the sources into their form'
	@echo 'make tidy    look for doubtful code'
	@echo 'make clean   delete the builds'

setup:
	scripts/setup

build: setup
	scripts/build windows native

test: setup
	scripts/test

demo: setup
	scripts/demo

format:
	git ls-files '*.cpp' '*.h' | xargs clang-format -i

tidy: setup
	scripts/tidy

clean:
	rm -rf build
