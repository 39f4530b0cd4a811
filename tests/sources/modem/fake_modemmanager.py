'''A fake ModemManager 1.20 for the modem source's tests (a python3-dbusmock template).

Parameters (JSON, all optional):
  scenario   "mbim" (default): an LTE modem with cell info, two neighbours, a bearer, a SIM;
             "at": an LTE modem whose GetCellInfo is Unsupported and whose Lte has rsrp and
             rsrq only; "malformed": wrong types and malformed strings in every dictionary;
             "refusing": Signal.Setup and GetCellInfo refused for want of authorisation;
             "slow": as "mbim", but GetCellInfo answers only after "delay" seconds
  modem      false: ModemManager runs without a modem
  rsrp       the LTE RSRP the modem reports (default -97.0)
  delay      how long the slow GetCellInfo takes (default 3.0 seconds)

Mock methods (org.freedesktop.DBus.Mock): AddModem(scenario, index), RemoveModem(index),
SetLteRsrp(rsrp), Stall(seconds): the service answers nothing for that long, from just after
this call returns.
'''

import time

import dbus

from dbusmock import MOCK_IFACE, mockobject

BUS_NAME = 'org.freedesktop.ModemManager1'
MAIN_OBJ = '/org/freedesktop/ModemManager1'
MAIN_IFACE = 'org.freedesktop.ModemManager1'
SYSTEM_BUS = True
IS_OBJECT_MANAGER = True

MODEM = 'org.freedesktop.ModemManager1.Modem'
MODEM_3GPP = 'org.freedesktop.ModemManager1.Modem.Modem3gpp'
SIGNAL = 'org.freedesktop.ModemManager1.Modem.Signal'
LOCATION = 'org.freedesktop.ModemManager1.Modem.Location'
SIM = 'org.freedesktop.ModemManager1.Sim'
BEARER = 'org.freedesktop.ModemManager1.Bearer'

ACCESS_LTE = 0x4000
SETTINGS = {'rsrp': -97.0, 'delay': 3.0}


def sv(values):
    return dbus.Dictionary(values, signature='sv')


def unsupported(_self):
    raise dbus.exceptions.DBusException(
        'Cell info retrieval not supported', name='org.freedesktop.ModemManager1.Error.Core.Unsupported')


def access_denied(_self, *_args):
    raise dbus.exceptions.DBusException(
        'Not authorized to control the device', name='org.freedesktop.DBus.Error.AccessDenied')


def signal_setup(self, rate):
    self.UpdateProperties(SIGNAL, {'Rate': dbus.UInt32(rate)})


def mbim_cells(_self):
    return dbus.Array([
        sv({'cell-type': dbus.UInt32(5), 'serving': True, 'operator-id': '26201', 'tac': '1A2B',
            'ci': '1A2B3C4', 'physical-ci': '12F', 'earfcn': dbus.UInt32(1300),
            'rsrp': SETTINGS['rsrp'], 'rsrq': -10.0, 'timing-advance': dbus.UInt32(3)}),
        sv({'cell-type': dbus.UInt32(5), 'serving': False, 'physical-ci': '130',
            'earfcn': dbus.UInt32(1300), 'rsrp': -103.0, 'rsrq': -12.5}),
        sv({'cell-type': dbus.UInt32(5), 'serving': False, 'physical-ci': '76',
            'earfcn': dbus.UInt32(6300), 'rsrp': -110.0, 'rsrq': -15.0}),
    ], signature='a{sv}')


def slow_cells(self):
    time.sleep(SETTINGS['delay'])
    return mbim_cells(self)


def malformed_cells(_self):
    return dbus.Array([
        sv({'cell-type': dbus.UInt32(5), 'serving': True, 'tac': 'zz', 'ci': dbus.UInt32(5),
            'physical-ci': 'XYZ', 'earfcn': 'abc', 'rsrp': 'strong', 'rsrq': 99.0}),
        sv({'cell-type': dbus.UInt32(5), 'serving': 'yes', 'physical-ci': '-1',
            'earfcn': dbus.UInt32(4000000), 'rsrp': -500.0}),
        sv({'cell-type': 'lte', 'serving': False}),
        sv({'cell-type': dbus.UInt32(3), 'serving': False, 'uarfcn': dbus.Int32(-3),
            'psc': dbus.UInt32(9999), 'rscp': float('nan'), 'lac': 'G0'}),
        sv({'cell-type': dbus.UInt32(2), 'serving': False, 'arfcn': 'sixty',
            'base-station-id': 'QQ', 'rx-level': dbus.UInt32(200)}),
    ], signature='a{sv}')


def good_location(_self):
    return dbus.Dictionary({dbus.UInt32(1): dbus.String('262,01,2C,4D2,1A2B', variant_level=1)},
                           signature='uv')


def malformed_location(_self):
    return dbus.Dictionary({dbus.UInt32(1): dbus.String('262,01,QQ,,', variant_level=1)},
                           signature='uv')


def lte_signal(scenario):
    if scenario == 'at':
        return sv({'rsrp': SETTINGS['rsrp'], 'rsrq': -11.0})
    if scenario == 'malformed':
        return sv({'rsrp': 'strong', 'rsrq': -500.0, 'snr': 13.5, 'rssi': dbus.UInt32(7)})
    return sv({'rsrp': SETTINGS['rsrp'], 'rsrq': -10.0, 'snr': 13.5, 'rssi': -70.0})


