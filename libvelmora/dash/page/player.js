// The bar of a recording that is played: pause, speed, and where it stands.
import { byId, element, setText } from './tables.js';
import { post } from './link.js';

let state = null;
let sliding = false;

const clock = (ms) => {
  const seconds = Math.max(0, Math.floor(ms / 1000));
  const rest = `${String(Math.floor(seconds / 60) % 60).padStart(seconds < 3600 ? 1 : 2, '0')}:${String(seconds % 60).padStart(2, '0')}`;
  return seconds < 3600 ? rest : `${Math.floor(seconds / 3600)}:${rest}`;
};

export const isPaused = () => Boolean(state?.paused);
export const isOver = () => Boolean(state && state.position >= state.end);

// The program may have been started with a speed that is not in the list.
function showSpeed(speed) {
  const list = byId('playSpeed');
  if (![...list.options].some((each) => each.value === speed)) list.prepend(element('option', { value: speed }, speed));
  list.value = speed;
}

export function take(play) {
  state = play ?? null;
  byId('player').hidden = !state;
  if (!state) return;
  byId('playPause').setAttribute('aria-pressed', String(state.paused));
  showSpeed(String(state.speed));
  const range = byId('playPlace');
  const length = state.end - state.begin;
  const place = state.position - state.begin;
  range.max = String(length);
  if (!sliding) range.value = String(place);
  const text = `${clock(place)} of ${clock(length)}`;
  range.setAttribute('aria-valuetext', text);
  setText(byId('playTime'), text);
}

const send = (change) => post('/ask', { topic: 'play', ...change });

export function start() {
  byId('playPause').addEventListener('click', () => send({ paused: !state.paused }));
  byId('playSpeed').addEventListener('change', (event) => send({ speed: Number(event.target.value) }));
  byId('playPlace').addEventListener('input', () => (sliding = true));
  byId('playPlace').addEventListener('change', (event) => {
    sliding = false;
    send({ position: state.begin + Number(event.target.value) });
  });
}
