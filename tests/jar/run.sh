#!/usr/bin/env bash
# Looks at the jars that tools/jar.sh made, and uses them as others do: from a Maven project of their
# own without a network, and shrunk. What comes out is compared with what other natives make.
#
#   tests/jar/run.sh [FOLDER OF NATIVES TO COMPARE WITH]
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
here=$root/tests/jar
scratch=$root/build/jar_test
natives=${1-$root/build/release/lib}
photo=/usr/share/matplotlib/mpl-data/sample_data/grace_hopper.jpg
jar=$root/build/jar/quenby/quenby-0.1.0.jar
desktop=$root/build/jar/quenby-desktop/quenby-desktop-0.1.0.jar
maven=(mvn --batch-mode --no-transfer-progress --quiet -Dstyle.color=never)

step() { printf '%s\n' "jar: $*"; }
fail() {
  printf '%s\n' "jar: FAILED: $*" >&2
  exit 1
}

rm -rf "$scratch"
mkdir -p "$scratch/unpacked" "$scratch/tmp"
for file in "$jar" "$desktop"; do (cd "$scratch/unpacked" && jar --extract --file "$file"); done

step "natives for three machines"
for machine in linux-amd64 linux-aarch64 linux-arm; do
  cmake -DFOLDER="$scratch/unpacked/native/$machine" -DREADELF=readelf \
    -P "$root/tests/jni/check_self_contained.cmake"
done
declare -A machines=([amd64]=X86-64 [aarch64]=AArch64 [arm]=ARM)
for machine in "${!machines[@]}"; do
  readelf -h "$scratch/unpacked/native/linux-$machine/libpn_quenby.so" |
    grep -q "Machine:.*${machines[$machine]}" || fail "linux-$machine holds another machine's library"
done

step "licences, module names, sources, documentation"
for licence in highway libjpeg-turbo libjpeg-turbo-ijg lcms2; do
  [ -s "$scratch/unpacked/META-INF/licences/$licence.txt" ] || fail "no licence of $licence"
done
for file in "$jar" "$desktop"; do
  unzip -p "$file" META-INF/MANIFEST.MF | grep -q '^Automatic-Module-Name: com.pelorin.photos.quenby' ||
    fail "$file has no module name"
  for kind in sources javadoc; do
    [ -s "${file%.jar}-$kind.jar" ] || fail "no $kind of $file"
  done
done
java --module-path "$jar:$desktop" --describe-module com.pelorin.photos.quenby >/dev/null

step "bytecode of Java 11"
classes=0
while read -r class; do
  [ "$(od -An -t u1 -j 7 -N 1 "$class" | tr -d ' ')" -eq 55 ] || fail "$class is not of Java 11"
  classes=$((classes + 1))
done < <(find "$scratch/unpacked" -name '*.class')
[ $classes -gt 10 ] || fail "only $classes classes"

step "no natives, no jar"
if "${maven[@]}" --file "$root/java/pom.xml" -DskipTests -Dquenby.native.dir="$scratch/nothing" \
  -Dquenby.build.dir="$scratch/empty" --projects quenby-desktop package >"$scratch/empty.log" 2>&1; then
  fail "a jar without natives was made"
fi
grep -q 'No natives for the jar' "$scratch/empty.log" || fail "another error: $(cat "$scratch/empty.log")"

step "installed, and used by another project without a network"
repository=$scratch/repository
mkdir -p "$repository"
cp -rs "$HOME/.m2/repository/." "$repository"
rm -rf "$repository/com/pelorin"
"$root/tools/jar.sh" -Dmaven.repo.local="$repository" install
"${maven[@]}" --offline --file "$here/project/pom.xml" -Dmaven.repo.local="$repository" \
  -Dbuild="$scratch/project" -Dsources="$root/java/example/src/main/java" compile

# slide NAME CLASSPATH [JAVA OPTION...]
slide() {
  local name=$1 classpath=$2
  shift 2
  java -Djava.io.tmpdir="$scratch/tmp" -Djava.awt.headless=true "$@" -cp "$classpath" SlideAndSave \
    "$photo" "$scratch/$name-enhanced.jpg" "$scratch/$name-look.jpg"
}
same() {
  cmp "$scratch/$1-enhanced.jpg" "$scratch/$2-enhanced.jpg"
  cmp "$scratch/$1-look.jpg" "$scratch/$2-look.jpg"
}
installed=$repository/com/pelorin/photos
classpath=$scratch/project/classes:$installed/quenby/0.1.0/quenby-0.1.0.jar
classpath=$classpath:$installed/quenby-desktop/0.1.0/quenby-desktop-0.1.0.jar
slide jar "$classpath"
slide folder "$classpath" -Dquenby.library="$natives"
same jar folder

step "shrunk by ProGuard with the rules inside the jars"
"${maven[@]}" --file "$here/shrinker/pom.xml" -Dbuild="$scratch/shrinker" package
jmods=$(dirname "$(dirname "$(readlink -f "$(command -v javac)")")")/jmods
platform=()
for module in java.base java.desktop java.logging; do
  platform+=(-libraryjars "$jmods/$module.jmod(!**.jar;!module-info.class)")
done
shrink() { # NAME RULES...
  local name=$1
  shift
  java -cp "$scratch/shrinker/dependency/*" proguard.ProGuard \
    -injars "$scratch/project/classes" -injars "$jar(!META-INF/MANIFEST.MF)" \
    -injars "$desktop(!META-INF/MANIFEST.MF,!META-INF/maven/**)" \
    -outjars "$scratch/$name.jar" "${platform[@]}" \
    -keep 'public class SlideAndSave { public static void main(java.lang.String[]); }' \
    "$@" >"$scratch/$name.log" 2>&1 || fail "$(cat "$scratch/$name.log")"
}
rules=()
for file in "$scratch"/unpacked/META-INF/proguard/*.pro; do rules+=(-include "$file"); done
[ ${#rules[@]} -eq 4 ] || fail "each jar brings its rules"
shrink shrunk "${rules[@]}"
slide shrunk "$scratch/shrunk.jar"
same shrunk folder
shrink without_rules
if slide without_rules "$scratch/without_rules.jar" >/dev/null 2>&1; then
  fail "the rules are not needed: this test shows nothing"
fi
step "passed"
