#!/usr/bin/env bash
# Proves that check-schema, check-size, check-locks and messages --check notice a change of either
# side: each case changes one thing in a copy of the tree and wants a complaint that names it.
#
#   checks_fail_test.sh SOURCE_TREE
set -euo pipefail

tree=$1
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
cases=0 failures=0

fresh_copy() {
    rm -rf "$scratch/tree"
    mkdir -p "$scratch/tree/cim"
    cp -r "$tree"/cim/{cmpi,plexor,hostconfig,schema} "$scratch/tree/cim"
    cp -r "$tree/docs" "$scratch/tree"
}

check_schema() { "$tree/scripts/check-schema" "$scratch/tree"; }
check_size() { "$tree/scripts/check-size" "$scratch/tree"; }
check_locks() { "$tree/scripts/check-locks" "$scratch/tree" "$file"; }
check_messages() { "$tree/scripts/messages" --root "$scratch/tree" --check; }

# CHECK COMPLAINT FILE SED_EXPRESSION
must_complain() {
    local check=$1 complaint=$2 file=$3 change=$4 said
    cases=$((cases + 1))
    fresh_copy
    sed -i -E "$change" "$scratch/tree/$file"
    if cmp -s "$tree/$file" "$scratch/tree/$file"; then
        echo "FAIL: $file: the change does nothing: $change"
    elif said=$($check 2>&1); then
        echo "FAIL: $file, $change: not noticed"
    elif ! grep -qF -- "$complaint" <<<"$said"; then
        echo "FAIL: $file, $change: wanted \"$complaint\", got: $said"
    else
        return 0
    fi
    failures=$((failures + 1))
}

render=cim/plexor/PlexorProviderIfcRender
mof=cim/schema/Tovexa_Plexor

# What the provider sets.
must_complain check_schema "sets the property Weight" ${render}.cpp \
    's/SetUint16\(inst, "PortType"/SetUint16(inst, "Weight"/'
must_complain check_schema "property porttype of the schema is not set" ${render}.cpp \
    '/"PortType"/d'
must_complain check_schema "IsEntity is set as uint8" ${render}.cpp \
    's/SetBoolean\(inst, "IsEntity"/SetUint8(inst, "IsEntity"/'
must_complain check_schema "OperationalStatus is set as uint16," ${render}.cpp \
    's/SetUint16Array\(inst, "OperationalStatus", opStatus/SetUint16(inst, "OperationalStatus", opStatus/'
must_complain check_schema "BlockSize is set as uint64, the schema says uint16" ${render}Extent.cpp \
    's/SetUint16\(inst, "BlockSize"/SetUint64(inst, "BlockSize"/'
must_complain check_schema "name that is no literal" ${render}Volume.cpp \
    's/SetUint8\(inst, "DeltaReservation"/SetUint8(inst, kName/'
must_complain check_schema "other than through the setters" ${render}Volume.cpp \
    's/SetUint8\(inst, "DeltaReservation".*/inst->ft->setProperty(inst, "DeltaReservation", 0, 0);/'
must_complain check_schema "property Caption is set as uint8" cim/plexor/PlexorProviderIfcProperty.cpp \
    's/SetChars\(inst, "Caption", text/SetUint8(inst, "Caption", 1/'
must_complain check_schema "key devicename of the schema" ${mof}StorageVolume.mof \
    's/DeviceID/DeviceName/'
must_complain check_schema "sets the key Label" cim/plexor/PlexorProviderIfcKeys.cpp \
    's/AddKey\(cop, kSoftwareKey/AddKey(cop, "Label"/'
must_complain check_schema "sets the key Label" cim/plexor/PlexorProviderIfc.h \
    's/"InstanceID"/"Label"/'
must_complain check_schema "AddKey does not add strings" cim/plexor/PlexorProviderIfcKeys.cpp \
    's/\(value\), CMPI_chars/(value), CMPI_uint16/'
must_complain check_schema "SetNameAndCaption is defined in another file too" ${render}.cpp \
    's/^void SetStatusAndHealth/void SetNameAndCaption/'
must_complain check_schema "served, but not in the schema" cim/plexor/PlexorProviderIfcServe.cpp \
    's/= "Tovexa_PlexorBattery"/= "Tovexa_PlexorCell"/'

# What the schema says.
must_complain check_schema "the schema says uint32" ${mof}StorageVolume.mof \
    's/uint64 NumberOfBlocks/uint32 NumberOfBlocks/'
must_complain check_schema "BlockSize is set as uint16, the schema says uint64" \
    ${mof}StorageExtent.mof '/set as uint16/d'
must_complain check_schema "without a default" ${mof}StorageExtent.mof 's/BlockSize = 512/BlockSize/'
must_complain check_schema "ExtentStatus is set as uint16[], the schema says uint16" \
    ${mof}StorageVolume.mof 's/ExtentStatus\[\]/ExtentStatus/'
must_complain check_schema "the provider sets the property Caption" ${mof}Battery.mof \
    's/Caption/Legend/g'
must_complain check_schema "key InstanceID" ${mof}SoftwareIdentity.mof \
    's/\[Key, /[/'
must_complain check_schema "ValueMap and Values" ${mof}Battery.mof \
    's/"Overcharged", //'
must_complain check_schema "a code without ValueMap" ${mof}Controller.mof \
    '/ValueMap\{"5"\}/d; /Values\{"OK"\}/d; s/"and by its devices."\),/"and by its devices.")]/'
must_complain check_schema "no Description" ${mof}Battery.mof \
    's/Description\("The same text as ElementName."\)/Description("")/'
