'''A ModemManager for the tests, on a private bus: a python-dbusmock template.

Started as
  python3 -m dbusmock --system -t mock_modemmanager.py -p '{"cells": "lte"}'
with DBUS_SYSTEM_BUS_ADDRESS naming the test's bus. It publishes
org.freedesktop.ModemManager1 with an object manager and one modem
(/org/freedesktop/ModemManager1/Modem/0) holding a SIM, a connected bearer on
profile 1 and the 3GPP profiles 1 and 2. The modem's GetCellInfo answers the
cells of the "cells" parameter:
  lte      an LTE serving cell and two LTE neighbours, fully described
  partial  a UMTS serving cell without cell id, scrambling code or levels,
           and a 5G NR neighbour
Parameters: "modem" (default true) adds the modem at the start; "ports"
(default ["ttyUSB0", "wwan0qcdm0"]) are the modem's port names.

The same file, run as a program, drives a running mock:
  python3 mock_modemmanager.py remove-modem | add-modem
'''

import sys

import dbus
import dbus.service

BUS_NAME = 'org.freedesktop.ModemManager1'
MAIN_OBJ = '/org/freedesktop/ModemManager1'
MAIN_IFACE = 'org.freedesktop.ModemManager1'
SYSTEM_BUS = True
IS_OBJECT_MANAGER = True

CONTROL_IFACE = 'org.corvane.MockModemManager'
MODEM_IFACE = 'org.freedesktop.ModemManager1.Modem'
MODEM_3GPP_IFACE = 'org.freedesktop.ModemManager1.Modem.Modem3gpp'
PROFILE_MANAGER_IFACE = 'org.freedesktop.ModemManager1.Modem.Modem3gpp.ProfileManager'
SIM_IFACE = 'org.freedesktop.ModemManager1.Sim'
BEARER_IFACE = 'org.freedesktop.ModemManager1.Bearer'

MODEM_PATH = '/org/freedesktop/ModemManager1/Modem/0'
SIM_PATH = '/org/freedesktop/ModemManager1/SIM/0'
BEARER_PATH = '/org/freedesktop/ModemManager1/Bearer/0'

CELL_TYPE_UMTS = 3
CELL_TYPE_LTE = 5
CELL_TYPE_5GNR = 6
ACCESS_GSM = 1 << 1
ACCESS_UMTS = 1 << 5
ACCESS_LTE = 1 << 14
IP_FAMILY_IPV4 = 1
IP_FAMILY_IPV4V6 = 4
STATE_CONNECTED = 11


def _cells(kind):
    if kind == 'partial':
        return dbus.Array([
            dbus.Dictionary({'cell-type': dbus.UInt32(CELL_TYPE_UMTS), 'serving': dbus.Boolean(True),
                             'operator-id': '26201', 'lac': '2B67', 'uarfcn': dbus.UInt32(10836)}, signature='sv'),
            dbus.Dictionary({'cell-type': dbus.UInt32(CELL_TYPE_5GNR), 'serving': dbus.Boolean(False),
                             'nrarfcn': dbus.UInt32(632628), 'physical-ci': '1F5'}, signature='sv'),
        ], signature='a{sv}')
    return dbus.Array([
        dbus.Dictionary({'cell-type': dbus.UInt32(CELL_TYPE_LTE), 'serving': dbus.Boolean(True),
                         'operator-id': '26201', 'tac': '5A0F', 'ci': '1A2D003', 'physical-ci': '12D',
                         'earfcn': dbus.UInt32(1300), 'rsrp': dbus.Double(-94.5), 'rsrq': dbus.Double(-10.0),
                         'timing-advance': dbus.UInt32(3)}, signature='sv'),
        dbus.Dictionary({'cell-type': dbus.UInt32(CELL_TYPE_LTE), 'serving': dbus.Boolean(False),
                         'physical-ci': '7B', 'earfcn': dbus.UInt32(1300), 'rsrp': dbus.Double(-101.0)},
                        signature='sv'),
        dbus.Dictionary({'cell-type': dbus.UInt32(CELL_TYPE_LTE), 'serving': dbus.Boolean(False),
                         'physical-ci': '1C8', 'earfcn': dbus.UInt32(6300), 'rsrp': dbus.Double(-108.0)},
                        signature='sv'),
    ], signature='a{sv}')


