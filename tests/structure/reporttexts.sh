#!/usr/bin/env bash
# Finds words for people in the files that write reports and compare scans: they belong to libvelmora/report/texts, where
# they can be read and translated in one place. What is for programs or for a browser is none: text within HTML tags,
# kinds and anchors (lower case with hyphens), and single words that name a member, a class or a form. The files of the
# plain text have none of those, so there each word counts.
#   reporttexts.sh SOURCE_FOLDER
set -euo pipefail
cd "$1"
shopt -s nullglob
files=(libvelmora/report/finding/{findings,findingparts,inspection}*.cpp
    libvelmora/report/document/{module,reportdocument,summary,finding,html,markdown,limitbar}*.cpp
    libvelmora/report/{vinreport,troublecode,oxygenreport}.cpp
    libvelmora/history/*changes.cpp)
plain=(libvelmora/report/plain/{code,counter,findings,freeze,history,info,monitor,readiness,routine,vehiclereport,vin}text.cpp)
[[ ${#files[@]} -gt 10 ]] || { echo "the files are not where they were"; exit 1; }
perl -ne '
    next if /^\s*#\s*include|^\s*\/\//;
    # Names of the core, by which its monitors and counters are known, and states of a sensor.
    next if /isOneOf|"(Misfire|NMHC Catalyst|Evaporative System|PM filter|Generic|Unknown|OBD )"/;
    next if /\{" Co[a-z]+ |Closed loop/;
    # Words of the JSON document, and classes.
    next if /"not ready"|"not judged"|"needle/;
    my $plain = $ARGV =~ m{^program/|/plain/};
    s/\["\w+"\]//g if $plain;                    # a member
    while (/"((?:[^"\\]|\\.)*)"/g) {
        my ($whole, $literal) = ($1, $1);
        $literal =~ s/\\[nt"]/ /g;
        $literal =~ s/\{[^{}]*\}|%[A-Za-z]//g if $plain;
        $literal =~ s/<[^<>]*>?//g;              # tags
        $literal =~ s/[\w-]+=\s*\{?[^>]*//g;      # attributes of a tag that goes on
        $literal =~ s/\{[^{}]*\}//g;             # places to fill in
        if ($literal =~ /[A-Za-z]{2,} +[A-Za-z]{2,}/ || $literal =~ /^[A-Z][a-z]{2,}/ || $plain && $literal =~ /[A-Za-z]{2}/) {
            print "$ARGV: \"$whole\" is a text for people: put it into libvelmora/report/texts\n";
            $found = 1;
        }
    }
    END { exit($found ? 1 : 0) }' "${files[@]}" "${plain[@]}"