must_complain check_schema "no Version" ${mof}Battery.mof 's/Version\("1.0.0"\)/Version("")/'
must_complain check_schema "Provider is not" ${mof}Battery.mof 's/cmpi:PlexorProvider/cmpi:Other/'
must_complain check_schema "Override does not name it" ${mof}Battery.mof \
    's/Override\("Caption"\)/Override("Name")/'
must_complain check_schema "has Tovexa_PlexorBattery 0 times" cim/schema/Tovexa_Plexor.mof \
    '/Battery/d'
must_complain check_schema "Tovexa_PlexorBatter is not served" \
    cim/schema/registration/PlexorProvider.section 's/Battery\]/Batter]/'
must_complain check_schema "PlexorProvider.plain: has Tovexa_PlexorController 0 times" \
    cim/schema/registration/PlexorProvider.plain 's/(Controller .*) instance/\1 method/'
must_complain check_schema "PlexorProviderModule.mof: has Tovexa_PlexorStorageExtent 0 times" \
    cim/schema/registration/PlexorProviderModule.mof 's/= "Tovexa_PlexorStorageExtent"/= ""/'

# What the provider logs: at a call, in a template, in a choice, in a header.
must_complain check_messages "no meaning for: A new line" cim/plexor/PlexorProviderIfcKeys.cpp \
    's/"malloc failure/"A new line/'
must_complain check_messages "no meaning for: %s: looking at" \
    cim/plexor/PlexorProviderCfgLookup.cpp 's/"%s: checking/"%s: looking at/'
must_complain check_messages "no meaning for: NULL DeviceId for" \
    cim/plexor/PlexorProviderCfgBuild.cpp 's/NULL DeviceID for/NULL DeviceId for/'
must_complain check_messages "locker %p, skipped" cim/plexor/PlexorProviderCfgReconcile.cpp \
    's/locker %p, skip"/locker %p, skipped"/'
must_complain check_messages "no meaning for: strdup failed" cim/plexor/PlexorProvider.h \
    's/"strdup\(\) failed/"strdup failed/'
must_complain check_messages "not what the sources give" cim/plexor/PlexorProviderIfcServe.cpp \
    's/LOG_ERR, "Object path/LOG_INFO, "Object path/'
must_complain check_messages "not what the sources give" cim/plexor/PlexorProviderCfgRecords.cpp \
    's/LogRemovedFromController/LogRemoval/'
must_complain check_messages "unknown priority" cim/plexor/PlexorProviderIfcServe.cpp \
    's/LOG_ERR, "Object path/priority, "Object path/'
must_complain check_messages "no text found in" cim/plexor/PlexorProviderIfcKeys.cpp \
    's/"malloc failure\\n"/texts.Of(3)/'

# What the catalogue says.
must_complain check_messages "not what the sources give" docs/messages.md 's/^## Debug/## Chatter/'
must_complain check_messages "no meaning for: malloc failure" docs/messages.meanings \
    '/^malloc failure/,+1d'
must_complain check_messages "sources do not have: An old line" docs/messages.meanings \
    's/^malloc failure/An old line/'
must_complain check_messages "twice: malloc failure" docs/messages.meanings \
    's/^List %p is empty/malloc failure/'

# Locks that are taken no more, given back too soon, or taken twice.
must_complain check_locks "requires holding mutex 'ctrl->CtrlMutex'" \
    cim/plexor/PlexorProviderCfgRecords.cpp '/Held to the end/,+1d'
must_complain check_locks "requires holding mutex 'PlexorThreadMutex'" \
    cim/plexor/PlexorProviderCfgInventory.cpp \
    '/^bool InventoryDone/,/^}/{/MutexGuard/d}'
must_complain check_locks "requires holding mutex 'ctrl->CtrlMutex'" \
    cim/plexor/PlexorProviderIfcServe.cpp 's/^    EntriesWithId entries/    lock.Unlock();\n&/'
must_complain check_locks "cannot call function 'StampTime' while mutex 'ctrl->CtrlMutex' is held" \
    cim/plexor/PlexorProviderCfgDiskUpdate.cpp 's/^        StampTime/        const MutexGuard lock(ctrl->CtrlMutex);\n&/'

# What has grown too long.
lines=$(printf '    ;\\n%.0s' {1..40})
must_complain check_size "46 lines, at most 40: void RequestStop() {" \
    cim/plexor/PlexorProviderUtilLife.cpp "s/^void RequestStop\(\) \{/&\n$lines/"
must_complain check_size "41 lines, at most 40: CallScope() {" cim/plexor/PlexorProviderLock.h \
    "s/^class PLEXOR_SCOPED_LOCK MutexGuard \{/class Scope {\n    CallScope() {\n${lines%    ;\\n}    }\n};\n&/"
must_complain check_size "PlexorProviderUtilLife.cpp: 4" cim/plexor/PlexorProviderUtilLife.cpp \
    "1s/^/$(printf '\\n%.0s' {1..400})/"

# What nobody says in its first line.
must_complain check_size "PlexorProviderUtilLife.cpp: does not begin with a comment" \
    cim/plexor/PlexorProviderUtilLife.cpp '/^\/\/ Which life/d'

fresh_copy
file=cim/plexor/PlexorProviderCfgRecords.cpp
if ! check_schema || ! check_messages || ! check_size || ! check_locks; then
    echo "FAIL: the unchanged copy is refused"
    failures=$((failures + 1))
fi
[ $failures = 0 ] || exit 1
echo "checks fail when they should: $cases cases, fine"
