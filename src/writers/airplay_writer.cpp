// SPDX-License-Identifier: Apache-2.0
#include "writers/airplay_writer.h"

#include "identity/vehicle_identity.h"

#include <fstream>

namespace orvane {

void readVehicleValues(AirplayValues& values) {
    getModelName(values.model);
    getBrandName(values.brand);
    values.rightHandDrive = getRightHandDrive();
}

void writeAirplayHead(std::ostream& file, const AirplayValues& values) {
    file << "# Default name of the accessory if a name is not specified in the user prefs.\n";
    file << "name = CarPlay\n\n";
    file << "# Model of the accessory.\n";
    file << "model = " << values.model << "\n\n";
    file << "# Manufacturer of the accessory.\n";
    file << "manufacturer = Marl Motor Company\n\n";
    file << "# OEM Icon Label\n";
    file << "oemIconLabel = VOXA\n\n";
    file << "# OEM Icon Visibility Setting\n";
    file << "oemIconVisible = 1\n\n";
    file << "# 104x104 OEM Icon png path\n";
    file << "oemIconPath = /fs/mp/etc/" << values.brand << "/oemIcon.png\n\n";
    // From here on every line end flushes, on purpose: the bytes are the same, the writes are not.
    if (values.audioProfile != NO_AUDIO_PROFILE) {
        file << "# audio profile for QWA" << std::endl
             << "audioProfile = " << values.audioProfile << std::endl
             << std::endl;
    }
    // The comment ends in mid-sentence, on purpose.
    file << "# rightHandDrive mode setting right" << std::endl
         << "rightHandDrive = " << values.rightHandDrive << std::endl
         << std::endl;
}

MergeDecision generateAirplayFile(std::istream& templateFile, std::ostream& output,
                                  const AirplayValues& values) {
    const MergeDecision decision = decideMerge(templateFile, output);
    if (decision == MergeDecision::generate) {
        writeAirplayHead(output, values);
        copyBytes(templateFile, output);
    }
    return decision;
}

int updateAirplayConfigFile() {
    AirplayValues values;
    readVehicleValues(values);
    values.audioProfile = getAudioProfile();

    TemplateMerge merge(AIRPLAY_FILE);
    merge.finish(generateAirplayFile(merge.templateFile, merge.output, values));
    return 0;
}

} // namespace orvane
