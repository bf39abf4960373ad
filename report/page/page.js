// Makes the page an instrument. Times are ms since midnight; all days show the same hours.

const MOST_LANES = 100;  // of a day that are drawn
const SHORTEST = 10000;  // ms that a zoom shows at least
const DAY = 86400000;
const STEPS = [1, 5, 15, 60, 300, 900, 1800, 3600, 7200, 14400].map((s) => s * 1000);  // ms

const home = {from: DAY, to: 0};  // all that there is to see
const view = {from: 0, to: DAY, words: ''};  // what is shown, and the filter
const sorts = new Map();  // by kind of table: the column's key, "-" in front if descending
const days = [];
const tables = [];
let chosen = {};  // lane and index of the slice whose facts are told

const byId = (id) => document.getElementById(id);
const clamp = (value, low, high) => Math.min(Math.max(value, low), high);
const length = () => view.to - view.from;
const isHome = () => length() === home.to - home.from;
const isOutside = (from, to) => from >= view.to || (from < view.from && to <= view.from);
const is = (slice, style) => slice.style.split(' ').includes(style);
const tell = (text) => { byId('telling').textContent = text; };

function put(element, attributes) {
  for (const [key, value] of Object.entries(attributes)) element.setAttribute(key, value);
  return element;
}

// An element around elements and texts, which are never markup.
function build(namespace, name, attributes, contents) {
  const element = document.createElementNS(`http://www.w3.org/${namespace}`, name);
  element.append(...contents);
  return put(element, attributes);
}

const make = (name, attributes, ...contents) => build('1999/xhtml', name, attributes, contents);
const draw = (name, attributes, ...contents) => build('2000/svg', name, attributes, contents);

function duration(ms) {
  const minutes = Math.floor(ms / 60000);
  const [mm, ss] = [minutes, Math.floor(ms / 1000)].map((n) => String(n % 60).padStart(2, '0'));
  return `${Math.floor(minutes / 60)}:${mm}:${ss}`;
}

function brief(number) {
  if (number < 9999.5) return String(Math.round(number));
  const [unit, tenths] = number < 999950 ? ['k', number / 100] : ['M', number / 1e5];
  return (Math.round(tenths) / 10).toFixed(1) + unit;
}

const clock = (ms) => duration(Math.round(ms / 1000) * 1000).padStart(8, '0');

// The moment that "14", "14:30" or "14:30:05" names; NaN for anything else.
function moment(text) {
  if (!/^\d\d?(:[0-5]?\d){0,2}$/.test(text.trim())) return NaN;
  const [hours, minutes = 0, seconds = 0] = text.split(':').map(Number);
  return Math.min(((hours * 60 + minutes) * 60 + seconds) * 1000, DAY);
}

// What the page holds: its tables, and the days of its inputs.

function takeTable(element) {
  const heads = [...element.tHead.rows[0].cells];
  const rows = [...element.tBodies[0].rows].map((row) => {
    const names = [...row.querySelectorAll('.who')].map((cell) => cell.textContent);
    return {element: row, names, words: names.join(' ').toLowerCase()};
  });
  const {caption, dataset: {kind}} = element;
  const keys = heads.map((cell) => cell.dataset.key);
  heads.forEach((cell, i) => {
    const button = make('button', {type: 'button'}, cell.textContent);
    button.onclick = () => sortBy(kind, keys[i]);
    cell.replaceChildren(button);
  });
  tables.push({element, heads, rows, order: rows, kind, keys, caption: caption.textContent});
}

// How much of the time up to a moment the spans cover, which are in order.
function coverage(spans) {
  const sums = [0];
  for (const [from, to] of spans) sums.push(sums[sums.length - 1] + to - from);
  return (at) => {
    let low = 0;
    let high = spans.length;
    while (low < high) {
      const middle = (low + high) >> 1;
      if (spans[middle][0] < at) low = middle + 1;
      else high = middle;
    }
    return low === 0 ? 0 : sums[low] - Math.max(spans[low - 1][1] - at, 0);
  };
}

const takeSlices = (slices) => slices.map(([from, to, style, facts, rate, enables]) =>
  ({from, to, style, facts, rate, enables}));

