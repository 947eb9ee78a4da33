#!/bin/sh
# Builds the source outside of this tree: build.sh HEADERS LIBRARIES BUNDLE, where HEADERS is the folder that holds host/
# and platform/, and LIBRARIES the one that holds libombrix.so.
set -e
cd "$(dirname "$0")"
mkdir -p "$3"
cp -R manifest.json resources "$3"
${CXX:-c++} -std=c++20 -O2 -Wall -fPIC -fvisibility=hidden -shared $CXXFLAGS \
  -I"$1" FoldersPlugin.cpp -L"$2" -lombrix -o "$3/Folders.so"
