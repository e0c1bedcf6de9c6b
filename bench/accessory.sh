#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# What an integrator would write instead of orvane: the same files from the same sources, with the
# programs that every system has. It leaves the same bytes on the sample unit, as the benchmark checks,
# and wherever nothing is missing or odd. It handles damaged inputs badly: od and awk treat short images
# and long numbers in their own way, and wc would read the whole of a real disk to find its end.
image=/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM
disk=/dev/hd0
static=/fs/mp/etc

# The image's values by their offsets. The 16-bit one is little-endian.
read_image() {
    drive=0 brand=MARL model=VOXA profile=
    [ -s "$image" ] || return
    # shellcheck disable=SC2046 # one word a byte
    set -- $(od -An -v -tu1 "$image")
    drive=${22}
    [ "${36}" -eq 2 ] && brand=QUARION
    profile=$((${134} + 256 * ${135}))
    case ${140} in
    1 | 32) model='Marl Tulvari' ;;
    2) model='Marl Ondrix' ;;
    3) model='Marl Pelluma' ;;
    4) model='Marl Kestova' ;;
    5) model='Marl Brenquil' ;;
    6) model='Marl Ibroskan' ;;
    7) model='Marl Dunmarra' ;;
    8) model='Marl Phendrel' ;;
    9) model='Marl Galvique' ;;
    10) model='Marl Hodruvin' ;;
    11) model='Marl Ilvanto' ;;
    12) model='Marl Jorrimek' ;;
    13) model='Marl Lumeqa' ;;
    14) model='Marl Mirrovex' ;;
    15) model='Marl Nuvantil' ;;
    16) model='Marl Orsevane' ;;
    17) model='Marl Prilloq' ;;
    18) model='Marl Rethiam' ;;
    19) model='Marl Sovrelle' ;;
    20) model='Marl Tarnovik' ;;
    21) model='Marl Umbrenta Tor' ;;
    22) model='Marl Vesqualo' ;;
    23) model='Marl Wexhollin' ;;
    24) model='Marl Yalmeric' ;;
    25) model='Quarion Drellune' ;;
    26) model='Quarion Velmira' ;;
    27) model='Quarion Obrelune' ;;
    28) model='Quarion Thelwyne' ;;
    29) model='Quarion Delphume' ;;
    30) model='Quarion Eskarno' ;;
    31) model='Marl Orlathin' ;;
    33) model='Marl Ghevolyn' ;;
    34) model='Marl Dosquera' ;;
    35) model='Marl Uvarneth' ;;
    36) model='Marl Frumolt Van' ;;
    37) model='Marl Gessandor' ;;
    38) model='Marl Hoveric Trek' ;;
    39) model='Marl Immelza' ;;
    40) model='Marl Jovelkin' ;;
    41) model='Marl Kolvenda Cargo' ;;
    42) model='Marl Lorbasti' ;;
    43) model='Marl Wendrilo' ;;
    44) model='Marl Nirquoda' ;;
    45) model='Marl Ombravel' ;;
    46) model='Quarion Umbressio' ;;
    47) model='Marl Quillon' ;;
    esac
}

# place BYTES: prints the offset of the place BYTES before the end of the disk.
place() {
    echo $(($(wc -c <"$disk") - $1))
}

# write_tuning BLOCK FILE: writes one block of the disk's tuning area as text.
write_tuning() {
    if [ -r "$disk" ]; then
        od -An -v -tu1 -j "$(place $((1044480 - 188 * $1)))" -N 188 "$disk"
    fi | awk -v block="$1" '
        function i16(at) {
            at = byte[at] + 256 * byte[at + 1]
            return at > 32767 ? at - 65536 : at
        }
        { for (i = 1; i <= NF; ++i) byte[bytes++] = $i }
        END {
            switches = " qwaOff qwaOn qwaIdle"
            modes = " qwaSingleChannel qwaMultiChannel qwaCombined"
            split(switches, word, " ")
            split(modes, mode, " ")
            # key, offset, lower bit of a pair of bits or kind, number of elements of a list
            lines = split("AECSwitch 0 0,AGCSwitch 0 2,DiagSwitch 0 4,HFESwitch 0 6,MixFiltSwitch 1 0," \
                "MixSwitch 1 2,NRSwitch 1 4,RECSwitch 2 0,RecvAGCSwitch 2 2,RecvBWESwitch 2 4," \
                "RecvDLCSwitch 2 6,RecvDTFSwitch 3 0,RecvENSSwitch 3 2,RecvEQSwitch 3 4," \
                "SendDynEQSwitch 4 0,SendEQSwitch 4 2,WNDBMode 4 mode,WNDBSwitch 5 code8," \
                "AECFiltLen 6 i16,LFRSwitch 8 code16,HFEExtent 10 u8,NCParams 13 list 5," \
                "NRAtten 23 i16,RECSuppress 25 u8,RecvAGCAmpTgts 26 list 2," \
                "RecvAGCGainVals 30 list 3,RecvAGCMaxRates 36 list 2,RecvGain 40 i16," \
                "RecvLimitThresh 42 i16,RecvParamEQNodes 44 list 15,RefDelay 76 i16," \
                "RefMaxDelay 78 i16,SendAGCMaxRates 84 list 2,SendAGCAmpTgts 88 list 2," \
                "SendAGCGainVals 92 list 3,SendDynEQMinMaxSNR 98 list 2,SendGain 102 i16," \
                "SendLimitThresh 104 i16,SendParamEQ2Nodes 106 list 15,SendParamEQNodes 136 list 15," \
                "WNDBSuppress 166 u8,DNSEnable 167 i16,IVOSwitch 169 code16,MEQEnable 171 list 4", line, ",")
            print "; Genereated config from DPS (blockId " block ")"
            for (l = 1; l <= lines; ++l) {
                split(line[l], field, " ")
                at = field[2]
                kind = field[3]
                if (kind == "i16") text = i16(at)
                else if (kind == "u8") text = byte[at] + 0
                else if (kind == "code8") text = word[byte[at]]
                else if (kind == "code16") text = word[i16(at)]
                else if (kind == "mode") text = mode[int(byte[at] / 64)]
                else if (kind == "list") {
                    text = ""
                    for (i = 0; i < field[4]; ++i) text = text i16(at + 2 * i) " "
                } else text = word[int(byte[at] / 2 ^ kind) % 4]
                print "qwa" field[1] " " text
            }
        }' >"$2"
}

