#!/usr/bin/env bash
# for_browsers.sh SOURCES: takes out of the libraries' sources what the photo library never calls but a linker
# cannot see, since tables name it. What a library then makes of a photo is the same, as the selftest's table
# and the tests of the module hold. An edit that finds nothing to do is an error: the library has changed.
set -euo pipefail
cd "$1"

# edit FILE SED-EXPRESSION...
edit() {
  local file=$1 expression
  shift
  for expression in "$@"; do
    cp "$file" "$file.before"
    sed -i "$expression" "$file"
    ! cmp -s "$file" "$file.before" || {
      echo "for_browsers.sh: $file has nothing for: $expression"
      exit 1
    }
    rm "$file.before"
  done
}

# Photos are decoded at a half, a quarter and an eighth, by the slow transform and with smooth colours, and not
# reduced to a palette.
for option in DCT_IFAST DCT_FLOAT INPUT_SMOOTHING UPSAMPLE_MERGING QUANT_1PASS QUANT_2PASS; do
  edit libjpeg-turbo/jmorecfg.h "/^#define ${option}_SUPPORTED/d"
done
for size in 3 5 6 7 9 10 11 12 13 14 15 16; do
  edit libjpeg-turbo/jddctmgr.c "s/= jpeg_idct_${size}x$size;/= NULL;/"
done

# There is no environment to ask.
edit libjpeg-turbo/jmemmgr.c 's/^#ifndef NO_GETENV$/#if 0/'

# Profiles are read, never written; of their tags those of a transform, and those that the one of the screen
# has, which Little CMS makes itself.
types='Text|TextDescription|ColorantOrder|U16Fixed16Array|DateTime|ProfileSequenceDesc|Signature|Measurement|Data'
types+='|UcrBg|CrdInfo|Screening|ViewingConditions|ProfileSequenceId|Dict|cicp|Vcgt'
edit lcms2/src/cmstypes.c 's/^#define WRITE_FN(x) .*/#define WRITE_FN(x) NULL/' \
  's/TYPE_HANDLER(cmsSig\('"${types//|/\\|}"'\)Type, *[A-Za-z0-9_]*)/{ (cmsTagTypeSignature) 0, NULL, NULL, NULL, NULL, NULL, 0 }/'
edit lcms2/src/cmsio0.c 's/if (Icc *->IsWrite) {/if (0) {/'
# From bytes of four inks to bytes of red, green, blue and one more; no intents but those of the standard.
rows='Unroll4Bytes}|Unroll4BytesReverse}|Pack3BytesAndSkip1}|UnrollLabFloatToFloat}|PackLabFloatFromFloat}'
edit lcms2/src/cmspack.c '/^static const cmsFormatters.*\[\] = {$/,/^};/{/^static\|^};/!{/'"${rows//|/\\|}"'/!d}}'
edit lcms2/src/cmscnvrt.c 's/, *BlackPreservingK\(Only\|Plane\)Intents,/, DefaultICCintents,/'