function takeDay(data, section) {
  const [back, axis] = section.querySelectorAll('.picture > svg, .axis svg');
  const bands = [...section.querySelectorAll('.band')].map((element, i) =>
    openLane({name: data.bands[i][0], slices: takeSlices(data.bands[i][1]), element}));
  const table = tables.find((each) => each.element === section.querySelector('table'));
  const day = {data, back, axis, bands, table, shown: [], lanes: section.querySelector('.lanes'),
    leftOut: section.querySelector('.left-out'), isOn: coverage(data.on),
    isUnknown: coverage(data.unknown), isUnseen: coverage(data.unseen)};
  days.push(day);
  if (!table) return;
  table.day = day;
  table.rows.forEach((row, i) => {
    row.lane = {name: row.names.join(', '), names: row.names, slices: takeSlices(data.uses[i])};
  });
}

// Lanes. Only those on the screen are drawn.

const watcher = new IntersectionObserver((entries) => {
  for (const {target, isIntersecting} of entries) {
    target.lane.isSeen = isIntersecting;
    if (isIntersecting) drawLane(target.lane);
  }
}, {rootMargin: '200px'});

function openLane(lane) {
  if (!lane.element) {
    const [app, sensor] = lane.names;
    lane.element = make('div', {class: 'lane use'},
      make('div', {class: 'name', title: lane.name}, make('b', {}, app), make('span', {}, sensor)),
      make('div', {class: 'track'}, draw('svg', {})));
  }
  lane.element.lane = lane;
  const track = lane.element.querySelector('.track');
  put(track, {tabindex: 0, role: 'application',
    'aria-label': `${lane.name}: ${lane.slices.length}, arrow keys lead from one to the next`});
  lane.svg = track.firstElementChild;
  watcher.observe(lane.element);
  return lane;
}

// Slices of a lane that are too close to tell apart are one bar.
function findBars(lane) {
  const pixel = length() / (lane.svg.clientWidth || 1000);
  lane.bars = [];
  lane.slices.forEach((slice, index) => {
    if (isOutside(slice.from, slice.to)) return;
    const last = lane.bars[lane.bars.length - 1];
    const isNarrow = slice.to - slice.from < pixel;
    if (last && slice.from - last.to <= pixel && (isNarrow || last.isNarrow)) {
      Object.assign(last, {to: Math.max(last.to, slice.to), last: index, isNarrow: true});
    } else {
      lane.bars.push({slice, from: slice.from, to: slice.to, first: index, last: index, isNarrow});
    }
  });
}

const barAt = (lane, index) => lane.bars.find((bar) => index >= bar.first && index <= bar.last);
const share = (at) => clamp((at - view.from) / length(), -0.01, 1.01) * 100;
const percent = (at) => `${share(at).toFixed(3)}%`;
const across = (from, to) =>
  ({x: percent(from), width: `${Math.max(share(to) - share(from), 0.1).toFixed(3)}%`});

function factsOf(bar) {
  if (bar.first === bar.last) return bar.slice.facts;
  const number = bar.last - bar.first + 1;
  return `${number} from ${clock(bar.from)} to ${clock(bar.to)}, too close to tell apart`;
}

function drawLane(lane) {
  findBars(lane);
  const picked = chosen.lane === lane && barAt(lane, chosen.index);
  lane.svg.replaceChildren(...lane.bars.flatMap((bar) => {
    const marks = (bar.last > bar.first ? ' many' : '') + (bar === picked ? ' chosen' : '');
    const rect = draw('rect',
      {class: bar.slice.style + marks, ...across(bar.from, bar.to), y: '25%', height: '50%'});
    rect.bar = bar;
    rect.append(draw('title', {}, factsOf(bar)));
    const symbol = (name, at) => draw('use', {href: name, x: percent(at), y: '50%'});
    const drawn = [rect];
    if (is(bar.slice, 'before')) drawn.push(symbol('#before', bar.from));
    if (is(lane.slices[bar.last], 'on')) drawn.push(symbol('#on', bar.to));
    return drawn;
  }));
}

function drawDay({data, back, axis}) {
  const spans = (list, style) => list.filter(([from, to]) => !isOutside(from, to))
    .map(([from, to]) => draw('rect', {class: style, ...across(from, to), height: '100%'}));
  const line = ([at, style]) =>
    draw('line', {class: style, x1: percent(at), x2: percent(at), y2: '100%'});
  const most = (axis.clientWidth || 1000) / 80;
  const apart = STEPS.find((each) => length() / each <= most) || DAY / 4;
  const ticks = [];
  for (let at = Math.ceil(view.from / apart) * apart; at <= view.to; at += apart) ticks.push(at);
  back.replaceChildren(...spans(data.on, 'shade'), ...spans(data.unseen, 'unknown'),
    ...ticks.map((at) => line([at, 'grid'])),
    ...data.lines.filter(([at]) => !isOutside(at, at)).map(line));
  axis.replaceChildren(...ticks.filter((at) => share(at) < 96).map((at) =>
    draw('text', {x: percent(at), dx: 3, y: 13}, clock(at).slice(0, apart < 60000 ? 8 : 5))));
}

