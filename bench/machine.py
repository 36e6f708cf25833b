"""The machine that something is measured on, and how much of it others took meanwhile."""

import os
import resource


def model():
    with open("/proc/cpuinfo", encoding="utf-8") as lines:
        return next(line.split(":", 1)[1].strip() for line in lines if line.startswith("model name"))


def processor_seconds():
    """Since the machine started: of all processors together, and of those the busy ones."""
    with open("/proc/stat", encoding="ascii") as lines:
        # user, nice, system, idle, iowait, irq, softirq, steal; what follows is counted in user.
        ticks = [int(field) for field in lines.readline().split()[1:9]]
    tick = os.sysconf("SC_CLK_TCK")
    return sum(ticks) / tick, (sum(ticks) - ticks[3] - ticks[4]) / tick


def own_seconds():
    """Of processors, taken by this process and by the children that it has waited for."""
    usages = (resource.getrusage(who) for who in (resource.RUSAGE_SELF, resource.RUSAGE_CHILDREN))
    return sum(usage.ru_utime + usage.ru_stime for usage in usages)


class Watch:
    """What others take of the processors from the making of it on."""

    def __init__(self):
        self._all, self._busy = processor_seconds()
        self._own = own_seconds()

    def others(self):
        """The part of all processors' time, from 0 to 1."""
        passed, busy = (now - then for now, then in zip(processor_seconds(), (self._all, self._busy)))
        own = own_seconds() - self._own
        return min(max(busy - own, 0) / passed, 1) if passed else 0.0
