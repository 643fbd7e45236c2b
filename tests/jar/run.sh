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
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
jar=$root/build/jar/quenby/quenby-$version.jar
desktop=$root/build/jar/quenby-desktop/quenby-desktop-$version.jar
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
  for library in "$scratch/unpacked/native/linux-$machine"/*.so; do
    readelf -h "$library" | grep -q "Machine:.*${machines[$machine]}" ||
      fail "$library is another machine's"
  done
done

step "licences, module names, sources, documentation"
for licence in highway lcms2 libjpeg-turbo libjpeg-turbo-ijg libpng pugixml zlib; do
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

# Made where Maven's profile for Spark was asked for: one file with all of the other two inside.
spark=$root/build/jar/quenby-spark/quenby-spark-$version.jar
if [ -f "$spark" ]; then
  step "the jar for Spark"
  unzip -qq -o "$spark" -d "$scratch/spark"
  diff -r "$scratch/unpacked/native" "$scratch/spark/native"
  diff -r "$scratch/unpacked/META-INF/licences" "$scratch/spark/META-INF/licences"
  grep -q '^Main-Class: com.pelorin.photos.quenby.spark.QuenbyJob' "$scratch/spark/META-INF/MANIFEST.MF" ||
    fail "$spark has no main class"
  for kind in sources javadoc; do
    [ -s "${spark%.jar}-$kind.jar" ] || fail "no $kind of $spark"
  done
fi

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
installed=$repository/com/pelorin/photos
for name in quenby-parent quenby quenby-desktop; do
  folder=$installed/$name/$version
  mkdir -p "$folder"
  [ $name = quenby-parent ] || cp "$root/build/jar/$name/$name-$version.jar" "$folder"
  cp "$root/java/${name#quenby-parent}/pom.xml" "$folder/$name-$version.pom"
done
mkdir "$scratch/sources"
cp "$root/java/example/src/main/java/SlideAndSave.java" "$here/project/PhotosAndBytes.java" \
  "$scratch/sources"
"${maven[@]}" --offline --file "$here/project/pom.xml" -Dmaven.repo.local="$repository" \
  -Dquenby.version="$version" -Dbuild="$scratch/project" -Dsources="$scratch/sources" compile

# make NAME CLASSPATH [JAVA OPTION...]: pictures by both programs, in a folder of that name.
make() {
  local made=$scratch/made/$1 classpath=$2
  shift 2
  mkdir -p "$made"
  local java=(java -Djava.io.tmpdir="$scratch/tmp" -Djava.awt.headless=true "$@" -cp "$classpath")
  "${java[@]}" SlideAndSave "$photo" "$made/enhanced.jpg" "$made/look.jpg" &&
    "${java[@]}" PhotosAndBytes "$photo" "$made"
}
same() {
  [ "$(find "$scratch/made/$1" -size +0 | wc -l)" -eq 7 ] || fail "files are missing of $1"
  diff -r "$scratch/made/$1" "$scratch/made/$2"
}
classpath=$scratch/project/classes:$installed/quenby/$version/quenby-$version.jar
classpath=$classpath:$installed/quenby-desktop/$version/quenby-desktop-$version.jar
make jar "$classpath"
make folder "$classpath" -Dquenby.library="$natives"
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
    -keep 'public class * { public static void main(java.lang.String[]); }' \
    "$@" >"$scratch/$name.log" 2>&1 || fail "$(cat "$scratch/$name.log")"
}
rules=()
for file in "$scratch"/unpacked/META-INF/proguard/*.pro; do rules+=(-include "$file"); done
[ ${#rules[@]} -eq 4 ] || fail "each jar brings its rules"
shrink shrunk "${rules[@]}"
make shrunk "$scratch/shrunk.jar"
same shrunk folder
cat "$scratch"/unpacked/META-INF/proguard/*.pro |
  grep -v 'PhotoBytes\|PhotoException' >"$scratch/no_photos.pro"
for name in none no_photos; do
  rules=()
  [ $name = none ] || rules=(-include "$scratch/$name.pro")
  shrink $name "${rules[@]}"
  if make $name "$scratch/$name.jar" >/dev/null 2>&1; then
    fail "with $name of the rules it works as well: this test shows nothing"
  fi
done
step "passed"
