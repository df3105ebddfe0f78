"""Whether another program used the processors while one ran: then its times say nothing."""
import glob
import os
import sys
import time

TRIES = 10
MOST = 0.15  # of a processor, that others may use in the quietest run
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


def kernel():
    """Seconds that the kernel's threads have worked: they bring to the disk what a program writes."""
    ticks = 0
    for path in glob.glob("/proc/[0-9]*/stat"):
        try:
            with open(path, encoding="utf-8", errors="replace") as stat:
                fields = stat.read().rsplit(")", 1)[1].split()
        except OSError:  # it has ended
            continue
        if fields[1] == "2":  # the parent of all of them
            ticks += int(fields[11]) + int(fields[12])
    return ticks * TICK


def alone(work):
    """The result of work(), of a run in which others used less than a twentieth of a processor. Where
    there is none such, because a hypervisor takes that much, the quietest run counts."""
    quietest = None
    for _ in range(TRIES):
        before, ours, begin = busy() - kernel(), own(), time.monotonic()
        result = work()
        others = (busy() - kernel() - before) - (own() - ours)
        wall = time.monotonic() - begin
        if not enforced or others <= 0.05 * wall + 3 * TICK:
            return result
        if quietest is None or others / wall < quietest[0]:
            quietest = (others / wall, result)
        time.sleep(1)
    if quietest[0] > MOST:
        sys.exit("bench: somebody else uses the processors; wait for them, or give --busy")
    print(f"bench: others used {quietest[0]:.0%} of a processor in the quietest run", file=sys.stderr)
    return quietest[1]
