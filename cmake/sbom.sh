#!/bin/sh
# Writes the bill of materials of the library and the program as SPDX 2.3 in JSON: cmake/sbom.sh >vtsym.spdx.json
#
# The packages are those that the build installs, with the versions that are installed and the licences of THIRD-PARTY.md.  The time
# is that of SOURCE_DATE_EPOCH, else of the last commit, so that two builds of one state write the same.
set -eu
root=$(cd "$(dirname "$0")/.." && pwd)
version=$(sed -n 's/^project(vtsym VERSION \([0-9.]*\) .*/\1/p' "$root/CMakeLists.txt")
epoch=${SOURCE_DATE_EPOCH:-$(git -C "$root" log -1 --format=%ct 2>/dev/null || echo 0)}
created=$(date -u -d "@$epoch" +%Y-%m-%dT%H:%M:%SZ)

# licence_of PACKAGE: as an expression of SPDX where THIRD-PARTY.md has one.
licence_of() {
    licence=$(grep -F "\`$1\`" "$root/THIRD-PARTY.md" | head -1 | tr '|' '\n' | sed 's/^ *//; s/ *$//' |
        grep -xE '(BSL-1.0|MIT|BSD-[23]-Clause|Apache-2.0|GPL-3 with the runtime library exception)' | head -1)
    case $licence in
    '') echo NOASSERTION ;;
    GPL-3*) echo 'GPL-3.0-or-later WITH GCC-exception-3.1' ;;
    *) echo "$licence" ;;
    esac
}

# relation_of PACKAGE: how it is related to vtsym.
relation_of() {
    case $1 in
    cmake | ninja-build) echo BUILD_TOOL_OF ;;
    *) echo DEPENDENCY_OF ;;
    esac
}

# encoded TEXT: as a package URL has it.
encoded() {
    printf %s "$1" | sed "s/%/%25/g; s/:/%3A/g; s/+/%2B/g"
}

packages=$(sed -e 's/#.*//' -e '/^$/d' "$root/cmake/packages/program.txt" "$root/cmake/packages/z3.txt" | sort -u)
cat <<EOF
{
  "spdxVersion": "SPDX-2.3",
  "dataLicense": "CC0-1.0",
  "SPDXID": "SPDXRef-DOCUMENT",
  "name": "vtsym-$version",
  "documentNamespace": "https://spdx.org/spdxdocs/vtsym-$version-$epoch",
  "creationInfo": {"created": "$created", "creators": ["Tool: cmake/sbom.sh"]},
  "documentDescribes": ["SPDXRef-vtsym"],
  "packages": [
    {"SPDXID": "SPDXRef-vtsym", "name": "vtsym", "versionInfo": "$version", "downloadLocation": "NOASSERTION", "filesAnalyzed": false,
     "licenseConcluded": "Apache-2.0", "licenseDeclared": "Apache-2.0", "copyrightText": "NOASSERTION"}
EOF
for package in $packages; do
    # shellcheck disable=SC2016 # the field is dpkg-query's
    installed=$(dpkg-query -W -f '${Version}' "$package" 2>/dev/null || :)
    cat <<EOF
    ,{"SPDXID": "SPDXRef-$(echo "$package" | tr -c 'A-Za-z0-9.\n-' -)", "name": "$package", "versionInfo": "${installed:-not installed}",
      "downloadLocation": "NOASSERTION", "filesAnalyzed": false, "licenseConcluded": "NOASSERTION",
      "licenseDeclared": "$(licence_of "$package")", "copyrightText": "NOASSERTION", "externalRefs": [{"referenceCategory":
      "PACKAGE-MANAGER", "referenceType": "purl", "referenceLocator": "pkg:deb/debian/$(encoded "$package")@$(encoded "$installed")"}]}
EOF
done
printf '  ],\n  "relationships": [\n    {"spdxElementId": "SPDXRef-DOCUMENT", "relationshipType": "DESCRIBES", "relatedSpdxElement": "SPDXRef-vtsym"}\n'
for package in $packages; do
    printf '    ,{"spdxElementId": "SPDXRef-%s", "relationshipType": "%s", "relatedSpdxElement": "SPDXRef-vtsym"}\n' \
        "$(echo "$package" | tr -c 'A-Za-z0-9.\n-' -)" "$(relation_of "$package")"
done
printf '  ]\n}\n'
