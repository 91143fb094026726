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
mkdir /trial /trial/build
cp -a /src/tests /trial/tests
for way in find_package pkg_config; do
    python3 /trial/tests/consumer/consumer_test.py $way /trial /trial/build \
        c++ "$libdir" --installed
done

say "a plug-in"
cd /trial
ztsh plugin new Outside >/dev/null
cmake -G Ninja -S Outside -B build/Outside >>$log
cmake --build build/Outside >>$log
ctest --test-dir build/Outside >/trial/said || { cat /trial/said; exit 1; }
[ "$(ztsh -c 'LoadPlugins build/Outside; Outside there' 2>&1 |
    tail -n 1)" = "Outside says hello to there" ]
ztsh -c 'LoadPlugins; Plugins' | grep -q edge

say "the examples"
for source in "$documents"/examples/*.cpp; do
    name=$(basename "$source" .cpp)
    g++ -std=c++20 "$source" -o "/trial/$name" \
        $(pkg-config --cflags --libs zt_util2)
    python3 /trial/tests/shell/run_case.py "/trial/$name" "$documents" \
        "/trial/tests/examples/$name.case" >/trial/said ||
        { echo "$name:"; cat /trial/said; exit 1; }
done
for case in /trial/tests/shell/cases/example_*.case \
            /trial/tests/shell/cases/realtime_countdown.case; do
    python3 /trial/tests/shell/run_case.py /usr/bin/ztsh "$documents" "$case" \
        edge="$(pkg-config --variable=plugindir zt_util2)" >/trial/said || { echo "$case:"; cat /trial/said; exit 1; }
done
cd /trial
ztsh "$documents/examples/tour.zt" >/dev/null 2>/trial/said
test -s ztsh-tour/smooth.png

say "taking them off again"
dpkg --purge $(dpkg-query -W -f '${Package}\n' '*zt-util2*') >>$log
left=$(find /usr -name '*zt_util2*' -o -name '*ztsh*' -o -name '*zt-util2*')
[ -z "$left" ] || { echo "left behind: $left"; exit 1; }

say "a host that builds the library itself"
/src/scripts/setup
python3 /src/tests/consumer/consumer_test.py add_subdirectory /src /trial/build \
    c++ "$libdir"
say "all well"
