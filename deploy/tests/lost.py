# What became of the calls of several.sh, by the log of their caller:
#
#     lost.py LOG RECORDED KILLED ADDED SETTLED HEAVY DEAD NEW LATE
#
# with the Call-IDs of the legs of all answered calls in the database, the times when a gateway was killed, when another one was added and when that was probed, the addresses of the gateway of
# twice the weight, of the one that was killed and of the one that was added, and by how many seconds more than two probes this
# one may be late. The balancer probes every second.
import collections
import sys

killed, added, settled = map(float, sys.argv[3:6])
heavy, dead, new = sys.argv[6:9]
late = float(sys.argv[9])
placed, up, over = {}, {}, {}
with open(sys.argv[1], encoding="ascii") as log:
    for line in log:
        what, call, _, _, time, *contact = line.split()
        if what == "placed":
            placed[call] = float(time)
        elif what == "up":
            up[call] = (float(time), contact[0])
        else:
            over[call] = float(time)
with open(sys.argv[2], encoding="ascii") as ids:
    recorded = collections.Counter(ids.read().split())

failed = False


def expect(condition, text):
    global failed
    print(("" if condition else "NOT ") + text)
    failed = failed or not condition


lost = [call for call in placed if call not in over]
died = [call for call in lost if call in up and up[call][1] == dead]
unheard = [call for call in lost if call not in up]
print(f"{len(placed)} calls placed, {len(lost)} lost, {len(died)} of them up on the gateway that was killed")
expect(died, "calls were up on the gateway that was killed")
expect(len(died) + len(unheard) == len(lost), "nobody else's call ended")
expect(all(killed - 1 <= placed[call] <= killed + 2 for call in unheard),
       f"{len(unheard)} new calls were lost, none later than two probes")
delays = sorted(up[call][0] - placed[call] for call in up)
print(f"set-up: half of them within {delays[len(delays) // 2]:.3f} s, the slowest {delays[-1]:.3f} s")

delivered = [call for call in over if call in up and (up[call][1] != dead or over[call] < killed - 1)]
expect(all(recorded[call] == 1 for call in delivered),
       f"{len(delivered)} calls are in the database once, also those of the gateway that was killed")

first = min(time for time, contact in up.values() if contact == new)
expect(first <= added + 2 + late, f"a gateway that was added has calls after {first - added:.1f} s: two probes, and {late:.0f} s")
shared = [up[call][1] for call in sorted(up, key=placed.get) if placed[call] > settled][:100]
shares = {contact: shared.count(contact) for contact in sorted(set(shared))}
expect(len(shared) == 100 and abs(shares.get(heavy, 0) - 50) <= 10 and abs(shares.get(new, 0) - 25) <= 10,
       f"a hundred calls are shared out by weights 20, 10 and 10: {shares}")
sys.exit(failed)
