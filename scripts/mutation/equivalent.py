"""Mutants that change nothing that anybody could see, each with the reason."""

import json


class Equivalents:
    """tests/mutants/equivalent.json: groups of {reason, mutants: [{file, before, after}]}. The lines
    are named by what is in them, so that they may move."""

    def __init__(self, path):
        self._reasons = {}
        groups = json.loads(path.read_text()) if path.is_file() else []
        for group in groups:
            for entry in group["mutants"]:
                self._reasons[entry["file"], entry["before"], entry["after"]] = group["reason"]

    def reason(self, mutant):
        """Why the mutant is equivalent; None when it is not known to be."""
        return self._reasons.get(mutant.key())

    def stale(self, mutants):
        """Entries that name no mutant of these: the code has changed, or the entry is wrong."""
        known = {mutant.key() for mutant in mutants}
        return sorted(key for key in self._reasons if key not in known)
