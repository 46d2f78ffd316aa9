#!/usr/bin/env python3
"""What a call from Python costs. Each is one that does next to nothing in C++ and asks no database, so that its time is
that of the way there and back. Fails where one takes longer than it may. QVSA_LIBRARY names the C interface."""

import sys
import timeit
from datetime import datetime

import qvsa

PROPERTY_LIMIT = 5.0  # microseconds
CALL_LIMIT = 20.0

user = qvsa.User()
user.Name = "Ann Archer"
schedule = qvsa.cSchedule()
schedule.timesOneDay = 1
departments = qvsa.Departments()
for i in range(100):
    departments.Add(f"S{i}", "Sales", InnerId=str(i))
morning = datetime(2024, 3, 7, 10)


def microseconds(work, calls=1):
    """Of the fastest of several rounds: what is above it is the machine's other work."""
    count = 2000 // calls
    return min(timeit.repeat(work, number=count, repeat=7)) / count / calls * 1e6


MEASURED = [
    ("a Long read", PROPERTY_LIMIT, lambda: microseconds(lambda: user.Id)),
    ("a text read", PROPERTY_LIMIT, lambda: microseconds(lambda: user.Name)),
    ("a date read", PROPERTY_LIMIT, lambda: microseconds(lambda: schedule.StartTime)),
    ("a Boolean set", PROPERTY_LIMIT, lambda: microseconds(lambda: setattr(user, "sendSms", True))),
    ("a text set", PROPERTY_LIMIT, lambda: microseconds(lambda: setattr(user, "Name", "Ann Archer"))),
    ("a call with a text", CALL_LIMIT, lambda: microseconds(lambda: user.chkRegPwd("secret"))),
    ("a call with a date, that gives one", CALL_LIMIT, lambda: microseconds(lambda: schedule.GetNextTime(morning))),
    ("an item by its key", CALL_LIMIT, lambda: microseconds(lambda: departments["S7"])),
    ("an item of a walk", CALL_LIMIT, lambda: microseconds(lambda: list(departments), calls=100)),
    ("an object made and let go", CALL_LIMIT, lambda: microseconds(qvsa.Role)),
]

too_slow = 0
print(f"{'From Python':<46} {'measured, us':>14} {'limit, us':>14}")
for name, limit, measure in MEASURED:
    taken = measure()
    too_slow += taken > limit
    print(f"{name:<46} {taken:>14.2f} {limit:>14.1f}")
sys.exit(1 if too_slow else 0)
