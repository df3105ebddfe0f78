"""Whether somebody else used the processors while a program ran: then its times say nothing."""
import os
import sys
import time

TRIES = 20
TICK = 1 / os.sysconf("SC_CLK_TCK")
enforced = True  # False: measure whoever else is at work


def busy():
    """Seconds that all processors have worked since the start, those that a hypervisor took included."""
    with open("/proc/stat", encoding="ascii") as stat:
        user, nice, system, _, _, irq, softirq, steal = map(int, stat.readline().split()[1:9])
    return (user + nice + system + irq + softirq + steal) * TICK


def own():
    """Seconds that this process and the children that it waited for have worked."""
    times = os.times()
    return times.user + times.system + times.children_user + times.children_system


def alone(work):
    """The result of work(), of a run in which others used less than a twentieth of a processor."""
    for _ in range(TRIES):
        before, ours, begin = busy(), own(), time.monotonic()
        result = work()
        others = (busy() - before) - (own() - ours)
        if not enforced or others <= 0.05 * (time.monotonic() - begin) + 3 * TICK:
            return result
        time.sleep(1)
    sys.exit("bench: somebody else uses the processors; wait for them, or give --busy")
