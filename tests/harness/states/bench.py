"""The device states the benchmark measures, built fresh in a scratch
directory from the sample device (harness.device.sample).

Each state is a device root plus what puts it back after a kestrel run: a
copy of every entry of var/db that kestrel may change (all but the staged
data sets under var/db/timezone/tz/, which it never touches) and a restore
script that removes those entries and copies them back. The script names
the device's own directory, never /var/db, so it is harmless wherever it
runs.
"""

import os
import shutil
import subprocess

from .. import device, layout

# Every entry of var/db that kestrel writes, replaces or removes, below
# var/db.
CHANGEABLE = tuple(
    path[len("/var/db/") :]
    for path in (
        layout.ZONEINFO_LINK,
        layout.ICUTZ_LINK,
        layout.LOCALTIME_LINK,
        layout.LATEST_LINK,
        layout.VERSION_RECORD,
        layout.NEEDS_CLEANUP,
        layout.LEGACY_ICUTZ_LINK,
        layout.LEGACY_ICU,
    )
)
# The ICU data file of a schema that is not the system's.
OTHER_SCHEMA_FILE = layout.icu_data_file("71l")

# The many-entries state: files in subdirectories of the ICU directory, and
# one chain of nested directories, all coming before the data file in the
# directory's own order.
SUBDIRECTORIES = 10
FILES_PER_SUBDIRECTORY = 10000
CHAIN_DEPTH = 100


class State:
    def __init__(self, name, description, release):
        self.name = name
        self.description = description
        self.release = release
        self.update = f"{release}.1.1"
        self.staged = layout.STAGED_DIR + self.update

    def build(self, scratch, template):
        self.directory = os.path.join(scratch, self.name)
        self.device = os.path.join(self.directory, "device")
        self.var_db = os.path.join(self.device, "var", "db")
        os.makedirs(self.directory)
        # Hard links: kestrel never writes into the zone files or the
        # staged data sets, and the links it rewrites are replaced, not
        # written through.
        subprocess.run(["cp", "-al", template, self.device], check=True)
        os.unlink(os.path.join(self.device, layout.rel(layout.LEGACY_ICUTZ_LINK)))
        device.link(
            self.device,
            layout.LOCALTIME_LINK,
            layout.zone_link_target(layout.SAMPLE_ZONE),
        )
        self.shape()
        self.save()

    def make_update_current(self):
        device.link(self.device, layout.ZONEINFO_LINK, self.staged + "/zoneinfo")
        device.link(self.device, layout.ICUTZ_LINK, self.staged + "/icutz")
        device.write(
            self.device, layout.VERSION_RECORD, f"{self.release}.1.0_{self.update}"
        )

    def save(self):
        self.pristine = os.path.join(self.directory, "pristine")
        os.makedirs(os.path.join(self.pristine, "timezone"))
        for entry in CHANGEABLE:
            source = os.path.join(self.var_db, entry)
            if os.path.lexists(source):
                subprocess.run(
                    ["cp", "-a", source, os.path.join(self.pristine, entry)], check=True
                )
        self.restore = os.path.join(self.directory, "restore")
        removals = " ".join(f"'{self.var_db}/{entry}'" for entry in CHANGEABLE)
        with open(self.restore, "w") as script:
            script.write(
                "#!/bin/sh\n# Puts back what kestrel may have "
                "changed on this benchmark device.\nset -e\n"
                f"rm -rf {removals}\n"
                f"exec cp -a '{self.pristine}/.' '{self.var_db}/'\n"
            )
        os.chmod(self.restore, 0o755)

    def outcome_matches(self, before, after, stderr):
        raise NotImplementedError


class CommonStart(State):
    """The current data is the latest staged update: nothing changes."""

    def shape(self):
        self.make_update_current()

    def outcome_matches(self, before, after, stderr):
        return after == before and any(
            "New update not compatible or older version: "
            f"{self.update} vs. {self.update}" in line
            for line in stderr
        )