def add_modem(mock, scenario, index):
    path = f'{MAIN_OBJ}/Modem/{index}'
    sim_path = f'{MAIN_OBJ}/SIM/{index}'
    bearer_path = f'{MAIN_OBJ}/Bearer/{index}'
    malformed = scenario == 'malformed'
    mock.AddObject(path, MODEM, {
        'Manufacturer': 'Pyxon Test',
        'Model': {'mbim': 'MBIM LTE', 'at': 'AT LTE'}.get(scenario, scenario),
        'Plugin': 'generic',
        'State': dbus.Int32(11),
        'Sim': dbus.ObjectPath(sim_path),
        'Bearers': dbus.Array([dbus.ObjectPath(bearer_path)], signature='o'),
        'AccessTechnologies': 'lte' if malformed else dbus.UInt32(ACCESS_LTE),
        'SignalQuality': dbus.Struct((dbus.UInt32(70), True), signature='ub'),
    }, [])
    modem = mockobject.objects[path]
    cells = {'mbim': mbim_cells, 'slow': slow_cells, 'malformed': malformed_cells}.get(
        scenario, unsupported)
    if scenario == 'refusing':
        cells = access_denied
    modem.AddMethods(MODEM, [('GetCellInfo', '', 'aa{sv}', cells)])
    modem.AddProperties(MODEM_3GPP, {
        'Imei': '350000000000001',
        'OperatorCode': '26x01' if malformed else '26201',
        'OperatorName': 'Pyxon Net',
        'RegistrationState': 'home' if malformed else dbus.UInt32(1),
    })
    modem.AddProperties(SIGNAL, {
        'Rate': dbus.UInt32(0),
        'Lte': lte_signal(scenario),
        'Umts': sv({'rscp': 'weak', 'ecio': -30.0}) if malformed else sv({}),
        'Gsm': sv({'rssi': 5.0}) if malformed else sv({}),
        'Nr5g': sv({}),
    })
    setup = access_denied if scenario == 'refusing' else signal_setup
    modem.AddMethods(SIGNAL, [('Setup', 'u', '', setup)])
    modem.AddProperties(LOCATION, {'Capabilities': dbus.UInt32(3), 'Enabled': dbus.UInt32(1)})
    location = malformed_location if malformed else good_location
    modem.AddMethods(LOCATION, [('GetLocation', '', 'a{uv}', location)])

    mock.AddObject(sim_path, SIM, {
        'SimIdentifier': '8949ABC' if malformed else '89490200001234567890',
        'Imsi': dbus.UInt32(5) if malformed else '262011234567890',
        'OperatorIdentifier': '26201',
        'OperatorName': 'Pyxon Net',
    }, [])
    mock.AddObject(bearer_path, BEARER, {
        'Connected': True,
        'Interface': 'wwan0',
        'Properties': sv({'apn': dbus.UInt32(3) if malformed else 'internet',
                          'ip-type': dbus.UInt32(9 if malformed else 4)}),
        'Ip4Config': sv({'method': dbus.UInt32(3), 'address': '999.1.1.1' if malformed else '10.64.1.2',
                         'prefix': dbus.UInt32(30), 'dns1': '10.64.0.1', 'dns2': '10.64.0.2',
                         'gateway': '10.64.1.1'}),
        'Ip6Config': sv({'method': dbus.UInt32(3), 'address': '2001:db8::2'}),
    }, [])
    return path


def load(mock, parameters):
    mock.AddMethods(MAIN_IFACE, [('ScanDevices', '', '', ''), ('SetLogging', 's', '', '')])
    mock.AddProperty(MAIN_IFACE, 'Version', '1.20.4')
    for key in ('rsrp', 'delay'):
        if key in parameters:
            SETTINGS[key] = float(parameters[key])
    if parameters.get('modem', True):
        add_modem(mock, parameters.get('scenario', 'mbim'), 0)


@dbus.service.method(MOCK_IFACE, in_signature='su', out_signature='s')
def AddModem(self, scenario, index):
    return add_modem(self, scenario, index)


@dbus.service.method(MOCK_IFACE, in_signature='u', out_signature='')
def RemoveModem(self, index):
    for kind in ('Modem', 'SIM', 'Bearer'):
        path = f'{MAIN_OBJ}/{kind}/{index}'
        if path in mockobject.objects:
            self.RemoveObject(path)


@dbus.service.method(MOCK_IFACE, in_signature='d', out_signature='',
                     async_callbacks=('done', 'failed'))
def Stall(self, seconds, done, failed):
    del failed
    done()
    self.connection.flush()
    time.sleep(seconds)


@dbus.service.method(MOCK_IFACE, in_signature='d', out_signature='')
def SetLteRsrp(self, rsrp):
    SETTINGS['rsrp'] = float(rsrp)
    for path, obj in mockobject.objects.items():
        if path.startswith(f'{MAIN_OBJ}/Modem/') and SIGNAL in obj.props:
            obj.UpdateProperties(SIGNAL, {'Lte': lte_signal('mbim')})
