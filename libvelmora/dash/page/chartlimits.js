// How limits look in the chart: lines with their words, and another colour for what is beyond them.
import { limitOf, limitText } from './limits.js';
import { titleOf } from './store.js';
import { convert, turnsRound } from './units.js';

function ends(sensor) {
  const { lowest, highest } = limitOf(sensor);
  return [lowest, highest].filter((each) => each != null);
}

// For a dataset; nothing where the sensor has no limit, since it costs time with each redraw.
export function segmentOf(sensor, colour) {
  if (ends(sensor).length === 0) return undefined;
  const { lowest, highest } = limitOf(sensor);
  const [low, high] = turnsRound(sensor) ? [highest, lowest] : [lowest, highest];
  const top = high == null ? Infinity : convert(sensor, high);
  const bottom = low == null ? -Infinity : convert(sensor, low);
  const idles = (y) => y === 0 && turnsRound(sensor); // no number of miles
  const isBeyond = (y) => !idles(y) && (y > top || y < bottom);
  return { borderColor: ({ p0, p1 }) => (isBeyond(p0.parsed.y) || isBeyond(p1.parsed.y) ? colour : undefined) };
}

function drawLine(chart, y, text) {
  const { ctx, chartArea } = chart;
  if (!(y >= chartArea.top && y <= chartArea.bottom)) return;
  ctx.beginPath();
  ctx.moveTo(chartArea.left, y);
  ctx.lineTo(chartArea.right, y);
  ctx.stroke();
  ctx.textBaseline = y - chartArea.top > 20 ? 'bottom' : 'top';
  ctx.fillText(`! ${text}`, chartArea.left + 6, y);
}

// A plugin of the chart for these sensors.
export function limitLines(sensors, axisOf, colour) {
  const draw = (chart) => {
    const { ctx } = chart;
    ctx.save();
    Object.assign(ctx, { strokeStyle: colour, fillStyle: colour, lineWidth: 1.5, font: `600 12px ${getComputedStyle(document.body).fontFamily}` });
    ctx.setLineDash([6, 4]);
    for (const sensor of sensors) {
      for (const end of ends(sensor)) {
        drawLine(chart, chart.scales[axisOf(sensor)].getPixelForValue(convert(sensor, end)), `${titleOf(sensor)} ${limitText(sensor, end)}`);
      }
    }
    ctx.restore();
  };
  return { id: 'limits', afterDatasetsDraw: draw };
}
