#!/bin/sh
# How does a numbered sequence gain from more processes? Runs the host shell on
# 64 pictures with 1, 2, 4 … jobs, up to twice the cores.
#
#   bench/sequence_jobs.sh BUILD RESULT
set -eu
build=$1
result=$2
ztsh=$PWD/$build/tools/ztsh/ztsh
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT

cat >"$folder/make.zt" <<'END'
Load picture $here/hills.rgb
ScaleBest picture 1024 768
Frames 1 64 begin
  Store picture $here/in.$frame.rgb
end
END
cat >"$folder/convert.zt" <<'END'
Frames 1 64 begin
  Load shot $here/in.$frame.rgb
  ScaleBest shot 648 486
  Store shot $here/out.$frame.rgb
end
END
cp examples/pictures/hills.rgb "$folder"
"$ztsh" "$folder/make.zt" >/dev/null

separator=""
{
    printf '{"benchmarks": ['
    jobs=1
    while [ "$jobs" -le $((2 * $(nproc))) ]; do
        for repetition in 1 2 3; do
            begin=$(date +%s%N)
            "$ztsh" --jobs "$jobs" "$folder/convert.zt" >/dev/null
            spent=$(($(date +%s%N) - begin))
            printf '%s\n{"name": "curve/sequence_jobs/ours/%d", ' \
                "$separator" "$jobs"
            printf '"real_time": %d, "cpu_time": %d, "time_unit": "ns"}' \
                "$spent" "$spent"
            separator=,
        done
        jobs=$((jobs * 2))
    done
    printf '\n]}\n'
} >"$result"
