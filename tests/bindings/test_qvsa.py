"""The Python package on an installation of its own. QVSA_CONSOLE names the console, QVSA_LIBRARY the C interface."""

import inspect
import os
import subprocess
import tempfile
import threading
import unittest
from datetime import date, datetime, time, timedelta, timezone
from pathlib import Path

import qvsa
from qvsa import stubs

WRONG_PASSWORD = qvsa.number(0x80040452)


def setUpModule():
    folder = tempfile.TemporaryDirectory(dir="/dev/shm" if os.path.isdir("/dev/shm") else None)
    unittest.addModuleCleanup(folder.cleanup)
    command = [os.environ["QVSA_CONSOLE"], "init", f"{folder.name}/installation"]
    subprocess.run(command, input="Start-1\nStart-2\n", text=True, check=True, capture_output=True)
    global place
    place = (f"file:{folder.name}/installation", "QVApp")


def add_user(login, name):
    user = qvsa.User(*place)
    user.Login, user.Name, user.Pwd = login, name, "right"
    user.Save(passPwdCheck=True)
    return user


class Road(unittest.TestCase):
    def test_a_user_signs_on_and_shows_in_the_lists(self):
        sales = qvsa.Department(*place)
        sales.Id, sales.Name, sales.Super = "S1", "Sales", "_root"
        sales.Save()
        user = qvsa.User(*place)
        user.Login, user.Name, user.Pwd, user.synLogin = "ann", "Änn 李 😀", "right", True
        user.setDept(sales)
        user.Save(passPwdCheck=True)
        self.assertEqual(repr(user), f"<qvsa.User Id={user.Id} Name='Änn 李 😀'>")

        ok, session = user.loginAuth("ann", "right", hostName="pc1")
        self.assertIs(ok, True)
        sessions = qvsa.Sessions(*place)
        self.assertIn("ann", [each.UserLogin for each in sessions])
        self.assertEqual(sessions[session].Computer, "pc1")
        self.assertIn(1, sessions)
        sessions.Terminate(session)
        sessions.GetAll()
        for index, error in (session, KeyError), (0, IndexError), (99, IndexError):
            with self.assertRaises(error):
                sessions[index]
            self.assertNotIn(index, sessions)

        users = qvsa.Users(*place)
        self.assertIsNone(users.GetDataMember("users"))
        self.assertEqual(users.GetList(sales.InnerId), 1)
        captions, row = users.GetDataMember("users")
        self.assertEqual((captions[1], row[1:5]), ("userid", (user.Id, "Änn 李 😀", "ann", "Sales")))

    def test_a_failure_is_raised_unless_asked_otherwise_and_a_question_answered(self):
        user = add_user("ben", "Ben")
        with self.assertRaises(qvsa.Failure) as caught:
            user.loginAuth("ben", "wrong")
        self.assertEqual((caught.exception.number, caught.exception.text), (WRONG_PASSWORD, user.errDescription))
        self.assertEqual(str(caught.exception), f"{user.errDescription} (0x80040452)")
        self.assertEqual(user.loginAuth("ben", "wrong", check=False), (False, ""))
        self.assertIs(user.loginAuth("ben", "right")[0], True, "with the number of the last failure still there")
        self.assertEqual(qvsa.User(*place).GetOne(3, "nobody", check=False), (False, False))
        self.assertEqual(qvsa.Role(*place).GetJobIdOfTheDept("1", check=False), 0)

        rule = qvsa.safeRule(*place)
        rule.GetOne()
        rule.minLen, rule.maxDay = 30, 0
        rule.Save()
        self.assertIs(rule.checkPwd("short"), False)
        self.assertIsNone(qvsa.Users(*place).Item(1))

        # What the library itself raises is raised in any case.
        with self.assertRaises(qvsa.Failure):
            qvsa.QVAgent("file:/nowhere")
        roles = qvsa.Roles()
        roles.Add(1, "Clerk")
        with self.assertRaises(qvsa.Failure) as caught:
            roles.Add(2, "clerk")
        self.assertEqual(caught.exception.number, 457)

    def test_arguments_by_reference_come_back_as_a_tuple(self):
        user, chief = add_user("fay", "Fay"), add_user("gus", "Gus")
        user.setManager(2, userId=chief.Id)
        self.assertEqual(user.getManager(), (True, 2, 0, chief.Id))
        self.assertEqual([each.Name for each in chief.getSubUsers()], ["Fay"])

        log = qvsa.LogRecords(*place)
        log.Add(user.Id, 2, "Report", "Printed")
        today = datetime.now().replace(hour=0, minute=0, second=0, microsecond=0)
        back = log.GetLogByQuery([today, today - timedelta(days=3), "", "Fay", "", ""], LogType=2, app=2)
        self.assertEqual(back, (True, [today, qvsa.NO_DATE, "", "Fay", "", ""]))
        self.assertEqual([(each.operator, each.description) for each in log], [("Fay", "Printed")])
        captions, row = log.recordset
        self.assertEqual((len(captions), row[6]), (12, "Printed"))


