#!/bin/sh
# changelog.sh VERSION MAINTAINER: the changelog of a Debian package, compressed, dated by
# SOURCE_DATE_EPOCH.
set -eu
date=$(LC_ALL=C date -u -R -d "@${SOURCE_DATE_EPOCH-$(date +%s)}")
gzip -9 -n <<TEXT
quenby ($1) unstable; urgency=medium

  * What changed is told in CHANGELOG.md of the sources.

 -- $2  $date
TEXT
