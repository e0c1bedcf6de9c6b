# SPDX-License-Identifier: Apache-2.0
# Completion of orvane-unit for fish: a folder of fish_complete_path holds this file.

# Whether the command is one of these. It is the first word.
function __orvane_unit_command
    set -l words (commandline -opc)
    set -q words[2]; and contains -- $words[2] $argv
end

function __orvane_unit_lacks_command
    test (count (commandline -opc)) -eq 1
end

# After the unit's folder.
function __orvane_unit_takes_keys
    __orvane_unit_command set impact; and test (count (commandline -opc)) -gt 2
end

complete -c orvane-unit -f
complete -c orvane-unit -l help -d 'Print this help message and exit'
complete -c orvane-unit -n __orvane_unit_lacks_command -l version \
    -d 'Display program version information and exit'

complete -c orvane-unit -n __orvane_unit_lacks_command -a new -d 'Make a unit'
complete -c orvane-unit -n __orvane_unit_lacks_command -a describe \
    -d 'Print the description of a unit, which makes the same unit'
complete -c orvane-unit -n __orvane_unit_lacks_command -a set -d 'Change single values of a unit'
complete -c orvane-unit -n __orvane_unit_lacks_command -a show \
    -d 'Print everything that a unit holds, decoded'
complete -c orvane-unit -n __orvane_unit_lacks_command -a explain \
    -d 'Say what orvane would write, and why, without running it'
complete -c orvane-unit -n __orvane_unit_lacks_command -a run \
    -d 'Run the unmodified orvane in a unit, and show what it changed'
complete -c orvane-unit -n __orvane_unit_lacks_command -a diff \
    -d 'Print the values that differ between two units, and the lines they change'
complete -c orvane-unit -n __orvane_unit_lacks_command -a impact \
    -d 'Change every input in a copy of a unit, and say which output lines change'
complete -c orvane-unit -n __orvane_unit_lacks_command -a report \
    -d 'Write a page about units, for a browser'
complete -c orvane-unit -n __orvane_unit_lacks_command -a capture \
    -d 'Copy the inputs of a real unit into a new one'
complete -c orvane-unit -n __orvane_unit_lacks_command -a check \
    -d 'Run orvane in every unit of a folder, and compare'

complete -c orvane-unit -n 'not __orvane_unit_lacks_command; and not __orvane_unit_takes_keys' \
    -a '(__fish_complete_directories)'
complete -c orvane-unit -n '__orvane_unit_takes_keys; and __orvane_unit_command set' \
    -a 'param. serial= slot. aux= tuning.'
complete -c orvane-unit -n '__orvane_unit_takes_keys; and __orvane_unit_command impact' \
    -a 'param. slot. tuning.'

complete -c orvane-unit -n '__orvane_unit_command new' -l from -rF \
    -d "The unit's description in TOML; by default the built-in sample unit"
complete -c orvane-unit -n '__orvane_unit_command show' -l only -x \
    -a 'params records tuning versions files' -d 'params, records, tuning, versions or files'
complete -c orvane-unit -n '__orvane_unit_command explain diff report' -s a \
    -d "orvane's option -a; by default -a -i"
complete -c orvane-unit -n '__orvane_unit_command explain diff report' -s i -d "orvane's option -i"
complete -c orvane-unit -n '__orvane_unit_command explain' -l all -d "Print orvane's own text as well"
complete -c orvane-unit -n '__orvane_unit_command explain' -l content \
    -d 'With --json: what each file would hold'
complete -c orvane-unit -n '__orvane_unit_command show explain run diff impact check' -l json \
    -d 'Print JSON'
complete -c orvane-unit -n '__orvane_unit_command run check' -l orvane -rF \
    -d 'The binary to run; by default the one beside this program, else on PATH'
complete -c orvane-unit -n '__orvane_unit_command run' -l brief -d 'Only name the files that changed'
complete -c orvane-unit -n '__orvane_unit_command report' -F
complete -c orvane-unit -n '__orvane_unit_command report' -s o -rF -d 'The page to write'
complete -c orvane-unit -n '__orvane_unit_command report' -l redact-serial -d 'Replace the serials by X'
complete -c orvane-unit -n '__orvane_unit_command report' -l impact \
    -d 'Say also which inputs change which lines'
complete -c orvane-unit -n '__orvane_unit_command capture' -l redact-serial -d 'Replace the serial by X'
complete -c orvane-unit -n '__orvane_unit_command check' -l update \
    -d 'Write what is found as the new expectations'
