"""What commands print, as commandtexts.py asks for it."""

CAR = ["-q", "-p", "sim:petrol-can11?instant"]
MODULES = ["-q", "-p", "sim:petrol-can11-modules?instant"]
SIGNALS = """[vehicle]
maker = "Example"
[[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox oil temperature"
header = "7E1"
request = "221E1C"
formula = "(A*256+B)/16"
unit = "°C"
[[signal]]
id = "OFF"
name = "Switched off"
header = "7E1"
request = "221E20"
formula = "A"
enabled = false
reason = "needs session 03"
"""

# Commands, and lines that stand in this order without any between them.
TEXTS = (
    ([*CAR, "--ecu", "7E9", "info"], """Control module 7E9: TCM
  Description    Transmission Control Module
  Standard       EOBD
  Protocol       ISO 15765-4 (CAN 11/500)
  VIN            -
  Calibration    VS-AT6-0111  verification 5D0C77A1
  Engine number  -
  Type approval  -
  With lamp on   -
  Since cleared  -
"""),
    ([*CAR, "codes", "--confirmed", "--permanent"], """Control module 7E8: ECM
  Lamp           on
  Confirmed      2 codes
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1
    P0171  Generic        System Too Lean Bank 1
  Permanent      1 code
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1

Control module 7E9: TCM
  Lamp           off
  Confirmed      none stored
  Permanent      none stored
"""),
    ([*CAR, "codes", "--pending"], """Control module 7E8: ECM
  Lamp           on
  Pending        1 code
    P0300  Generic        Random/Multiple Cylinder Misfire Detected

Control module 7E9: TCM
  Lamp           off
  Pending        none stored
"""),
    ([*CAR, "--ecu", "7E8", "monitors"], """Control module 7E8: ECM
  Monitor tests  1 failed, 6 passed, 1 without result
      Result     Test      Value    Minimum    Maximum  Unit  Description
    01 Exhaust Gas Sensor Monitor Bank 1 - Sensor 1
      failed     05        0.096      0.000      0.080  s     Rich to lean sensor switch time (calculated)
      passed     01        0.450      0.400      0.500  V     Rich to lean sensor threshold voltage (constant)
    02 Exhaust Gas Sensor Monitor Bank 1 - Sensor 2
"""),
    ([*CAR, "monitors"], """
Control module 7E9: TCM
  Monitor tests  no answer
"""),
    ([*CAR, "readiness"], """Control module 7E8: ECM
  Lamp           on
  Readiness      2 monitors not complete
    Monitor                  Since cleared  This driving cycle
    Evaporative System       not complete   disabled this cycle
    Oxygen Sensor            not complete   not complete
    Misfire                  complete       complete
    Fuel System              complete       complete
    Comprehensive Component  complete       complete
    Catalyst                 complete       not complete
    Oxygen Sensor Heater     complete       complete
    EGR and/or VVT System    complete       disabled this cycle
    Not available: Heated Catalyst, Secondary Air System, Gasoline Particulate
    Filter

Control module 7E9: TCM
  Lamp           off
  Readiness      ready
"""),
    ([*CAR, "counters"], """Control module 7E8: ECM
  Counters       12 counters above 0
    OBD Monitoring Conditions Encountered Counts                      412
    Ignition Cycle Counter                                            655
"""),
    ([*CAR, "counters"], """
Control module 7E9: TCM
  Counters       not supported
"""),
    ([*CAR, "freeze"], """Control module 7E8: ECM
  Freeze frame   0
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1
    Fuel system status: Fuel system A        Closed loop (1)
    Fuel system status: Fuel system B        -
"""),
    ([*CAR, "routines"], """Control module 7E8: ECM
  Routine 01     Evaporative system leak test
    This service enables the conditions required to conduct an evaporative
    system leak test, but does not actually run the test. The vehicle
    manufacturer is responsible to determine the criteria to automatically
    stop the test.
  Routine 02     Particulate Filter Regeneration
"""),
    (["-y", *CAR, "routines", "--run", "01"], """Control module 7E8: ECM
  Routine 01     Evaporative system leak test
  Result         accepted
"""),
    (["-y", *CAR, "clear"], "Control module 7E8 ECM: cleared\nControl module 7E9 TCM: cleared\n"),
    ([*CAR, "sensors"], """  06 monitor tests         01 02 21 3C A2 A3
  08 system control        01 02
  09 vehicle information   02 04 06 08 0A
"""),
    ([*CAR, "sensors"], """  03  Fuel system status: Fuel system A                                   text
      Fuel system status: Fuel system B                                   text
  04  Calculated engine load                                    %         0 to 100
  05  Engine Coolant Temperature                                °C        -40 to 215
"""),
    ([*CAR, "sensors"], """  F7  Boost pressure                                            kPa       0 to 255
  A6  Odometer                                                  km        ODOMETER (recorded)

Control module 7E9: TCM (Transmission Control Module)
"""),
    ([*CAR, "sensors"], """  06 monitor tests         - (not known in full: no answer)
  08 system control        - (not known in full: no answer)
"""),
    (["vin", "1M8GDM9AXKP042788"], """  VIN            1M8GDM9AXKP042788
  Region         North America
  Country        United States
  Maker          -
  Model year     1989 (position 10 is K, position 7 says which cycle of 30 years)
  Check digit    right
"""),
    (["dtc", "P0420", "B1234"], """P0420  Generic        Catalyst System Efficiency Below Threshold Bank 1
B1234  Ford           Mirror Switch Invalid Code
       GM             CD Player On Signal Circuit Open
"""),
    (["signals", "list", "mine.toml"], """mine.toml
  GEARBOX_TEMP  Gearbox oil temperature  7E1  221E1C  °C
  OFF           Switched off             7E1  221E20      off: needs session 03
"""),
    (["signals", "check", "mine.toml"], "mine.toml: 2 signals\n"),
    (["settings", "limit.RPM", "6000"], """Limit of RPM
  In the sensor's metric unit: the highest value, such as 6000, or a range
  such as 11.8..14.8, or none. live marks values outside.
  Value          ..6000
"""),
    ([*MODULES, "modules"], """  asked  answers  name  part         software  codes
  743    763      -     28400-S1004  BCM-0023      0
  7D6    7DE      -     -            -             1
  7E0    7E8      -     -            -             1
  7E1    7E9      -     -            -             0

Control module 7DE
  1A90  Identification 90 by service 1A                             S1M60000022
"""),
    ([*MODULES, "signals", "probe", "--module", "743", "--reply", "763", "--from", "F186", "--to", "F188", "-o", "probe.toml"],
     "  F187  32383430302D5331303034  28400-S1004\n"),
    ([*MODULES, "codes", "--uds"], """Control module 7E8: ECM
  P0133-00  present, confirmed, lamp  O2 Sensor Circuit Slow Response Bank 1 Sensor 1; No Subtype Information
Control module 7E9: ECU#2
  no codes
Control module 763
  no codes
Control module 7DE
  by service 18, in numbers that may be the maker's own:
  4155  status 60
"""),
    (["-q", "-p", "sim:petrol-iso9141?instant", "oxygen"], """Control module 10: ECU#1
  Oxygen monitor complete
  O2 sensors     Bank 1 sensor 1, Bank 1 sensor 2
      Result  Test  Value  Minimum  Maximum  Unit  Description
    Bank 1 sensor 1
      passed  05    0.080    0.000    0.160  s     Rich to lean sensor switch time (calculated)
      passed  07    0.080    0.000    0.250  V     Minimum sensor voltage for test cycle (calculated)
      -       01    0.450        -        -  V     Rich to lean sensor threshold voltage (constant)
"""),
    ([*CAR, "oxygen"], """Control module 7E8: ECM
  Oxygen monitor not complete, so results don't count yet
  O2 sensors     Bank 1 sensor 1, Bank 1 sensor 2
  O2 tests       among those of the monitors (velmora monitors)

Control module 7E9: TCM
  Oxygen monitor not supported
"""),
    (["history"], "Nothing is kept yet; velmora scan --history keeps a scan\n"),
)

