"""Checks that the harness's device layout (harness.layout) is kestrel's:
every fixed path of src/fs/paths.h, the default zone and the name of the
system's ICU format file, read from the sources.

    python3 -m harness.check_layout
"""

import os
import re
import sys

from . import layout, messages

CONSTANT = re.compile(r'constexpr char (k\w+)\[\] = "([^"]*)";')


def constants(file_name):
    """The sources' char-array constants: kZoneinfoLink -> ZONEINFO_LINK."""
    with open(os.path.join(messages.SOURCES, file_name)) as source:
        found = CONSTANT.findall(source.read())
    return {
        re.sub(r"(?<!^)(?=[A-Z])", "_", name[1:]).upper(): value
        for name, value in found
    }


def main():
    paths = constants("fs/paths.h")
    wrong = []
    for name, value in paths.items():
        if getattr(layout, name, None) != value:
            wrong.append(
                f"{name}: paths.h {value!r}, harness {getattr(layout, name, None)!r}"
            )
    derived = {"ICU_FORMAT_FILE"}
    extra = [
        name
        for name, value in vars(layout).items()
        if name.isupper()
        and isinstance(value, str)
        and value.startswith("/")
        and name not in paths
        and name not in derived
    ]
    wrong += [
        f"{name}: a fixed path of the harness that paths.h lacks" for name in extra
    ]
    default_zone = constants("driver/localtime_link.cc").get("DEFAULT_ZONE")
    if default_zone != layout.DEFAULT_ZONE:
        wrong.append(
            f"default zone: kestrel {default_zone!r}, harness {layout.DEFAULT_ZONE!r}"
        )
    format_file = constants("dataset/kal_icu.cc").get("FORMAT_FILE")
    if f"{layout.SYSTEM_ICU}/{format_file}" != layout.ICU_FORMAT_FILE:
        wrong.append(
            f"ICU format file: kestrel {format_file!r}, "
            f"harness {layout.ICU_FORMAT_FILE!r}"
        )
    for line in wrong:
        print(line)
    print(f"{len(paths)} fixed paths compared; {len(wrong)} differences")
    return 1 if wrong or not paths else 0


if __name__ == "__main__":
    sys.exit(main())
