# SPDX-License-Identifier: Apache-2.0
"""Points in time as "yyyy-MM-dd HH:mm:ss zzz", for any year."""

import datetime
import math
import zoneinfo

CYCLE_YEARS = 400
CYCLE_SECONDS = 146097 * 86400  # the calendar, weekdays included, repeats after 400 years
FIRST_FAR_SECOND = int(datetime.datetime(2400, 1, 1, tzinfo=datetime.timezone.utc).timestamp())


class Clock:
    def __init__(self, zone="UTC"):
        self.zone = zoneinfo.ZoneInfo(zone)

    def text(self, milliseconds):
        seconds = math.floor(float(milliseconds) / 1000.0)
        # Python's calendar ends with the year 9999: far years are looked up in the cycle that begins with 2400.
        cycles = max(0, (seconds - FIRST_FAR_SECOND) // CYCLE_SECONDS)
        near = datetime.datetime.fromtimestamp(seconds - cycles * CYCLE_SECONDS, self.zone)
        year = near.year + cycles * CYCLE_YEARS
        return "%04d-%s %s" % (year, near.strftime("%m-%d %H:%M:%S"), near.tzname())
