"""Places that the tests do not reach, each with the reason."""

import json
from collections import Counter


class Excuses:
    """tests/coverage/unreached.json: groups of {reason, places: [{file, line, condition, never}]}. A
    line is named by its text, so that it may move; `never` is "true" or "false", or "run" for the
    lines that begin with this one, which has no `condition` then. A place that is there twice is
    named twice."""

    def __init__(self, groups):
        self._reasons = {}
        self._places = Counter()
        for group in groups:
            for place in group["places"]:
                key = place["file"], place["line"], place.get("condition", ""), place["never"]
                self._reasons[key] = group["reason"]
                self._places[key] += 1

    @staticmethod
    def read(path):
        return Excuses(json.loads(path.read_text()) if path.is_file() else [])

    def sort(self, unreached):
        """Tells those apart that have an excuse from those that have none."""
        left = self._places.copy()
        excused, others = [], []
        for place in unreached:
            known = left[place.key()] > 0
            left[place.key()] -= 1
            (excused if known else others).append(place)
        return excused, others

    def stale(self, unreached, reached):
        """(key, what is wrong with it) of each excuse that excuses nothing."""
        needed = Counter(place.key() for place in unreached)
        known = {place.key() for place in reached}
        found = []
        for key, count in sorted(self._places.items()):
            if count > needed[key]:
                found.append((key, "is reached" if key in known else "is no longer there"))
        return found
