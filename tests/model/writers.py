# SPDX-License-Identifier: Apache-2.0
"""The accessory files: a generated head and a template, or a stock file.

Each writer records in `ways` how its outputs came about, so that a series of random units can count
what it has reached.
"""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass

from model import identity, version
from model.streams import InputStream, OutputStream, install_stock
from model.system import System
from model.tuning import audio_profile

PRODUCT = "/fs/mp/etc/"
AIRPLAY = "/tmp/airplay.conf"
DEVICE = "/tmp/iap2_device.cfg"
IAP2 = "/tmp/iap2.cfg"
IAP1 = "/tmp/iap1.cfg"


@dataclass(frozen=True)
class Accessory:
    """The values in the first lines of the three iAP files, except the version."""

    serial: bytes
    model: bytes

    # Rules: IAP-05 to IAP-11, IAP-14
    def block(self, firmware: bytes) -> bytes:
        """Each value ends at its first NUL."""
        return (
            b"# This section is mandatory.  Populate all fields with"
            b" accessory-specific info.\n"
            b"[accessory]\n"
            b"name=VOXA 3\n"
            b"model=" + _to_nul(self.model) + b"\n"
            b"manufacturer=Marl Motor Company\n"
            b"serial=" + _to_nul(self.serial) + b"\n"
            b"firmware_version=" + _to_nul(firmware) + b"\n"
        )


# Rules: IAP-15
def _to_nul(value: bytes) -> bytes:
    return value.split(b"\0", 1)[0]


# Rules: AIR-04 to AIR-20, AIR-22
def airplay_head(model: bytes, brand: bytes, profile: int | None, drive: int) -> bytes:
    head = (
        b"# Default name of the accessory if a name is not specified in the user prefs.\n"
        b"name = CarPlay\n\n"
        b"# Model of the accessory.\n"
        b"model = " + model + b"\n\n"
        b"# Manufacturer of the accessory.\n"
        b"manufacturer = Marl Motor Company\n\n"
        b"# OEM Icon Label\n"
        b"oemIconLabel = VOXA\n\n"
        b"# OEM Icon Visibility Setting\n"
        b"oemIconVisible = 1\n\n"
        b"# 104x104 OEM Icon png path\n"
        b"oemIconPath = /fs/mp/etc/" + brand + b"/oemIcon.png\n\n"
    )
    if profile is not None:
        head += b"# audio profile for QWA\naudioProfile = %d\n\n" % profile
    return head + b"# rightHandDrive mode setting right\nrightHandDrive = %d\n\n" % drive


# Rules: MRG-02, AIR-01 to AIR-03, AIR-21, PRO-06, PRO-08, PRO-10
def write_airplay(system: System, names: Sequence[str], ways: dict[str, str]) -> None:
    model = identity.model_name(system, names)
    brand = identity.brand_name(system)
    drive = identity.right_hand_drive(system)
    profile = audio_profile(system, ways)

    output = OutputStream(system, AIRPLAY)
    template = InputStream(system, PRODUCT + "airplay_static.conf")
    if template.failed or output.failed:
        install_stock(system, PRODUCT + "airplay.conf", AIRPLAY)
        ways[AIRPLAY] = "fallback"
    else:
        output.write(airplay_head(model, brand, profile, drive))
        output.copy(template)
        ways[AIRPLAY] = "generated"
    template.close()
    output.close()


# Rules: MRG-02, IAP-01 to IAP-04, IAP-12, IAP-13, IAP-16, TWO-01 to TWO-04
# Rules: ONE-01 to ONE-11, PRO-11
def write_iap(system: System, names: Sequence[str], ways: dict[str, str]) -> None:
    accessory = Accessory(identity.unit_serial(system), identity.model_name(system, names))
    firmware = version.application_version(system)
    identity.fuel_type(system)

    device_streams = _write_device(system, accessory.block(firmware), ways)

    iap2 = OutputStream(system, IAP2)
    iap2_template = InputStream(system, PRODUCT + "mm/iap2_static.cfg")
    if iap2_template.failed or iap2.failed:
        install_stock(system, PRODUCT + "mm/iap2.cfg", IAP2)
        ways[IAP2] = "fallback"
    else:
        iap2.write(accessory.block(firmware) + b"hardware_version=1.0.0\n\n")
        iap2.copy(iap2_template)
        iap2_template.close()
        iap2.close()
        ways[IAP2] = "generated"

    firmware = version.software_version(system)

    # Whether this file is generated depends on the stage before it, not on its own template.
    iap1 = OutputStream(system, IAP1)
    iap1_template = InputStream(system, PRODUCT + "mm/iap1_static.cfg")
    if iap2.failed or iap1.failed:
        install_stock(system, PRODUCT + "mm/iap1.cfg", IAP1)
        ways[IAP1] = "fallback"
    else:
        iap1.write(accessory.block(firmware))
        iap1.write(b"hardware_version=010000\nrfcert=00000000 \n\n")
        iap1.copy(iap1_template)
        ways[IAP1] = "generated"
    for stream in (iap1_template, iap1, iap2_template, iap2, *device_streams):
        stream.close()


# Rules: DEV-01 to DEV-06
def _write_device(
        system: System, block: bytes, ways: dict[str, str]) -> tuple[InputStream, OutputStream]:
    output = OutputStream(system, DEVICE)
    template = InputStream(system, PRODUCT + "iap2_device_static.cfg")
    if template.failed or output.failed:
        install_stock(system, PRODUCT + "iap2_device.cfg", DEVICE)
        ways[DEVICE] = "fallback"
    else:
        output.write(block + b"hardware_version=1.0.0\n\n")
        output.copy(template)
        output.write(b"\n[vehicle]\nenable=no\n\n")
        template.close()
        output.close()
        ways[DEVICE] = "generated"
    return template, output
