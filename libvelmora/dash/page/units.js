// Values come in metric units; here alone value and label are turned into those that the user wants.

// Under a litre it is an idling engine's, which would read as hundreds of miles.
const milesPerGallon = (litres) => (Math.abs(litres) < 1 ? 0 : 235.214583 / litres);
const milesPerUkGallon = (litres) => milesPerGallon(litres) * (4.54609 / 3.785411784);

// The label, the conversion, and how many more digits it needs. Labels are those of <velmora/unitlabel.h>.
const imperial = {
  'km/h': ['mph', (v) => v * 0.621371, 0],
  km: ['mi', (v) => v * 0.621371, 0],
  '°C': ['°F', (v) => v * 1.8 + 32, 0],
  K: ['°F', (v) => v * 1.8, 0],
  kPa: ['psi', (v) => v * 0.1450377, 1],
  Pa: ['inH2O', (v) => v * 0.00401463, 3],
  'g/s': ['lb/min', (v) => v * 0.1322774, 1],
  kW: ['hp', (v) => v * 1.3410221, 0],
  mm: ['in', (v) => v / 25.4, 2],
  'l/100 km': ['mpg', milesPerGallon, 0],
};
const ukGallons = ['mpg (UK)', milesPerUkGallon, 0];

// Of air and vapour, which the library shows by the height of a column. By the key of the parameter.
const columns = {
  INTAKE_PRESSURE: ['inHg', (v) => v / 3.386389, 1],
  BAROMETRIC_PRESSURE: ['inHg', (v) => v / 3.386389, 1],
  PID_6F: ['inHg', (v) => v / 3.386389, 1],
  PID_53: ['inH2O', (v) => v * 4.01463, 0],
};

// Whether a sensor's own unit is one of those, which happens in recordings.
export function isImperial(unit) {
  return unit.startsWith('in') || unit === ukGallons[0] || Object.values(imperial).some(([label]) => label === unit);
}

let system = 'metric';
export function setSystem(name) {
  system = name;
}

function rule({ sensor, unit }) {
  if (system === 'metric') return undefined;
  if (system === 'imperial-uk' && unit === 'l/100 km') return ukGallons;
  return (unit === 'kPa' && columns[sensor.replace(/_[0-9]$/, '')]) || imperial[unit];
}

export function unitOf(sensor) {
  return rule(sensor)?.[0] ?? sensor.unit;
}

export function convert(sensor, value) {
  const found = rule(sensor);
  return found && typeof value === 'number' ? found[1](value) : value;
}

// The value as people read it, without its unit.
export function show(sensor, value) {
  if (value == null) return '–';
  if (typeof value !== 'number') return String(value);
  const digits = Math.min(6, (sensor.precision ?? 0) + (rule(sensor)?.[2] ?? 0));
  return convert(sensor, value).toFixed(digits).replace(/^-(0(\.0+)?)$/, '$1');
}

// Whether what is more of the sensor is less of what is shown: the less fuel, the more miles.
export function turnsRound(sensor) {
  return sensor.unit === 'l/100 km' && system !== 'metric';
}

// The lowest and the highest, in the order that they have once they are converted. Null for a highest that is not known,
// for of an idling engine nobody knows the miles.
export function inOrder(sensor, low, high) {
  if (!turnsRound(sensor) || low == null) return [low, high];
  return convert(sensor, low) === 0 ? [low, null] : [high, low];
}

export function withUnit(sensor, value) {
  const unit = unitOf(sensor);
  return show(sensor, value) + (unit && value != null ? ` ${unit}` : '');
}

const ranges = {
  RPM: [0, 8000], SPEED: [0, 220], COOLANT_TEMP: [-40, 140], OIL_TEMP: [-40, 160], MODULE_VOLTAGE: [8, 16],
  INTAKE_TEMP: [-40, 80], AMBIENT_TEMP: [-40, 60], TIMING_ADVANCE: [-20, 60], MAF: [0, 200], INTAKE_PRESSURE: [0, 255],
};
const unitRanges = { '%': [0, 100], '°C': [-40, 150], lambda: [0.5, 1.5] };

// Where the gauge of a sensor begins and ends: as usual for it, else as far as it was seen.
export function rangeOf(sensor) {
  let [low, high] = ranges[sensor.sensor] ?? unitRanges[sensor.unit] ?? [0, 1];
  const { min, max } = sensor.stats;
  if (sensor.unit === '%' && min < 0 && !ranges[sensor.sensor]) low = -100;
  if (min != null) {
    low = Math.min(low, min);
    high = Math.max(high, max);
  }
  return [low, nice(high, low)];
}

// A dial with these ends: its numbers as they are shown, and where a value stands on it, from 0 to 1.
export function dialOf(sensor, ends = rangeOf(sensor)) {
  const [low, high] = turnsRound(sensor) ? [0, 60] : ends.map((end) => convert(sensor, end));
  return { low, high, at: (value) => Math.max(0, Math.min(1, (convert(sensor, value) - low) / (high - low))) };
}

function nice(high, low) {
  if (high === low) return low + 1;
  const step = 10 ** Math.floor(Math.log10(high - low));
  return Math.ceil((high - low) / (step / 2)) * (step / 2) + low;
}
