#!/usr/bin/env bash
# Checks the dynamic symbol table of libquorvex.so: the facade is exported, the internal
# classes (logger, platform layer, INI reader) are not.
set -u
lib=$1
symbols=$(nm -DC --defined-only "$lib") || { echo "nm failed on $lib"; exit 1; }
fail=0
require() {
  if ! grep -q -- "$1" <<<"$symbols"; then echo "missing export: $1"; fail=1; fi
}
forbid() {
  if grep -q -- "$1" <<<"$symbols"; then echo "internal symbol exported: $1"; fail=1; fi
}
require 'CQuorvex::CQuorvex()'
require 'CQuorvex::GetErrorDesc(int)'
require 'CQuorvex::MetaLoggerInitialize(char const\*, unsigned int, unsigned int, unsigned int)'
forbid 'CMetaFileLogger'
forbid 'plat::'
forbid 'CIniProfile'
forbid 'utf8path::'
if [ $fail -eq 0 ]; then echo "exports ok: $(grep -c 'CQuorvex::' <<<"$symbols") CQuorvex symbols"; fi
exit $fail
