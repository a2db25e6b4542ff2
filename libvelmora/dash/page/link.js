// The stream of events from the program, and what is sent to it.

const silentMs = 1500; // the program sends something each second

const handlers = new Map();
let source = null;
let lastEvent = 0;
let lastId = ''; // of the events that came
let refused = false;
let clockOffset = 0; // of the program's clock against this one

export function on(name, handler) {
  handlers.set(name, handler);
}

// The time by the program's clock.
export function programNow() {
  return Date.now() + clockOffset;
}

export async function post(path, body) {
  try {
    const response = await fetch(path, { method: 'POST', body: typeof body === 'string' ? body : JSON.stringify(body) });
    return { ok: response.ok, status: response.status, text: (await response.text()).trim() };
  } catch {
    return { ok: false, status: 0, text: 'The program cannot be reached' };
  }
}

export async function getJson(path) {
  const response = await fetch(path);
  if (!response.ok) throw new Error(await response.text());
  return response.json();
}

// The token stands in the link's fragment, which no server sees; a cookie takes its place.
export async function login() {
  const token = /^#t=([\w-]+)$/.exec(location.hash)?.[1];
  if (token) {
    history.replaceState(null, '', '/');
    await post('/login', token);
  }
}

function take(name, event) {
  lastEvent = performance.now();
  if (event.lastEventId) lastId = event.lastEventId;
  const data = JSON.parse(event.data);
  const now = data?.now ?? data?.beat?.now; // a run that was never begun is null
  if (now) clockOffset = now - Date.now();
  handlers.get(name)?.(data);
}

export function open() {
  close();
  refused = false;
  lastEvent = performance.now();
  source = new EventSource(lastId ? `/events?last=${lastId}` : '/events');
  for (const name of ['hello', 'values', 'beat', 'news', 'layout', 'answer', 'performance']) {
    source.addEventListener(name, (event) => take(name, event));
  }
  source.onerror = () => {
    refused = source?.readyState === EventSource.CLOSED;
    lastEvent = Math.min(lastEvent, performance.now() - silentMs);
    handlers.get('trouble')?.();
  };
}

export function close() {
  source?.close();
  source = null;
}

// 'live', 'gone' or 'refused', as far as the program is concerned.
export function programState() {
  if (refused) return 'refused';
  return performance.now() - lastEvent > silentMs ? 'gone' : 'live';
}

// A tab that nobody sees gives its connection back: browsers have six for each host.
document.addEventListener('visibilitychange', () => (document.hidden ? close() : open()));
