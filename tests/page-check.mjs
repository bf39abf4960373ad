// Works with the page in chromium as a person would: page-check.mjs TOOL AXE FOLDER EXAMPLE...
// TOOL is sensor-replay, AXE the file axe.js, FOLDER an empty one. The examples must be
// phone-day.jsonl, of which it is known what the page shows, and two captures: of before an update
// and of after it. Runs on Node 18.
import assert from 'node:assert/strict';
import {execFileSync} from 'node:child_process';
import {readFileSync, writeFileSync} from 'node:fs';
import {basename, dirname, join, resolve} from 'node:path';
import {pathToFileURL} from 'node:url';

import {Browser} from './page-browser.mjs';

const [tool, axeFile, folder, ...examples] = process.argv.slice(2).map((path) => resolve(path));
const axe = readFileSync(axeFile, 'utf8');

/** Makes the page of inputs of one folder, and a copy that has no script; their addresses. */
function makePage(name, inputs, ...options) {
  const path = join(folder, `${name}.html`);
  execFileSync(tool, ['--page', path, ...options, ...inputs.map((input) => basename(input))],
    {cwd: dirname(inputs[0])});
  const html = readFileSync(path, 'utf8');
  const still = html.replace(/<script type="module">.*?<\/script>/s, '');
  assert.notEqual(still, html);
  writeFileSync(`${path}.still.html`, still);
  return {live: pathToFileURL(path).href, still: pathToFileURL(`${path}.still.html`).href};
}

/** A day on which twenty apps switch a sensor on 50 000 times, and 300 apps once. */
function makeBusyDay() {
  const lines = [];
  const add = (at, app, isOn) => lines.push(JSON.stringify({at, call: 'SDCImpl.enableSuccess',
    args: [isOn, 1, app, app, isOn ? 20000000 : 0]}));
  for (let i = 0; i < 50000; ++i) {
    add(i * 1700, `com.example.app${i % 20}`, true);
    add(i * 1700 + 800, `com.example.app${i % 20}`, false);
  }
  for (let i = 0; i < 300; ++i) {
    add(85100000 + i * 1000, `com.example.rare${i}`, true);
    add(85100000 + i * 1000 + 500, `com.example.rare${i}`, false);
  }
  const path = join(folder, 'busy-day.jsonl');
  writeFileSync(path, `${lines.join('\n')}\n`);
  return path;
}

// Bodies of functions that run in the page.
const CELLS = `return [...document.querySelectorAll('caption, tbody tr:not(.out), tfoot tr')]
  .map((each) => [...each.cells || [each]].map((cell) => cell.textContent).join(' | '))`;
const TOTALS = `return [...document.querySelectorAll('.day tfoot tr')].map((row) =>
  [...row.cells].map((cell) => cell.textContent).join(' | '))`;
const ROWS = `return [...document.querySelectorAll('.day')].map((day) =>
  [...day.querySelectorAll('tbody tr:not(.out)')].map((row) =>
    [...row.cells].slice(0, 3).map((cell) => cell.textContent).join(' | ')))`;
const LANES = `return [...document.querySelectorAll('.lane.use .name')].map((name) =>
  [...name.children].map((child) => child.textContent).join(' | '))`;
const OUTSIDE = `return [...document.querySelectorAll('body *')].filter((each) =>
  !each.closest('svg, .name, thead') && each.getBoundingClientRect().right > innerWidth + 1)
  .map((each) => each.outerHTML.slice(0, 80))`;
const VIOLATIONS = `${axe}; return axe.run({resultTypes: ['violations']}).then(({violations}) =>
  violations.map(({id, nodes}) => id + ': ' + nodes.map(({html}) => html.slice(0, 120)).join()))`;
const TOLD = `return document.getElementById('telling').textContent`;
const VIEW = `return ['from', 'to'].map((id) => document.getElementById(id).value)`;
const STATE = `return decodeURIComponent(location.hash)`;

/** Checks that hold for each page, with and without the script. */
async function checkLooks(browser, page, name) {
  const tables = [];
  for (const width of [1280, 390]) {
    for (const scheme of ['light', 'dark']) {
      for (const kind of ['live', 'still']) {
        const what = `${name}, ${width} px, ${scheme}, ${kind}`;
        await browser.open(`${page[kind]}#input-1`, {width, scheme});
        const isLive = await browser.run(`return document.documentElement.matches('.live')`);
        assert.equal(isLive, kind === 'live', what);
        assert.deepEqual(await browser.run(VIOLATIONS), [], `axe: ${what}`);
        assert.deepEqual(await browser.run(OUTSIDE), [], `off the screen: ${what}`);
        tables.push(await browser.run(CELLS));
        assert.deepEqual(await browser.said(), [], `console: ${what}`);
      }
    }
  }
  for (const table of tables) assert.deepEqual(table, tables[0], `${name}: totals of all the time`);
}

