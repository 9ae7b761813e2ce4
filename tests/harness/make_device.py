"""Builds the sample device in DEVICE_ROOT (made anew) from the bundled tz
2025b release (tests/data/tz-releases), compiled with zic:

  usr/share/zoneinfo.default      the system partition's zone files and zone
                                  tables, with +VERSION naming the release
  usr/share/icu/icutzformat.txt   the system's ICU schema
  var/db/timezone/tz/<release>.1.1
                                  a staged update: a re-release of the same
                                  data, newer than the system's <release>.1.0
  var/db/timezone/zoneinfo        designates the system partition
  var/db/timezone/tz_latest       names the staged update
  var/db/timezone/localtime       of the old style, into /usr/share/zoneinfo
  var/db/icutz                    the ICU link of the older layout

    python3 -m harness.make_device DEVICE_ROOT [ZONE]   (default Europe/Paris)
"""

import argparse

from . import device, layout


def main():
    parser = argparse.ArgumentParser(
        description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter
    )
    parser.add_argument("root", metavar="DEVICE_ROOT")
    parser.add_argument("zone", nargs="?", default=layout.SAMPLE_ZONE)
    options = parser.parse_args()
    device.sample(options.root, options.zone)


if __name__ == "__main__":
    main()