// The view. A change is drawn at once; totals and the address follow when it is over.

let [frame, timer] = [0, 0];
function change() {
  frame = frame || requestAnimationFrame(drawAll);
  clearTimeout(timer);
  timer = setTimeout(settle, 120);
}

const lanesOf = (day) => [...day.bands, ...day.shown];

function drawAll() {
  frame = 0;
  for (const day of days) {
    drawDay(day);
    lanesOf(day).filter((lane) => lane.isSeen).forEach(drawLane);
  }
}

function show(from, to) {
  const wanted = clamp(to - from, SHORTEST, home.to - home.from);
  view.from = clamp(from, home.from, home.to - wanted);
  view.to = view.from + wanted;
  change();
}

const zoom = (factor, at = (view.from + view.to) / 2) =>
  show(at - (at - view.from) * factor, at + (view.to - at) * factor);
const move = (by) => show(view.from + by * length(), view.to + by * length());

function isMeant(words) {
  return view.words.toLowerCase().split(/\s+/).filter((word) => word && word !== '!')
    .every((word) => (word[0] === '!' ? !words.includes(word.slice(1)) : words.includes(word)));
}

// The columns that follow the view: text, and value to sort by.
const COLUMNS = {
  held: (sum) => [['', '≥', '≤', '~'][sum.marks] + duration(sum.held), sum.held / 1000],
  display: (sum) => (sum.known > 0
    ? [`${duration(sum.on)} of ${duration(sum.known)}`, sum.on / 1000] : ['–', '']),
  enables: (sum) => [String(sum.enables), sum.enables],
  samples: (sum) => (isNaN(sum.samples) ? ['', ''] : [brief(sum.samples), sum.samples]),
};

function addUp(day, slices) {
  const sum = {held: 0, known: 0, on: 0, enables: 0, samples: 0, marks: 0, uses: 0};
  for (const use of slices) {
    if (isOutside(use.from, use.to)) continue;
    const from = Math.max(use.from, view.from);
    const to = Math.min(use.to, view.to);
    sum.uses += 1;
    sum.held += to - from;
    sum.known += to - from - (day.isUnknown(to) - day.isUnknown(from));
    sum.on += day.isOn(to) - day.isOn(from);
    sum.enables += use.enables.filter((at) => !isOutside(at, at)).length;
    sum.samples += use.rate === null ? NaN : (to - from) / 1000 * use.rate;
    if (use.from >= view.from && is(use, 'before')) sum.marks |= 1;
    if (is(use, 'unseen')) sum.marks |= 2;
  }
  return sum;
}

function write(table, row, sum) {
  for (const [key, column] of Object.entries(COLUMNS)) {
    const cell = row.cells[table.keys.indexOf(key)];
    if (!cell) continue;
    const [text, value] = column(sum);
    if (cell.textContent !== text) cell.textContent = text;
    cell.dataset.value = value;
  }
}

function total(table) {
  const all = {held: 0, known: 0, on: 0, enables: 0, samples: 0, marks: 0};
  for (const row of table.rows) {
    row.sum = addUp(table.day, row.lane.slices);
    write(table, row.element, row.sum);
    if (!row.isFound) continue;
    for (const key of ['held', 'known', 'on', 'enables', 'samples']) all[key] += row.sum[key] || 0;
    all.marks |= row.sum.marks;
  }
  if (table.element.tFoot) write(table, table.element.tFoot.rows[0], all);
}

function sort(table) {
  const sorted = sorts.get(table.kind) || '';
  const sign = sorted[0] === '-' ? -1 : 1;
  const column = table.keys.indexOf(sorted.replace('-', ''));
  const word = sign < 0 ? 'descending' : 'ascending';
  table.heads.forEach((cell, i) => put(cell, {'aria-sort': i === column ? word : 'none'}));
  if (column < 0) return table.rows;
  const keyed = table.rows.map((row) => {
    const cell = row.element.cells[column];
    return {row, text: cell.textContent, value: parseFloat(cell.dataset.value)};
  });
  keyed.sort((a, b) => {
    if (!a.text !== !b.text) return a.text ? -1 : 1;  // what is empty is last
    const by = a.value - b.value;
    return sign * (isNaN(by) ? a.text.localeCompare(b.text) : by);
  });
  return keyed.map(({row}) => row);
}

