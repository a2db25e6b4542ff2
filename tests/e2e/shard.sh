#!/usr/bin/env bash
# shard.sh INDEX COUNT PROGRAM: runs every COUNT-th test case of a GoogleTest program, beginning with that index. Where
# GTEST_OUTPUT names a folder for reports, the shard's has a name of its own: shards that start at once would choose the
# same.
set -euo pipefail

export GTEST_SHARD_INDEX=$1 GTEST_TOTAL_SHARDS=$2
if [[ ${GTEST_OUTPUT:-} == xml:*/ ]]; then
    GTEST_OUTPUT+=$(basename "$3").$1.xml
fi
# Ends that are measured run by themselves.
[[ ${GTEST_FILTER:-} == *-* ]] && GTEST_FILTER+=: || GTEST_FILTER=${GTEST_FILTER:-}-
export GTEST_FILTER+='Watch.EndsInTime*'
exec "$3" --gtest_brief=1
