#include "zoneinfo64/icu_compat.h"

std::string_view icu_compat_source() {
  // Java's three-letter IDs from JDK 1.1, which ICU resolves for programs
  // that still pass them. Canada/East-Saskatchewan (withdrawn in tz 2017c)
  // and US/Pacific-New (withdrawn in 2020b) stay resolvable for old stored
  // settings. Etc/Unknown is the zone ICU gives for an ID it does not know
  // (CLDR's unknown zone). The SystemV zones left the tz data in 2020b; ICU
  // keeps the copies it made when zic's output began at the 32-bit limit
  // (1901-12-13 UT), so their rules start with 1902 here.
  return R"(
Link Australia/Darwin ACT
Link Australia/Sydney AET
Link America/Argentina/Buenos_Aires AGT
Link Africa/Cairo ART
Link America/Anchorage AST
Link America/Sao_Paulo BET
Link Asia/Dhaka BST
Link Africa/Maputo CAT
Link America/St_Johns CNT
Link America/Chicago CST
Link Asia/Shanghai CTT
Link Africa/Nairobi EAT
Link Europe/Paris ECT
Link America/Indiana/Indianapolis IET
Link Asia/Kolkata IST
Link Asia/Tokyo JST
Link Pacific/Apia MIT
Link Asia/Yerevan NET
Link Pacific/Auckland NST
Link Asia/Karachi PLT
Link America/Phoenix PNT
Link America/Puerto_Rico PRT
Link America/Los_Angeles PST
Link Pacific/Guadalcanal SST
Link Asia/Ho_Chi_Minh VST
Link America/Regina Canada/East-Saskatchewan
Link America/Los_Angeles US/Pacific-New
Zone Etc/Unknown 0 - Unknown
Rule SystemV 1902 1973 - Apr lastSun 2:00 1:00 D
Rule SystemV 1902 1973 - Oct lastSun 2:00 0 S
Rule SystemV 1974 only - Jan 6 2:00 1:00 D
Rule SystemV 1974 only - Nov lastSun 2:00 0 S
Rule SystemV 1975 only - Feb 23 2:00 1:00 D
Rule SystemV 1975 only - Oct lastSun 2:00 0 S
Rule SystemV 1976 max - Apr lastSun 2:00 1:00 D
Rule SystemV 1976 max - Oct lastSun 2:00 0 S
Zone SystemV/AST4 -4:00 - AST
Zone SystemV/AST4ADT -4:00 SystemV A%sT
Zone SystemV/EST5 -5:00 - EST
Zone SystemV/EST5EDT -5:00 SystemV E%sT
Zone SystemV/CST6 -6:00 - CST
Zone SystemV/CST6CDT -6:00 SystemV C%sT
Zone SystemV/MST7 -7:00 - MST
Zone SystemV/MST7MDT -7:00 SystemV M%sT
Zone SystemV/PST8 -8:00 - PST
Zone SystemV/PST8PDT -8:00 SystemV P%sT
Zone SystemV/YST9 -9:00 - YST
Zone SystemV/YST9YDT -9:00 SystemV Y%sT
Zone SystemV/HST10 -10:00 - HST
)";
}

const std::map<std::string, std::string, std::less<>>& icu_compat_regions() {
  // The countries these names had in zone.tab before the tz data made them
  // links into other countries' zones; ICU keeps them. Iceland, though,
  // ICU places with the zone it links to (Africa/Abidjan), not with its
  // former target Atlantic/Reykjavik.
  static const std::map<std::string, std::string, std::less<>> regions = {
      {"Africa/Timbuktu", "ML"},
      {"America/Coral_Harbour", "CA"},
      {"Antarctica/South_Pole", "AQ"},
      {"Atlantic/Jan_Mayen", "SJ"},
      {"Iceland", "CI"},
      {"Pacific/Johnston", "UM"},
      {"Pacific/Yap", "FM"},
  };
  return regions;
}
