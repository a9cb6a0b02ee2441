#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Looks for misspelled words in the sources and pages. .codespellrc lists the words and folders that are passed over.
#
#   check-spelling.sh SOURCES    exit status: 0 if there are none; 77 if codespell is missing, unless CI is "true"
set -eu
cd "$1"
command -v codespell >/dev/null || { echo "codespell is not installed"; [ "${CI:-}" = true ] && exit 1; exit 77; }
codespell