class FirstAdoption(State):
    """The system partition is current and a newer update is staged."""

    def shape(self):
        pass

    def outcome_matches(self, before, after, stderr):
        return after.get("timezone/zoneinfo") == [
            "link",
            self.staged + "/zoneinfo",
        ] and after.get("timezone/TZVersionDiffRecord") == [
            "file",
            f"{self.release}.1.0_{self.update}",
        ]


class IncompatibleReset(State):
    """The designated update's ICU schema is not the system's."""

    def shape(self):
        icu = os.path.join(self.device, self.staged[1:], "icutz")
        os.rename(
            os.path.join(icu, layout.icu_data_file()),
            os.path.join(icu, OTHER_SCHEMA_FILE),
        )
        self.make_update_current()

    def outcome_matches(self, before, after, stderr):
        return (
            after.get("timezone/zoneinfo") == ["link", layout.SYSTEM_ZONEINFO]
            and "timezone/needs_cleanup" in after
            and any(
                "Symlink points at data incompatible with installed " "system" in line
                for line in stderr
            )
        )


class ManyEntries(CommonStart):
    """The common start, with the update's ICU directory holding many
    entries in subdirectories and a deep chain, ahead of the data file."""

    def shape(self):
        icu = os.path.join(self.device, self.staged[1:], "icutz")
        data_file = layout.icu_data_file()
        kept = self.directories_ahead_of(icu, data_file)
        for name in kept[:SUBDIRECTORIES]:
            self.fill(os.path.join(icu, name))
        chain = os.path.join(icu, kept[SUBDIRECTORIES])
        for _ in range(CHAIN_DEPTH - 1):
            chain = os.path.join(chain, "d")
        os.makedirs(chain)
        self.write_decoy(chain)
        self.make_update_current()

    @staticmethod
    def directories_ahead_of(icu, data_file):
        # The directory's own order is not creation order on every file
        # system: make candidates, keep those that come before the file.
        candidates = [f"sub{number:03d}" for number in range(50 * SUBDIRECTORIES)]
        for name in candidates:
            os.mkdir(os.path.join(icu, name))
        order = os.listdir(icu)
        ahead = order[: order.index(data_file)]
        kept = [name for name in ahead if name in candidates]
        if len(kept) < SUBDIRECTORIES + 1:
            raise RuntimeError(
                f"only {len(kept)} directories come before " f"{data_file} in {icu}"
            )
        for name in set(candidates) - set(kept[: SUBDIRECTORIES + 1]):
            os.rmdir(os.path.join(icu, name))
        return kept

    @staticmethod
    def write_decoy(directory):
        # A data file of another schema below the ICU directory: it never
        # qualifies, wherever the walk meets it.
        with open(os.path.join(directory, OTHER_SCHEMA_FILE), "w") as out:
            out.write("not data at this depth\n")

    def fill(self, directory):
        self.write_decoy(directory)
        for number in range(FILES_PER_SUBDIRECTORY - 1):
            os.close(
                os.open(
                    os.path.join(directory, f"f{number:05d}"),
                    os.O_CREAT | os.O_WRONLY,
                    0o644,
                )
            )


STATES = (
    ("common_start", CommonStart),
    ("first_adoption", FirstAdoption),
    ("incompatible_reset", IncompatibleReset),
    ("many_icu_entries", ManyEntries),
)


def build_states(scratch):
    """Builds every state under scratch (made anew) and returns them."""
    shutil.rmtree(scratch, ignore_errors=True)
    os.makedirs(scratch)
    template = os.path.join(scratch, "template")
    release = device.sample(template)
    states = []
    for name, kind in STATES:
        state = kind(name, " ".join(kind.__doc__.split()), release)
        state.build(scratch, template)
        states.append(state)
    return states


def snapshot(var_db):
    """Every changeable entry of var/db: [kind, link target or content],
    lists so that they compare equal to their JSON form."""
    entries = {}
    for entry in CHANGEABLE:
        path = os.path.join(var_db, entry)
        if os.path.islink(path):
            entries[entry] = ["link", os.readlink(path)]
        elif os.path.isfile(path):
            with open(path, encoding="latin-1") as data:
                entries[entry] = ["file", data.read()]
        elif os.path.isdir(path):
            entries[entry] = ["dir", sorted(os.listdir(path))]
    return entries
