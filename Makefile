# The everyday commands. Each first sets up what it needs; see CONTRIBUTING.md.

.PHONY: help setup build test check-deep package demo demo-ffmpeg web install-user uninstall-user format tidy clean

help:
	@echo 'make demo            build everything, render footage through the library and the native core'
	@echo 'make demo-ffmpeg     render footage through the frei0r plug-in in FFmpeg'
	@echo 'make web             build the page for the browser, build/web/reel.html'
	@echo 'make package         make the installer, the zip, the Debian package and the tarball in build/packages'
	@echo 'make install-user    install reelfx and the frei0r plug-ins in your home folder'
	@echo 'make uninstall-user  remove them'
	@echo 'make test            build everything and run all tests'
	@echo 'make check-deep      run the checks that take hours: careless hosts, fuzzing, sanitizers, failures, endurance, mutation'
	@echo 'make setup           install packages and 32-bit Wine; the other commands do this automatically'
	@echo 'make build           build the Windows library and the native programs into build/*/dist'
	@echo 'make format          format the sources'
	@echo 'make tidy            run clang-tidy and cppcheck'
	@echo 'make clean           delete the builds'

setup:
	scripts/setup

build: setup
	scripts/build windows native

test: setup
	scripts/test

check-deep: setup
	scripts/check-deep

demo: setup
	scripts/demo

demo-ffmpeg: setup
	scripts/demo-ffmpeg

web: setup
	scripts/build-web

package: setup
	scripts/package

install-user: setup
	scripts/build native
	scripts/build-web
	scripts/install-user

uninstall-user:
	scripts/install-user --remove

format:
	git ls-files '*.cpp' '*.h' | xargs clang-format -i

tidy: setup
	scripts/tidy
	scripts/cppcheck

clean:
	rm -rf build
