"""dbusmock's logind, which also tells when inhibitors come and go.

Each change emits org.zorva.Test.InhibitorsAre with their number.
"""

from dbusmock import mockobject
from dbusmock.templates import logind
from dbusmock.templates.logind import BUS_NAME, MAIN_IFACE, MAIN_OBJ, SYSTEM_BUS  # noqa: F401
from dbusmock.templates.logind import Inhibit, ListInhibitors  # noqa: F401


class Inhibitors(list):
    """What the template keeps them in."""

    def __init__(self, mock):
        super().__init__()
        self.mock = mock

    def append(self, inhibitor):
        super().append(inhibitor)
        self._tell()

    def remove(self, inhibitor):
        super().remove(inhibitor)
        self._tell()

    def _tell(self):
        self.mock.EmitSignal("org.zorva.Test", "InhibitorsAre", "i", [len(self)])


def load(mock, parameters):
    logind.load(mock, parameters)
    mockobject.inhibitors = Inhibitors(mock)
