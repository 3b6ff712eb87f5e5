#!/bin/sh
# check-command-line.sh PROGRAM NAME: PROGRAM answers --help with its usage and
# --version with "NAME VERSION" (status 0), and an unknown option with a
# message on standard error (status 2).
set -u
program=$1
name=$2
fail() { echo "$name: $*" >&2; exit 1; }

help=$("$program" --help) || fail "--help exited with $?"
case $help in "Usage: $name"*) ;; *) fail "--help does not start with 'Usage: $name': $help" ;; esac
version=$("$program" --version) || fail "--version exited with $?"
case $version in "$name "[0-9]*) ;; *) fail "--version does not name the program: $version" ;; esac
"$program" --bogus >/dev/null 2>"${TMPDIR:-/tmp}/check-command-line.$$"
status=$?
error=$(cat "${TMPDIR:-/tmp}/check-command-line.$$")
rm -f "${TMPDIR:-/tmp}/check-command-line.$$"
[ "$status" -eq 2 ] || fail "an unknown option exited with $status, not 2"
case $error in "$name: unknown option '--bogus'"*) ;; *) fail "unexpected message for an unknown option: $error" ;; esac
exit 0
