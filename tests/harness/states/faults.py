"""The representative device states of the fault matrix and the crash
points: name, and the scenario whose "before:" tree is that state."""

from .. import scenario

STATES = [
    ("healthy-system-only", "healthy_device_run_is_quiet_and_exits_0"),
    ("current-is-latest", "tz_latest_naming_current_data_warns_on_every_start"),
    ("first-adoption", "first_update_replaces_system_partition_data"),
    ("staged-to-newer-adoption", "newer_update_replaces_staged_data_set"),
    ("incompatible-icu-schema", "incompatible_designated_data_is_reset_to_system"),
    ("update-with-other-icu-schema", "update_with_other_icu_schema_is_refused"),
    ("legacy-migration", "legacy_icutz_link_is_moved_to_present_place"),
    ("old-style-localtime", "localtime_old_style_link_is_corrected"),
    ("missing-localtime", "localtime_missing_is_reset_to_los_angeles"),
    ("tz-latest-regular-file", "tz_latest_regular_file_resets_to_system"),
    (
        "tz-latest-outside-staged",
        "tz_latest_outside_staged_directory_resets_to_system",
    ),
]


def tree(stem):
    return scenario.before_tree(stem)
