"""Signs a user on from Python.

    sign_on.py SERVER LOGIN PASSWORD
"""

import sys

import qvsa

place, login, password = (sys.argv[1], "QVApp"), sys.argv[2], sys.argv[3]

user = qvsa.User(*place)
try:
    user.loginAuth(login, "a guess")
except qvsa.Failure as failure:
    print(failure)
ok, session = user.loginAuth(login, password)
print(user.Name, "is signed on, session", session)

with qvsa.Sessions(*place) as sessions:
    for each in sessions:
        print(each.UserLogin, each.BeginTime)
    sessions.Terminate(session)
