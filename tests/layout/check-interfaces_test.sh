#!/bin/bash
# SPDX-License-Identifier: Apache-2.0
# check-interfaces notices each list that an operation is missing in, in a copy of this tree.
set -euo pipefail

here=$(dirname -- "$(realpath -- "${BASH_SOURCE[0]}")")
folder=$(mktemp -d)
trap 'rm -rf -- "$folder"' EXIT
failures=0

cd -- "$here/../.."
cp -r --parents -- include companion/ITouchCompanionService.cpp managers docs/*-protocol.md \
    simulator/{companion,faults,managers} fuzz/{proxies,simulator}_fuzzer.cpp tools/zelkctl \
    tests/companion tests/managers tests/faults tests/install/consumer "$folder"
cd -- "$folder"

# forget FILE SED-COMMAND [NAMED]: what a contributor may forget; the file is named, or what NAMED says.
forget() {
    cp -- "$1" "$folder/saved"
    sed -i "$2" "$1"
    if cmp -s "$1" "$folder/saved"; then
        echo "there is no '$2' in $1" >&2
        failures=$((failures + 1))
    elif "$here/check-interfaces" "$folder" 2>"$folder/log"; then
        echo "not noticed: '$2' in $1" >&2
        failures=$((failures + 1))
    elif ! grep -q -F "${3:-$1}" "$folder/log"; then
        echo "${3:-$1} is not named: $(<"$folder/log")" >&2
        failures=$((failures + 1))
    fi
    mv -- "$folder/saved" "$1"
}

"$here/check-interfaces" "$folder"
# shellcheck disable=SC2016 # the backquotes are meant
{
    forget simulator/faults/Fault.cpp '/"hand.scan"/d'
    forget docs/binder-protocol.md 's/`Bp::inspect`/`Bp::Inspect`/'
    forget docs/manager-protocol.md 's/`GET_MAXUSER`/`GET_MAX_USER`/'
    forget managers/IHandBiometricManagerService.cpp 's/"SCAN transact received/"scan transact received/'
    forget tools/zelkctl/services/Interfaces.cpp '/{"setAuth"}/d'
    forget tools/zelkctl/services/Interfaces.cpp 's/"isSupported"/"isEnabled"/'
    forget tools/zelkctl/services/Interfaces.cpp 's/"getAFEParams (map)"/"getAFEParams"/'
    forget tools/zelkctl/services/Interfaces.cpp 's/{"unsubscribe", &kGestureClient}/{"unsubscribe"}/'
    forget tools/zelkctl/services/Interfaces.cpp 's/{"getCblk", nullptr, &kMemory}/{"getCblk"}/'
    forget tools/zelkctl/services/Interfaces.cpp 's/{"getCblk", nullptr, &kMemory}/{"getCblk", \&kMemory}/'
    forget tools/zelkctl/conformance/Operations.cpp '/"setSecurity of no level"/d'
    forget tools/zelkctl/conformance/Operations.cpp 's/, 12 renameProfile//'
    forget tests/faults/Operations.cpp '/hand->scan()/d'
    forget tests/faults/Faults_test.cpp '/->pingService/d'
    forget tests/install/consumer/Clients.cpp 's/&C::setAuth/nullptr/'
    forget tools/zelkctl/commands/hand/HandSecurityCommand.cpp 's/setSecurity//' tools/zelkctl
    forget fuzz/proxies_fuzzer.cpp '/deleteGesture/d'
    forget tests/companion/ITouchCompanionService_test.cpp '/Service::setAuth/d'
    forget tests/companion/BnTouchCompanionService_test.cpp 's/{"saveSession", 26/{"saveSession", 99/'
    forget tests/managers/ManagerStubs_test.cpp '/deleteGesture/d'
    forget tests/companion/BasicTouchCompanionService_test.cpp '/service->setAuth/d'
    forget tests/managers/BasicManagers_test.cpp '/service->deleteProfile/d'
    forget simulator/companion/TouchCompanionSimulator.cpp 's/perform("setAuth"/perform("setauth"/'
    forget simulator/companion/TouchCompanionSimulator.cpp 's/ForClient("close"/ForClient("open"/'
    forget simulator/managers/ManagerSimulator.h 's/"unsubscribe"/"subscribe"/' GestureManagerSimulator.cpp
    forget simulator/managers/HandBiometricManagerSimulator.cpp 's/begin("scan"/begin("startMatching"/'
    forget docs/binder-protocol.md 's/| `setAuth` | text |/| `setAuth` | text path |/' fuzz/simulator_fuzzer.cpp
    forget fuzz/simulator_fuzzer.cpp '/{19, true},/d'
}
((failures == 0))