class Values(unittest.TestCase):
    def test_moments_come_back_to_the_millisecond(self):
        schedule = qvsa.cSchedule()
        moments = [
            datetime(2024, 2, 29, 23, 59, 59, 999000),
            datetime(1899, 12, 29, 6, 0),
            datetime(1753, 1, 1, 0, 0, 0, 1000),
            datetime(100, 1, 1),
            datetime(9999, 12, 31, 12),
            qvsa.NO_DATE,
        ]
        for moment in moments:
            schedule.StartTime = moment
            self.assertEqual(schedule.StartTime, moment)
        schedule.StartTime = time(10, 30)
        self.assertEqual(schedule.StartTime, datetime(1899, 12, 30, 10, 30))
        schedule.timesOneDay = 1
        self.assertEqual(schedule.GetNextTime(date(2024, 2, 29)), datetime(2024, 2, 29, 10, 30))
        with self.assertRaises(TypeError):
            schedule.StartTime = datetime.now(timezone.utc)

    def test_what_does_not_fit_is_refused(self):
        rule, role = qvsa.safeRule(), qvsa.Role()
        for value in "5", 5.5, None, 1 << 15, [5], object():
            with self.assertRaises(TypeError, msg=value):
                rule.minLen = value
        with self.assertRaises(OverflowError):
            rule.minLen = 1 << 40
        with self.assertRaises(UnicodeEncodeError):
            role.Name = "\ud800"
        for call in (
            lambda: role.GetOne(1),
            lambda: role.GetOne(1, 2, 3),
            lambda: role.GetOne(1, 2, keyName=1),
            lambda: role.GetOne(1, key=2),
            lambda: qvsa.DBMgr("file:/nowhere"),
            lambda: qvsa.User().setDept(role),
        ):
            with self.assertRaises((TypeError, AttributeError)):
                call()
        for wrong in (lambda: setattr(role, "Nmae", 1), lambda: setattr(role, "builtIn", True), lambda: role.name):
            with self.assertRaises(AttributeError):
                wrong()
        role.Name = "with a \0 in it"
        self.assertEqual(role.Name, "with a \0 in it")
        self.assertEqual(qvsa.cCRC32().GetByteArrayCrc32(b"123456789"), 0xCBF43926 - (1 << 32))

    def test_objects_are_shared_and_let_go(self):
        with qvsa.BKPlan() as plan:
            schedule = plan.schedule
            schedule.cycle = 2
        self.assertEqual(schedule.cycle, 2)
        self.assertEqual(repr(plan), "<qvsa.BKPlan, closed>")
        with self.assertRaises(ValueError):
            plan.Save()
        with self.assertRaises(ValueError):
            next(iter(closed(qvsa.Users())))
        other = qvsa.BKPlan()
        other.schedule = schedule
        self.assertEqual(other.schedule.cycle, 2)
        other.schedule = None
        self.assertEqual(other.schedule.cycle, 0)

    def test_objects_in_several_threads(self):
        failures = []

        def work():
            try:
                for _ in range(200):
                    roles = qvsa.Roles()
                    roles.Add(1, "Clerk")
                    failures.extend(each.Name for each in roles if each.Name != "Clerk")
            except Exception as failure:
                failures.append(failure)

        threads = [threading.Thread(target=work) for _ in range(4)]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join()
        self.assertEqual(failures, [])


def closed(thing):
    thing.close()
    return thing


class Stubs(unittest.TestCase):
    def test_the_types_are_those_of_the_library(self):
        path = Path(inspect.getfile(qvsa)).with_suffix(".pyi")
        self.assertEqual(path.read_text(), "\n".join(stubs.lines()), "python3 -m qvsa.stubs writes them anew")


if __name__ == "__main__":
    unittest.main()