async function checkFilter(browser, page) {
  await browser.open(page.live);
  await browser.type('/');
  await browser.type('run !light');
  await browser.until('filter', `location.hash.includes('filter')`);
  const rows = [['com.example.run | accelerometer | 3:10:00', 'com.example.run | orientation | 1:10:00'],
    ['com.example.run | accelerometer | 0:30:00', 'com.example.run | orientation | 0:30:00']];
  assert.deepEqual(await browser.run(ROWS), rows);
  assert.deepEqual(await browser.run(LANES), rows.flat().map((row) => row.slice(0, -10)));
}

async function checkTimes(browser, page) {
  await browser.open(page.live);
  await browser.run(`for (const [id, text] of [['from', '9'], ['to', '10:15']]) {
    document.getElementById(id).value = text;
    document.getElementById(id).onchange();
  }`);
  await browser.until('times', `location.hash.includes('from=')`);
  const day = ['com.example.run | accelerometer | 1:15:00',
    '<script>alert("x")</script>& | accelerometer | 0:30:00'];
  assert.deepEqual(await browser.run(ROWS), [day, []]);
  const state = await browser.run(STATE);
  assert.equal(state, '#from=09:00:00&to=10:15:00');

  // Sorted downwards by the sensor; the address gives the same view again.
  await browser.click('.day th[data-key=held] button');
  await browser.until('sorted', `location.hash.includes('sort-uses=held')`);
  assert.deepEqual(await browser.run(ROWS), [[day[1], day[0]], []]);
  assert.equal(await browser.run(`return document.querySelector('th[data-key=held]').ariaSort`),
    'ascending');
  await browser.open(`${page.live}${await browser.run('return location.hash')}`);
  assert.deepEqual(await browser.run(ROWS), [[day[1], day[0]], []]);
  assert.deepEqual(await browser.run(VIEW), ['09:00:00', '10:15:00']);

  // An address of nonsense shows all.
  await browser.open(`${page.live}#from=99&to=x&sort-uses=nothing&filter=`);
  assert.deepEqual(await browser.run(VIEW), ['00:00:00', '24:00:00']);
}

async function checkKeys(browser, page) {
  await browser.open(page.live);
  await browser.type('++');
  await browser.until('zoomed', `location.hash.includes('from=09:00:00')`
    .replaceAll(':', '%3A'));
  assert.deepEqual(await browser.run(VIEW), ['09:00:00', '15:00:00']);
  await browser.type('\uE014-');  // to the right
  await browser.until('moved', `document.getElementById('from').value === '07:30:00'`);
  await browser.type('0');
  await browser.until('all', `document.getElementById('from').value === '00:00:00'`);

  // A lane is one stop; arrows lead from use to use and stay at the last.
  await browser.run(`document.querySelector('[title="com.example.run, accelerometer"] + .track').focus()`);
  const facts = ['08:30:00 to 10:30:00, 2:00:00, 50.0 Hz',
    '22:50:00 to 00:30:00 of the next day, 1:40:00, 50.0 Hz, still on'];
  for (const each of [...facts, facts[1]]) {
    await browser.type('\uE014');
    assert.equal(await browser.run(TOLD), `com.example.run, accelerometer: ${each}`);
  }
  assert.equal(await browser.run(`return document.querySelectorAll('.chosen').length`), 1);
  await browser.type('\uE004');
  assert.equal(await browser.run(`return document.activeElement ===
    document.querySelectorAll('.lane.use .track')[1]`), true);
}

/** What was on between nine and a quarter past ten, from the start of the page by keys alone. */
async function checkKeysAlone(browser, page) {
  for (const width of [1280, 390]) {
    await browser.open(page.live, {width});
    await browser.type('\uE004\uE0049\uE00410:15\uE007');  // past the filter; Enter
    await browser.until('times', `location.hash.includes('to=10%3A15')`);
    assert.equal(await browser.run(TOLD), 'Shown: 09:00:00 to 10:15:00');
    assert.deepEqual((await browser.run(ROWS))[0],
      ['com.example.run | accelerometer | 1:15:00', '<script>alert("x")</script>& | accelerometer | 0:30:00']);
    assert.match((await browser.run(TOTALS))[0], /^In all \|  \| 1:45:00 \|/);
    assert.match((await browser.run(CELLS)).join(), /09:00:00 to 10:15:00, 0:00:00 seen, 0 of/);
  }
}

