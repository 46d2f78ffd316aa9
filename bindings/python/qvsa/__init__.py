"""QVSa, the administrative library of a report server.

    import qvsa

    user = qvsa.User("file:/var/lib/qvsa", "QVApp")
    ok, session = user.loginAuth("ann", password)
    for each in qvsa.Sessions("file:/var/lib/qvsa"):
        print(each.UserLogin, each.BeginTime)

The classes, their properties and operations are those of the library, by the names of its headers, which tell what they
do. A class is made with what its ``connect`` takes, or with nothing.

An operation that fails raises ``Failure``; with ``check=False`` it gives its negative result instead, and ``errNumber``
and ``errDescription`` tell why. A question (``checkPwd``, ``Item``) gives its answer, and where an empty answer may mean
both nothing and failure, as that of ``getAcl``, it is given too.

Arguments that the library takes by reference come back behind the result, in a tuple. Dates are ``datetime`` without a
time zone, ``NO_DATE`` is the library's mark for none, and a bare time lies on 1899-12-30. None is Null, no object, and
an argument left out. A record set is a list of tuples, the names of the columns first; None where it is closed.

An object is for one thread at a time. It is let go at its end, by ``close`` or by ``with``.
"""

from datetime import datetime

from . import _library
from ._classes import Collection, Object, classes as _classes, enumerations as _enumerations
from ._failure import Failure, number

NO_DATE = datetime(1900, 1, 1)
__version__ = _library.version().decode()

globals().update(_classes, **_enumerations)
__all__ = ["NO_DATE", "Collection", "Failure", "Object", "number", *_classes, *_enumerations]