# Commands that are refused: their exit code, and how the error begins.
REFUSED = (
    ([*CAR, "--ecu", "7EA", "info"], 6, "velmora: The vehicle has no control module 7EA\n  - these answer: 7E8, 7E9\n"),
    ([*CAR, "--ecu", "XYZ", "info"], 2, 'velmora: "XYZ" is not understood; expected a control module id in hexadecimal'),
    ([*CAR, "clear"], 2, "velmora: Clearing must be confirmed, and there is no terminal to ask\n  - --yes clears without asking\n"),
    (["-y", *CAR, "--ecu", "7E9", "clear"], 2, "velmora: Clearing reaches all control modules; it can't be held to one\n"),
    ([*CAR, "freeze", "1"], 5, "velmora: The vehicle did not answer this\n"),
    (["watch", "--wake", "never", "-o", "csv:a.csv"], 2, 'velmora: --wake: "never" is not "voltage" or such as "every 30min"\n'),
    (["watch"], 2, "velmora: "),
    (["signals"], 2, "velmora: A subcommand is required\n"),
    (["signals", "check"], 2, "velmora: FILE is required\n"),
    (["history", "show", "7"], 2, "velmora: "),
    (["history", "show", "1", "forget", "X"], 2, "velmora: "),
    (["trips"], 2, "velmora: DB is required\n"),
    (["-P", "0", *CAR, "info"], 2, "velmora: "), (["-P", "10", *CAR, "info"], 2, "velmora: "),
    (["live", "--play", "nowhere.csv"], 1, "velmora: "),
)
