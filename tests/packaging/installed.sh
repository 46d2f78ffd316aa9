#!/bin/sh
# Installs a build into a scratch folder, builds the examples out of the tree against that copy and runs each of them.
#   installed.sh SOURCES BUILD
set -eu
sources=$1
build=$2
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
prefix=$scratch/prefix

say() { printf '\n== %s\n' "$*"; }
fail() { echo "$*" >&2; exit 1; }

say "Installing"
cmake --install "$build" --prefix "$prefix" >"$scratch/installed"
libdir=$(dirname "$(find "$prefix" -name libqvsa.so)")
export PKG_CONFIG_PATH="$libdir/pkgconfig" LD_LIBRARY_PATH="$libdir" PYTHONPATH="$prefix/lib/python3/dist-packages"
export PYTHONDONTWRITEBYTECODE=1

say "Building the examples against it"
cmake -S "$sources/examples" -B "$scratch/shared" -G Ninja -DCMAKE_PREFIX_PATH="$prefix" --log-level=WARNING
cmake --build "$scratch/shared"
cmake -S "$sources/examples" -B "$scratch/static" -G Ninja -DCMAKE_PREFIX_PATH="$prefix" -DQVSA_LINK=static \
  --log-level=WARNING
cmake --build "$scratch/static" --target interface sign_on
# shellcheck disable=SC2046  # flags are words
c++ -std=c++20 "$sources/examples/numbers.cpp" $(pkg-config --cflags --libs qvsa) -o "$scratch/shared/numbers"
ldd "$scratch/static/sign_on" | grep libqvsa && fail "the static example loads the shared library"

say "Running them"
password=Adm1n-first
server=file:$scratch/installation
organisation=$scratch/organisation
cd "$scratch/shared"
./installation "$scratch/installation" $password
./sign_on "$server" ann Ann-pass-1
./departments "$server"
./numbers "$server"
./log "$server"
./report_classes "$server"
./settings "$server" "Our Co"
mkdir "$scratch/backups"
./backup "$server" "$scratch/backups"
./interface "$server" Admin $password
../static/interface "$server" Admin $password
../static/interface "$server" Admin wrong && fail "a wrong password is taken"
../static/sign_on "$server" ben Ben-pass-1
python3 "$sources/examples/sign_on.py" "$server" Admin $password
./made_up_organisation "$organisation" >/dev/null
"$prefix/bin/qvsa" --server "$server" sign-on Admin <<PASSWORD
$password
PASSWORD

say "One version everywhere"
version=$(sed -n 's/^project(QVSa VERSION \([0-9.]*\).*/\1/p' "$sources/CMakeLists.txt")
for told in "$("$prefix/bin/qvsa" --version | sed 's/^qvsa //')" "$(pkg-config --modversion qvsa)" \
  "$(python3 -c 'import qvsa; print(qvsa.__version__)')" "$(basename "$libdir"/libqvsa.so.*.* | sed 's/libqvsa.so.//')"; do
  [ "$told" = "$version" ] || fail "$told is not $version"
done

say "What the shared library shows"
shown=$(nm --dynamic --defined-only --demangle --format=posix "$libdir/libqvsa.so")
echo "$shown" | grep -E 'QVSa::(platform|embedded|odbc|tsql|binding|database)::' && fail "the inside shows"

say "Inside another project"
mkdir "$scratch/parent"
cat >"$scratch/parent/CMakeLists.txt" <<PARENT
cmake_minimum_required(VERSION 3.25)
project(Parent LANGUAGES CXX)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
add_subdirectory("$sources" qvsa)
add_executable(program "$sources/examples/log.cpp")
target_link_libraries(program PRIVATE QVSa::QVSa)
foreach(target qvsa_console interface quick_tests qvsa_shared)
  if(TARGET \${target})
    message(FATAL_ERROR "the parent gets \${target}")
  endif()
endforeach()
PARENT
cmake -S "$scratch/parent" -B "$scratch/parent/build" -G Ninja --log-level=WARNING
grep -q -e -Werror "$scratch/parent/build/compile_commands.json" && fail "the parent gets warning flags"
cmake --install "$scratch/parent/build" --prefix "$scratch/nothing" 2>&1 | grep -i installing && fail "the parent installs"
echo
echo "All examples ran."
