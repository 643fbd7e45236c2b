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

# Pixels are red, green, blue and one more, or what the file has.
for file in jccolor jdcolor; do
  edit libjpeg-turbo/$file.c \
    '/^[a-z_]*_convert(j_/,/^}/{/^  case JCS_EXT_X*\(RGB\|BGR\|BGRX\):/,/break;/d;/^  default:/,/break;/d}'
done
edit libjpeg-turbo/jccolor.c 's/= \(rgb_gray\|rgb_rgb\|cmyk_ycck\)_convert;/= NULL;/'
edit libjpeg-turbo/jdcolor.c '/^  case JCS_RGB565:/,/^    break;/d' 's/= rgb_gray_convert;/= NULL;/' \
  '/^      build_rgb_y_table(cinfo);/d'

# A loop over a block's coefficients is one, not 63 copies.
edit libjpeg-turbo/jchuff.c \
  '/^    kloop(1);/,/kloop(63);/c\    for (int k = 1; k < DCTSIZE2; ++k) kloop(jpeg_natural_order[k])'

# Texts of what is told to nobody, or in words of our own.
errors='ARITH_NOTIMPL|BAD_ALIGN_TYPE|BAD_ALLOC_CHUNK|BAD_LIB_VERSION|BAD_POOL_ID|BAD_STRUCT_SIZE|BAD_PROG_SCRIPT'
errors+='|BAD_SCAN_SCRIPT|MISSING_DATA|TOO_LITTLE_DATA|BAD_CROP_SPEC|BAD_DROP_SAMPLING|BUFFER_SIZE|[EX]MS_[A-Z]*'
errors+='|T*FILE_[A-Z]*|QUANT_[A-Z_]*|MODE_CHANGE|INPUT_EMPTY|NO_SOI|NO_IMAGE|IMAGE_TOO_BIG|BAD_PRECISION'
errors+='|SOF_UNSUPPORTED|OUT_OF_MEMORY'
warnings='EXTRANEOUS_DATA|ADOBE_XFORM|JFIF_MAJOR|NOT_SEQUENTIAL|BOGUS_ICC|JPEG_EOF|TOO_MUCH_DATA'
codes="JTRC_[A-Z0-9_]*|JMSG_COPYRIGHT|JMSG_VERSION|JERR_($errors)|JWRN_($warnings)"
edit libjpeg-turbo/jerror.h "/^JMESSAGE(\\($(sed 's/[(|)]/\\&/g' <<<"$codes")\\),/{/)\$/!N;s/,.*/, \"\")/}"

# There is no environment to ask.
edit libjpeg-turbo/jmemmgr.c 's/^#ifndef NO_GETENV$/#if 0/'

# Everything is deflated with the usual effort; tables of the codes that are known beforehand are computed.
edit zlib/deflate.c 's/deflate_\(stored\|fast\)}/deflate_slow}/' \
  '/bstate = s->level == 0 ?/,/configuration_table\[s->level\]/c\        bstate = deflate_slow(s, flush);'
for file in trees.c deflate.h; do
  edit zlib/$file 's/^#if defined(GEN_TREES_H) || !defined(STDC)/#if 1/'
done

# Profiles are read, never written; of their tags those of a transform, and those that the one of the screen
# has, which Little CMS makes itself. It has no texts then.
types='Text|TextDescription|ColorantOrder|U16Fixed16Array|DateTime|ProfileSequenceDesc|Signature|Measurement|Data'
types+='|UcrBg|CrdInfo|Screening|ViewingConditions|ProfileSequenceId|Dict|cicp|Vcgt|MultiLocalizedUnicode'
types+='|ColorantTable|NamedColor2|Chromaticity'
edit lcms2/src/cmstypes.c 's/^#define WRITE_FN(x) .*/#define WRITE_FN(x) NULL/' \
  's/TYPE_HANDLER(cmsSig\('"${types//|/\\|}"'\)Type, *[A-Za-z0-9_]*)/{ (cmsTagTypeSignature) 0, NULL, NULL, NULL, NULL, NULL, 0 }/'
edit lcms2/src/cmsio0.c 's/if (Icc *->IsWrite) {/if (0) {/'
edit lcms2/src/cmsvirt.c 's/^cmsBool SetTextTags(.*/#define SetTextTags(...) TRUE\ncmsBool (SetTextTags)(cmsHPROFILE hProfile, const wchar_t* Description)/' \
  '/cmsWriteTag(hICC, cmsSigChromaticityTag/d'
edit lcms2/include/lcms2_plugin.h '/cmsSignalError(/a #define cmsSignalError(...) ((void) 0)'
edit lcms2/src/cmserr.c 's/^void CMSEXPORT cmsSignalError(/#undef cmsSignalError\n&/'
# From bytes of four inks to bytes of red, green, blue and one more, and to measure black from 16 bits to Lab; no
# intents but those of the standard, and of those the one for photos, with which black is measured by its inks.
rows='Unroll4Bytes}|Unroll4BytesReverse}|Pack3BytesAndSkip1}|Unroll16ToFloat}|PackLabDoubleFromFloat}'
edit lcms2/src/cmspack.c \
  's/^ *{ *TYPE_Lab_FLT,.*UnrollLabFloatToFloat}/    { BYTES_SH(2), ANYCHANNELS|ANYSPACE, Unroll16ToFloat}/' \
  '/^static const cmsFormatters.*\[\] = {$/,/^};/{/^static\|^};/!{/^    {.*\('"${rows//|/\\|}"'\)/!d}}'
edit lcms2/src/cmscnvrt.c 's/, *BlackPreservingK\(Only\|Plane\)Intents,/, DefaultICCintents,/' \
  's/if (Intent == INTENT_ABSOLUTE_COLORIMETRIC) {/if (0) {/'
edit lcms2/src/cmssamp.c 's/CreateRoundtripXForm(hProfile, Intent)/NULL/' \
  's/return BlackPointUsingPerceptualBlack(.*/return FALSE;/'
# Four inks become light by way of a table; no named colours, no other pixels beside, nothing out of range is marked.
edit lcms2/src/cmsopt.c \
  '/^    { Optimize\(ByJoiningCurves\|MatrixShaper\|ByComputingLinearization\),/d'
edit lcms2/src/cmsio1.c 's/if (cmsGetDeviceClass(hProfile) == cmsSigNamedColorClass) {/if (0) {/'
edit lcms2/src/cmsxform.c '/^ *_cmsHandleExtraChannels(/d' 's/^        cmsFreeNamedColorList(p ->.*/        ;/' \
  's/p ->xform = \(NullFloat\|Null\|PrecalculatedGamutCheck\|CachedGamutCheck\)XFORM;/return NULL;/' \
  's/p ->xform = \(Precalculated\|Cached\)XFORMGamutCheck;/return NULL;/' \
  's/^ *if (\(hGamutProfile != NULL \&\& .*\|xform ->GamutCheck != NULL\|p->GamutCheck != NULL\))\( {\)*$/if (0)\2/' \
  's/^ *if (cmsIsTag(.*cmsSigColorantTable\(Out\)*Tag)) {/if (0) {/'