function settleTable(table) {
  for (const row of table.rows) row.isFound = !row.words || isMeant(row.words);
  if (table.day) total(table);
  const order = sort(table);
  if (order.some((row, i) => row !== table.order[i])) {
    table.element.tBodies[0].append(...order.map((row) => row.element));
  }
  table.order = order;
  const isShown = (row) => row.isFound && (!row.sum || row.sum.uses > 0 || isHome());
  const shown = order.filter(isShown).length;
  for (const row of order) row.element.classList.toggle('out', !isShown(row));
  const parts = [table.caption];
  if (table.day && !isHome()) {
    const unseen = table.day.isUnseen(view.to) - table.day.isUnseen(view.from);
    parts.push(`${clock(view.from)} to ${clock(view.to)}`);
    if (unseen) parts.push(`${duration(length() - unseen)} seen`);
  }
  if (shown < table.rows.length) parts.push(`${shown} of ${table.rows.length} rows`);
  table.element.caption.textContent = parts.join(', ');
}

function settleDay(day) {
  const found = (day.table?.order || []).filter((row) => row.isFound);
  const lanes = found.slice(0, MOST_LANES).map((row) => row.lane);
  if (lanes.length !== day.shown.length || lanes.some((lane, i) => lane !== day.shown[i])) {
    day.lanes.replaceChildren(...lanes.map((lane) => lane.element || openLane(lane).element));
    day.shown = lanes;
  }
  lanes.forEach(findBars);
  const drawn = lanes.flatMap((lane) => lane.bars);
  const slices = drawn.reduce((sum, bar) => sum + bar.last - bar.first + 1, 0);
  const more = found.length - lanes.length;
  const close = `${slices} uses are drawn as ${drawn.length} bars, too close to tell apart. `;
  const many = `${more} more rows are not drawn: filter or sort.`;
  day.leftOut.textContent = (slices > drawn.length ? close : '') + (more > 0 ? many : '');
}

function settle() {
  tables.forEach(settleTable);
  days.forEach(settleDay);
  for (const id of ['from', 'to']) put(byId(id), {'aria-invalid': false}).value = clock(view[id]);
  if (byId('filter').value !== view.words) byId('filter').value = view.words;
  writeAddress();
}

// The address's fragment holds the view, so that it can be sent.

function writeAddress() {
  const state = new URLSearchParams(isHome() ? {} : {from: clock(view.from), to: clock(view.to)});
  if (view.words) state.set('filter', view.words);
  for (const [kind, key] of sorts) state.set(`sort-${kind}`, key);
  if (String(state) || location.hash.includes('=')) history.replaceState(null, '', `#${state}`);
}

function readAddress() {
  if (location.hash && !location.hash.includes('=')) return;  // it leads to an input
  const state = new URLSearchParams(location.hash.slice(1));
  const [from, to] = ['from', 'to'].map((key) => moment(state.get(key) || ''));
  view.words = state.get('filter') || '';
  sorts.clear();
  for (const {kind, keys} of tables) {
    const key = state.get(`sort-${kind}`);
    if (key && keys.includes(key.replace('-', ''))) sorts.set(kind, key);
  }
  show(...(from < to ? [from, to] : [home.from, home.to]));
}

// A click sorts upwards, the next one downwards, the third not at all.
function sortBy(kind, key) {
  const now = sorts.get(kind);
  if (now === `-${key}`) sorts.delete(kind);
  else sorts.set(kind, now === key ? `-${key}` : key);
  settle();
}

function choose(lane, index) {
  const slice = lane.slices[index];
  if (!slice) return tell(`${lane.name}: nothing`);
  chosen = {lane, index};
  if (isOutside(slice.from, slice.to)) show(slice.from - length() / 2, slice.from + length() / 2);
  drawAll();
  drawLane(lane);
  return tell(`${lane.name}: ${factsOf(barAt(lane, index))}`);
}

function step(lane, by) {
  const bar = chosen.lane === lane && barAt(lane, chosen.index);
  const outmost = lane.bars.at(by > 0 ? 0 : -1) || {first: 0};
  const next = by > 0 ? bar.last + 1 : bar.first - 1;
  choose(lane, clamp(bar ? next : outmost.first, 0, lane.slices.length - 1));
}

const laneOf = (element) => element.closest('.track')?.parentElement.lane;

const ACTIONS = {
  in: () => zoom(1 / 2),
  out: () => zoom(2),
  all: () => show(home.from, home.to),
  earlier: () => move(-1 / 4),
  later: () => move(1 / 4),
};