/** Several inputs have a table of contents; the comparison with a baseline stands before them. */
async function checkSeveral(browser, [before, after]) {
  const page = makePage('compared', [after], '--baseline', basename(before));
  await checkLooks(browser, page, 'compared');
  await browser.open(page.live);
  const ask = (selector) => browser.run(`return [...document.querySelectorAll('${selector}')]
    .map((each) => each.textContent)`);
  assert.deepEqual(await ask('nav a'), [basename(before), basename(after)]);
  assert.deepEqual(await ask('main h2'), ['Old against new', basename(before), basename(after)]);
  await browser.click('nav li:nth-child(2) a');
  assert.ok(Math.abs(await browser.run(
    `return document.getElementById('input-2').getBoundingClientRect().top`)) < 120);

  // Sorted by the difference, upwards: what fell most comes first.
  const gone = 'main > table:nth-of-type(3)';
  const differences = () => ask(`${gone} tbody td:nth-child(5)`);
  assert.deepEqual(await differences(), ['-0:04:54', '-0:04:40', '-0:04:40', '-0:04:12']);
  await browser.run(`document.querySelector('${gone} th[data-key=difference] button').click()`);
  await browser.run(`document.querySelector('${gone} th[data-key=difference] button').click()`);
  assert.equal((await differences())[0], '-0:04:12');

  // One filter for all inputs.
  await browser.type('/game');
  await browser.until('filter', `location.hash.includes('filter=game')`);
  assert.deepEqual((await browser.run(ROWS)).map((rows) => rows.length), [0, 1]);
}

/** Points on the track of the accelerometer's lane, by their shares of its width. */
async function trackOf(browser) {
  const [x, y, width] = await browser.run(`const track = document.querySelector(
      '[title="com.example.run, accelerometer"] + .track');
    track.scrollIntoView({block: 'center'});
    const box = track.getBoundingClientRect();
    return [box.x, box.y + box.height / 2, box.width]`);
  return (share) => ({x: Math.round(x + width * share), y: Math.round(y)});
}

async function checkPointers(browser, page) {
  const length = `const [from, to] = ${VIEW.replace('return ', '')}
    .map((text) => text.split(':').reduce((sum, part) => sum * 60 + Number(part), 0));`;
  for (const [kind, width] of [['mouse', 1280], ['touch', 390]]) {
    await browser.open(page.live, {width});
    await browser.type('+');
    await browser.until('zoomed', `location.hash.includes('from')`);
    const at = await trackOf(browser);
    await browser.point(kind, [at(0.5), at(0.6), at(0.75)]);
    await browser.until('dragged', `(() => { ${length} return to - from === 43200 && from < 11500; })()`);
    await browser.point(kind, [at(0.5)]);
    assert.match(await browser.run(TOLD), /^com.example.run, accelerometer: 08:30:00 to 10:30:00/);
  }
  const at = await trackOf(browser);
  await browser.type('0');
  await browser.point('touch', [at(0.4), at(0.2)], [at(0.6), at(0.8)]);
  await browser.until('pinched', `(() => { ${length} return to - from < 40000; })()`);

  await browser.open(page.live);
  const point = (await trackOf(browser))(0.25);
  await browser.command('Input.dispatchMouseEvent',
    {type: 'mouseWheel', ...point, deltaX: 0, deltaY: -100, modifiers: 2});
  await browser.until('wheel', `(() => { ${length} return to - from === 69120 && from === 4320; })()`);
}

/** Names are text, and what is no part of the page does not run. */
async function checkHostile(browser, page) {
  await browser.open(page.live);
  assert.equal(await browser.run(`return document.querySelectorAll('main script:not(.data)').length`),
    0);
  assert.equal(await browser.run(`return document.body.textContent.includes('\u202e')`), false);
  const names = await browser.run(LANES);
  assert.equal(names.filter((name) => name.startsWith('<script>alert("x")</script>&')).length, 2);
  await browser.said();
  await browser.run(`const script = document.createElement('script');
    script.textContent = 'document.title = "ran"';
    document.body.append(script);`);
  assert.notEqual(await browser.run('return document.title'), 'ran');
  assert.match((await browser.said()).join(), /Content Security Policy/);
}

async function checkBusyDay(browser, page) {
  await browser.open(page.live);
  const drawn = () => browser.run(`return document.querySelectorAll('.lane.use rect').length`);
  assert.ok(await drawn() < 20000);
  assert.match(await browser.run(`return document.querySelector('.left-out').textContent`),
    /^50080 uses are drawn as \d+ bars, too close to tell apart.*220 more rows are not drawn/);
  await browser.open(`${page.live}#from=01:00:00&to=01:10:00&filter=app7`);
  assert.equal(await drawn(), 18);
  assert.equal(await browser.run(`return document.querySelector('.left-out').textContent`), '');
}

async function checkPrint(browser, page) {
  await browser.open(page.live);
  await browser.command('Emulation.setEmulatedMedia', {media: 'print'});
  assert.deepEqual(await browser.run(`return ['.controls', '.telling', 'table tbody tr'].map((each) =>
    getComputedStyle(document.querySelector(each)).display)`), ['none', 'none', 'table-row']);
  await browser.command('Emulation.setEmulatedMedia', {media: ''});
}

const browser = await Browser.start(join(folder, 'profile'));
try {
  const page = makePage('day', [examples[0]]);
  for (const check of [checkFilter, checkTimes, checkKeys, checkKeysAlone, checkPointers,
    checkHostile, checkPrint]) {
    await check(browser, page);
  }
  await checkLooks(browser, page, 'day');
  await checkSeveral(browser, examples.slice(1));
  await checkBusyDay(browser, makePage('busy', [makeBusyDay()]));
} finally {
  await browser.stop();
}
