#!/bin/sh
# See README.md. Needs to be root of a machine that may be thrown away.
set -eu
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8
log=/var/log/in_an_empty_root

say()
{
    echo "packages: $*"
}

install_quietly()
{
    apt-get -q -y install --no-install-recommends "$@" >>$log 2>&1 </dev/null ||
        { tail -n 50 $log; exit 1; }
}

apt-get -q update >$log 2>&1
say "the tools need nothing but what they depend on"
install_quietly /with/libzt-util2-1_*.deb /with/zt-util2-tools_*.deb
ztsh -c 'Echo installed' 2>&1 | grep -qx installed

say "the others, and what a person builds with"
install_quietly /with/*.deb
install_quietly g++ cmake ninja-build pkg-config man-db python3
documents=/usr/share/doc/zt_util2
libdir=$(pkg-config --variable=libdir zt_util2)
libdir=${libdir##*/usr/}

for tool in $(dpkg -L zt-util2-tools | sed -n 's|^/usr/bin/||p'); do
    say "reading man $tool"
    man "$tool" | grep -q "^NAME" || { man "$tool"; exit 1; }
    man "$tool" | grep -qi "^ *$tool.* - "
    "$tool" --version
done

# Of the checkout only the tests: what is used is what was installed.
mkdir /work /work/build
cp -a /src/tests /work/tests
for way in find_package pkg_config; do
    python3 /work/tests/consumer/consumer_test.py $way /work /work/build \
        c++ "$libdir" --installed
done

say "a plug-in"
cd /work
ztsh plugin new Outside >/dev/null
cmake -G Ninja -S Outside -B build/Outside >>$log
cmake --build build/Outside >>$log
ctest --test-dir build/Outside >/work/said || { cat /work/said; exit 1; }
[ "$(ztsh -c 'LoadPlugins build/Outside; Outside there' 2>&1 |
    tail -n 1)" = "Outside says hello to there" ]
ztsh -c 'LoadPlugins; Plugins' | grep -q edge

say "the examples"
for source in "$documents"/examples/*.cpp; do
    name=$(basename "$source" .cpp)
    g++ -std=c++20 "$source" -o "/work/$name" \
        $(pkg-config --cflags --libs zt_util2)
    python3 /work/tests/shell/run_case.py "/work/$name" "$documents" \
        "/work/tests/examples/$name.case" >/work/said ||
        { echo "$name:"; cat /work/said; exit 1; }
done
for case in /work/tests/shell/cases/example_*.case \
            /work/tests/shell/cases/realtime_countdown.case; do
    python3 /work/tests/shell/run_case.py /usr/bin/ztsh "$documents" "$case" \
        edge="$(pkg-config --variable=plugindir zt_util2)" >/work/said || { echo "$case:"; cat /work/said; exit 1; }
done
cd /work
ztsh "$documents/examples/tour.zt" >/dev/null 2>/work/said
test -s ztsh-tour/smooth.png

say "taking them off again"
dpkg --purge $(dpkg-query -W -f '${Package}\n' '*zt-util2*') >>$log
left=$(find /usr -name '*zt_util2*' -o -name '*ztsh*' -o -name '*zt-util2*')
[ -z "$left" ] || { echo "left behind: $left"; exit 1; }

say "a host that builds the library itself"
/src/scripts/setup
python3 /src/tests/consumer/consumer_test.py add_subdirectory /src /work/build \
    c++ "$libdir"
say "all well"