const KEYS =
  {'+': 'in', '=': 'in', '-': 'out', 0: 'all', ArrowLeft: 'earlier', ArrowRight: 'later'};

function takeKey(event) {
  if (event.ctrlKey || event.metaKey || event.altKey || event.target.matches('input')) return;
  const lane = !event.shiftKey && laneOf(event.target);
  const by = {ArrowLeft: -1, ArrowRight: 1}[event.key];
  if (event.key === '/') byId('filter').focus();
  else if (lane && by) step(lane, by);
  else if (KEYS[event.key]) act(ACTIONS[KEYS[event.key]]);
  else return;
  event.preventDefault();
}

function act(action) {
  action();
  tell(`Shown: ${clock(view.from)} to ${clock(view.to)}`);
}

// One pointer drags, two pinch, one that has not moved chooses. The wheel zooms with Ctrl.

const pointers = new Map();  // by id: x
let hasMoved = false;

function drag(lane, {pointerId, clientX}, before, momentAt, width) {
  if (!hasMoved && Math.abs(clientX - before) < 4) return;
  hasMoved = true;
  lane.svg.setPointerCapture(pointerId);
  pointers.set(pointerId, clientX);
  const other = [...pointers].find(([id]) => id !== pointerId);
  const apart = (x) => Math.max(Math.abs(x - other[1]), 10);
  if (other) zoom(apart(before) / apart(clientX), momentAt(other[1]));
  else move((before - clientX) / width);
}

function takePointer(event) {
  const lane = laneOf(event.target);
  const {type, pointerId, clientX} = event;
  const before = pointers.get(pointerId);
  if (type === 'pointerup' || type === 'pointercancel') pointers.delete(pointerId);
  if (!lane) return;
  const {left, width} = lane.svg.getBoundingClientRect();
  const momentAt = (x) => view.from + (x - left) / width * length();
  if (type === 'wheel' && event.ctrlKey) {
    event.preventDefault();
    zoom(event.deltaY < 0 ? 0.8 : 1.25, momentAt(clientX));
  } else if (type === 'pointerdown' && event.button === 0) {
    pointers.set(pointerId, clientX);
    hasMoved = pointers.size > 1;
  } else if (type === 'pointermove') {
    if (before !== undefined) drag(lane, event, before, momentAt, width);
    else if (event.target.bar) tell(`${lane.name}: ${factsOf(event.target.bar)}`);
  } else if (type === 'pointerup' && before !== undefined && !hasMoved) {
    const room = event.pointerType === 'mouse' ? 2 : 14;
    const bar = lane.bars.find(({from, to}) =>
      momentAt(clientX + room) >= from && momentAt(clientX - room) <= to);
    if (bar) choose(lane, bar.first);
  }
}

function takeTimes() {
  const [from, to] = ['from', 'to'].map((id) => moment(byId(id).value));
  put(byId('from'), {'aria-invalid': isNaN(from)});
  put(byId('to'), {'aria-invalid': !(to > from)});
  if (from < to) act(() => show(from, to));
}

function start() {
  document.querySelectorAll('table').forEach(takeTable);
  for (const block of document.querySelectorAll('script.data')) {
    const data = JSON.parse(block.textContent);
    const sections = block.previousElementSibling.querySelectorAll('.day');
    if (data.hours[0] === data.hours[1]) continue;
    home.from = Math.min(home.from, data.hours[0]);
    home.to = Math.max(home.to, data.hours[1]);
    data.days.forEach((day, i) => takeDay(day, sections[i]));
  }
  document.documentElement.classList.add('live');
  for (const each of document.querySelectorAll('.controls, .keys')) each.hidden = !days.length;
  for (const name of Object.keys(ACTIONS)) byId(name).onclick = () => act(ACTIONS[name]);
  byId('controls').onsubmit = (event) => event.preventDefault();
  byId('filter').oninput = ({target}) => {
    view.words = target.value;
    change();
  };
  for (const id of ['from', 'to']) byId(id).onchange = takeTimes;
  document.onkeydown = takeKey;
  for (const type of ['pointerdown', 'pointermove', 'pointerup', 'pointercancel', 'wheel']) {
    document.addEventListener(type, takePointer, {passive: false});
  }
  window.onhashchange = readAddress;
  window.onbeforeprint = () => days.flatMap(lanesOf).forEach(drawLane);
  show(home.from, home.to);
  readAddress();
  settle();
}

start();