# Prints the version of the first application, from after its first "_".
read_version() {
    awk '
        function trim(text) {
            gsub(/^ +| +$/, "", text)
            return text
        }
        function found() {
            if (!done && type ~ /Application/) {
                sub(/^[^_]*_/, "", version)
                print version
                done = 1
            }
        }
        FNR == 1 { found(); type = version = "" }
        {
            at = index($0, "=")
            if (at == 0 || at == length($0)) next
            key = trim(substr($0, 1, at - 1))
            if (key == "Type") type = trim(substr($0, at + 1))
            if (key == "Version Number") version = trim(substr($0, at + 1))
        }
        END { found() }' /fs/rwdata/.Version/*.inf* 2>/dev/null
}

# Prints three components of a version in two hexadecimal digits each; a missing one repeats the last.
six_digits() {
    case $1 in
    '' | N/A) echo 000000 ;;
    *) echo "$1" | awk '{
            parts = split($0, part, ".")
            printf "%02x", part[1] % 256
            printf "%02x", part[parts < 2 ? 1 : 2] % 256
            printf "%02x\n", part[parts < 3 ? parts : 3] % 256
        }' ;;
    esac
}

# can_generate OUTPUT TEMPLATE: whether the output can be made from its template.
can_generate() {
    : >"$1" && [ -r "$2" ]
} 2>/dev/null

accessory() {
    cat <<EOF
# This section is mandatory.  Populate all fields with accessory-specific info.
[accessory]
name=VOXA 3
model=$model
manufacturer=Marl Motor Company
serial=$serial
firmware_version=$1
EOF
}

update_airplay() {
    read_image
    if [ "$profile" = 65535 ]; then
        write_tuning 3 /tmp/telephony_FFFF.txt
        write_tuning 2 /tmp/speechrec_FFFF.txt
    fi
    if ! can_generate /tmp/airplay.conf $static/airplay_static.conf; then
        cat $static/airplay.conf >/tmp/airplay.conf
        return
    fi
    {
        cat <<EOF
# Default name of the accessory if a name is not specified in the user prefs.
name = CarPlay

# Model of the accessory.
model = $model

# Manufacturer of the accessory.
manufacturer = Marl Motor Company

# OEM Icon Label
oemIconLabel = VOXA

# OEM Icon Visibility Setting
oemIconVisible = 1

# 104x104 OEM Icon png path
oemIconPath = /fs/mp/etc/$brand/oemIcon.png

EOF
        [ -n "$profile" ] && printf '# audio profile for QWA\naudioProfile = %s\n\n' "$profile"
        printf '# rightHandDrive mode setting right\nrightHandDrive = %s\n\n' "$drive"
        cat $static/airplay_static.conf
    } >/tmp/airplay.conf
}

update_iap() {
    read_image
    serial=ABCD1234abc
    if [ -r "$disk" ]; then
        serial=$(dd if="$disk" bs=1 skip="$(place 1048447)" count=8 2>/dev/null |
            sed 's/[^ -~].*//')
    fi
    version=$(read_version)

    if can_generate /tmp/iap2_device.cfg $static/iap2_device_static.cfg; then
        {
            accessory "$version"
            printf 'hardware_version=1.0.0\n\n'
            cat $static/iap2_device_static.cfg
            printf '\n[vehicle]\nenable=no\n\n'
        } >/tmp/iap2_device.cfg
    else
        cat $static/iap2_device.cfg >/tmp/iap2_device.cfg
    fi

    if can_generate /tmp/iap2.cfg $static/mm/iap2_static.cfg; then
        {
            accessory "$version"
            printf 'hardware_version=1.0.0\n\n'
            cat $static/mm/iap2_static.cfg
        } >/tmp/iap2.cfg
    else
        cat $static/mm/iap2.cfg >/tmp/iap2.cfg
    fi

    if [ -s /tmp/iap2.cfg ] && : >/tmp/iap1.cfg; then
        {
            accessory "$(six_digits "$version")"
            printf 'hardware_version=010000\nrfcert=00000000 \n\n'
            cat $static/mm/iap1_static.cfg
        } >/tmp/iap1.cfg
    else
        cat $static/mm/iap1.cfg >/tmp/iap1.cfg
    fi
}

exec 2>/dev/null
while getopts ia option; do
    case $option in
    a) update_airplay ;;
    i) update_iap ;;
    *) ;;
    esac
done
exit 0