def _add_modem(mock):
    ports = mock.mock_ports
    mock.AddObject(MODEM_PATH, MODEM_IFACE, {
        'Sim': dbus.ObjectPath(SIM_PATH),
        'SimSlots': dbus.Array([dbus.ObjectPath(SIM_PATH)], signature='o'),
        'PrimarySimSlot': dbus.UInt32(1),
        'Bearers': dbus.Array([dbus.ObjectPath(BEARER_PATH)], signature='o'),
        'SupportedCapabilities': dbus.Array([dbus.UInt32(8)], signature='u'),
        'CurrentCapabilities': dbus.UInt32(8),
        'MaxBearers': dbus.UInt32(1),
        'MaxActiveBearers': dbus.UInt32(1),
        'MaxActiveMultiplexedBearers': dbus.UInt32(0),
        'Manufacturer': 'Mock',
        'Model': 'Mock LTE modem',
        'Revision': '1',
        'CarrierConfiguration': '',
        'CarrierConfigurationRevision': '',
        'HardwareRevision': '1',
        'DeviceIdentifier': 'mock-device',
        'Device': '/sys/devices/mock',
        'Physdev': '/sys/devices/mock',
        'Drivers': dbus.Array(['option'], signature='s'),
        'Plugin': 'mock',
        'PrimaryPort': ports[0],
        'Ports': dbus.Array([dbus.Struct((name, dbus.UInt32(3)), signature='su') for name in ports],
                            signature='(su)'),
        'EquipmentIdentifier': '356938035643809',
        'UnlockRequired': dbus.UInt32(1),
        'UnlockRetries': dbus.Dictionary({}, signature='uu'),
        'State': dbus.Int32(STATE_CONNECTED),
        'StateFailedReason': dbus.UInt32(0),
        'AccessTechnologies': dbus.UInt32(ACCESS_LTE),
        'SignalQuality': dbus.Struct((dbus.UInt32(70), dbus.Boolean(True)), signature='ub'),
        'OwnNumbers': dbus.Array(['+491701234567'], signature='s'),
        'PowerState': dbus.UInt32(3),
        'SupportedModes': dbus.Array([], signature='(uu)'),
        'CurrentModes': dbus.Struct((dbus.UInt32(0), dbus.UInt32(0)), signature='uu'),
        'SupportedBands': dbus.Array([], signature='u'),
        'CurrentBands': dbus.Array([], signature='u'),
        'SupportedIpFamilies': dbus.UInt32(7),
    }, [
        ('GetCellInfo', '', 'aa{sv}', 'ret = self.mock_cells'),
        ('ListBearers', '', 'ao', 'ret = self.Get("%s", "Bearers")' % MODEM_IFACE),
    ])
    obj = _object(mock, MODEM_PATH)
    obj.mock_cells = _cells(mock.mock_cells_kind)
    obj.AddProperties(MODEM_3GPP_IFACE, {
        'Imei': '356938035643809',
        'RegistrationState': dbus.UInt32(1),
        'OperatorCode': '26201',
        'OperatorName': 'Mock Net',
        'EnabledFacilityLocks': dbus.UInt32(0),
        'EpsUeModeOperation': dbus.UInt32(0),
        'Pco': dbus.Array([], signature='(ubay)'),
        'InitialEpsBearer': dbus.ObjectPath('/'),
        'InitialEpsBearerSettings': dbus.Dictionary({}, signature='sv'),
        'PacketServiceState': dbus.UInt32(2),
        'Nr5gRegistrationSettings': dbus.Dictionary({}, signature='sv'),
    })
    obj.AddMethod(PROFILE_MANAGER_IFACE, 'List', '', 'aa{sv}', 'ret = self.mock_profiles')
    obj.AddProperties(PROFILE_MANAGER_IFACE, {'IndexField': 'profile-id'})
    obj.mock_profiles = dbus.Array([
        dbus.Dictionary({'profile-id': dbus.Int32(1), 'apn': 'internet', 'ip-type': dbus.UInt32(IP_FAMILY_IPV4V6)},
                        signature='sv'),
        dbus.Dictionary({'profile-id': dbus.Int32(2), 'apn': 'ims', 'ip-type': dbus.UInt32(2)}, signature='sv'),
    ], signature='a{sv}')
    # The object manager says so only when told to, once the object has all its interfaces.
    mock.object_manager_emit_added(MODEM_PATH)


def _object(mock, path):
    # pylint: disable=import-outside-toplevel
    import dbusmock.mockobject
    return dbusmock.mockobject.objects[path]


def load(mock, parameters):
    mock.mock_cells_kind = parameters.get('cells', 'lte')
    mock.mock_ports = list(parameters.get('ports', ['ttyUSB0', 'wwan0qcdm0']))
    mock.AddProperties(MAIN_IFACE, {'Version': '1.20.4'})
    mock.AddMethod(MAIN_IFACE, 'ScanDevices', '', '', '')
    mock.AddObject(SIM_PATH, SIM_IFACE, {
        'Active': dbus.Boolean(True),
        'SimIdentifier': '89490200001234567890',
        'Imsi': '262011234567890',
        'Eid': '',
        'OperatorIdentifier': '26201',
        'OperatorName': 'Mock Net',
        'EmergencyNumbers': dbus.Array(['112'], signature='s'),
        'PreferredNetworks': dbus.Array([
            dbus.Struct(('26201', dbus.UInt32(ACCESS_LTE | ACCESS_UMTS | ACCESS_GSM)), signature='su'),
            dbus.Struct(('23410', dbus.UInt32(ACCESS_GSM)), signature='su'),
        ], signature='(su)'),
        'Gid1': dbus.Array([], signature='y'),
        'Gid2': dbus.Array([], signature='y'),
        'SimType': dbus.UInt32(1),
        'EsimStatus': dbus.UInt32(0),
        'Removability': dbus.UInt32(1),
    }, [])
    mock.AddObject(BEARER_PATH, BEARER_IFACE, {
        'Interface': 'wwan0',
        'Connected': dbus.Boolean(True),
        'ConnectionError': dbus.Struct(('', ''), signature='ss'),
        'Suspended': dbus.Boolean(False),
        'Multiplexed': dbus.Boolean(False),
        'Ip4Config': dbus.Dictionary({'method': dbus.UInt32(2), 'address': '10.64.12.7', 'prefix': dbus.UInt32(30),
                                      'gateway': '10.64.12.6', 'dns1': '10.0.0.53'}, signature='sv'),
        'Ip6Config': dbus.Dictionary({'method': dbus.UInt32(2), 'address': '2001:db8:7::2',
                                      'prefix': dbus.UInt32(64)}, signature='sv'),
        'Stats': dbus.Dictionary({}, signature='sv'),
        'ReloadStatsSupported': dbus.Boolean(False),
        'IpTimeout': dbus.UInt32(20),
        'BearerType': dbus.UInt32(1),
        'ProfileId': dbus.Int32(1),
        'Properties': dbus.Dictionary({'apn': 'internet', 'ip-type': dbus.UInt32(IP_FAMILY_IPV4V6)}, signature='sv'),
    }, [])
    mock.object_manager_emit_added(SIM_PATH)
    mock.object_manager_emit_added(BEARER_PATH)
    if parameters.get('modem', True):
        _add_modem(mock)


@dbus.service.method(CONTROL_IFACE, in_signature='', out_signature='')
def RemoveModem(self):
    self.object_manager_emit_removed(MODEM_PATH)
    self.RemoveObject(MODEM_PATH)


@dbus.service.method(CONTROL_IFACE, in_signature='', out_signature='')
def AddModem(self):
    _add_modem(self)


def _control(command):
    bus = dbus.SystemBus()
    manager = bus.get_object(BUS_NAME, MAIN_OBJ)
    if command == 'remove-modem':
        manager.RemoveModem(dbus_interface=CONTROL_IFACE)
    elif command == 'add-modem':
        manager.AddModem(dbus_interface=CONTROL_IFACE)
    else:
        sys.exit('unknown command ' + command)


if __name__ == '__main__':
    _control(sys.argv[1])
