// The page: state, keys, pointers, and what is drawn when.
const ZOOM_STEP = 1.5;
const PAN_STEP = 0.15;
const SNAP_PIXELS = 7;
const CLICK_PIXELS = 4;
const SAVED_HEIGHT = 560;

const byId = (id) => document.getElementById(id);

function readData() {
  const element = byId('data');
  const data = JSON.parse(element.textContent);
  element.remove();  // the text of it is not needed twice
  return data;
}

function lanesOf({markers, triggers}) {
  const used = markers.flatMap(({isUsed}, marker) => (isUsed ? [`marker${marker}`] : []));
  const raised = [...new Set(triggers.triggers)].sort((a, b) => a - b).map(triggerName);
  return ['samples', 'names', ...used, ...raised];
}

class Page {
  constructor(data) {
    this.data = data;
    this.timeline = new Timeline(data);
    this.levels = new Levels(this.timeline, data);
    this.clock = new SampleClock(data.rate);
    this.view = new View(this.timeline);
    this.drawing = new Drawing(this);
    this.words = new Words(this);
    this.edges = new Edges(this.timeline);
    this.allLanes = lanesOf(this.timeline);
    this.state = {
      view: this.view, allLanes: this.allLanes, lanes: this.allLanes, cursors: {a: null, b: null}, active: 'a', scale: 'full',
    };
    this.hover = null;  // the sample under the pointer
    this.pointers = new Map();
    this.script = new ScriptPane(byId('script'), data.script, this.timeline, (line) => this.jumpToLine(line));
    this.script.colorOf = (step) => this.drawing.colorOf(step);
  }

  start() {
    byId('title').textContent = this.data.title;
    byId('summary').textContent = this.summary();
    this.makeLaneMenu();
    this.makeReadout();
    this.makeKeysTable();
    this.listen();
    readFragment(location.hash, this.state);
    this.setTheme(matchMedia('(prefers-color-scheme: dark)').matches ? 'dark' : 'light');
    this.applyLanes();
    this.refresh();
  }

  summary() {
    const enveloped = this.levels.isExact ? '' : '  \u00b7  waveforms as envelopes';
    const rate = formatQuantity(this.clock.rate, 'S/s');
    return `${this.data.width}-bit samples at ${rate}  \u00b7  ${this.words.ofLength()}${enveloped}`;
  }

  // ---- Drawing ----

  // Draws once, at the next frame, however often it is called before.
  refresh() {
    if (this.frame) return;
    this.frame = requestAnimationFrame(() => {
      this.frame = 0;
      this.draw();
    });
    clearTimeout(this.later);
    this.later = setTimeout(() => this.settle(), 120);
  }

  draw() {
    const element = byId('lanes');
    const {clientWidth: width, clientHeight: height} = element;
    this.layout = Drawing.layout(this.state.lanes, width, height);
    this.placeRows();
    const canvas = byId('picture');
    canvas.style.width = `${width}px`;
    canvas.style.height = `${this.layout.height}px`;
    this.drawing.draw(new CanvasPainter(canvas, width, this.layout.height), this.layout, this.state, this.theme);
    this.drawOverlay();
  }

  drawOverlay() {
    const {layout, theme} = this;
    const canvas = byId('overlay');
    canvas.style.width = `${layout.width}px`;
    canvas.style.height = `${layout.height}px`;
    const painter = new CanvasPainter(canvas, layout.width, layout.height);
    if (this.hover !== null) {
      const x = layout.left + this.view.xOf(this.hover, layout.plotWidth);
      painter.polyline([x, GAP, x, layout.bottom], theme.pale, {isDashed: true});
    }
    this.drawing.drawCursors(painter, layout, this.state, theme);
    this.fillReadout();
    this.lightLine();
  }

  // What may come a moment later than the picture.
  settle() {
    this.fillRuns();
    const fragment = writeFragment(this.state);
    if (fragment === location.hash) return;
    try {
      history.replaceState(null, '', fragment);
    } catch {
      // Some browsers refuse this for files, or when it happens too often: the view can still be used.
    }
  }

  // One element for each lane, over the picture, that can be focused and is named.
  placeRows() {
    for (const {lane, top, height} of this.layout.rows) {
      const row = byId(`lane-${lane}`);
      row.style.top = `${top}px`;
      row.style.height = `${height}px`;
    }
  }

  lightLine() {
    const sample = this.hover ?? this.state.cursors[this.state.active];
    const run = sample === null ? null : this.timeline.runAt(sample);
    this.script.light(run === null ? 0 : this.timeline.steps.line[run.step]);
  }

  setTheme(name) {
    this.themeName = name;
    this.theme = THEMES[name];
    const names = {cursorA: 'cursor-a', cursorB: 'cursor-b'};
    for (const [key, color] of Object.entries(this.theme)) {
      if (typeof color === 'string') document.documentElement.style.setProperty(`--${names[key] ?? key}`, color);
    }
    document.documentElement.style.colorScheme = name;
    document.querySelector('[data-action=toggleTheme]').textContent = name === 'dark' ? 'Light' : 'Dark';
    this.drawing.theme = this.theme;
    this.script.render();
  }

  svg() {
    const width = Math.max(900, byId('lanes').clientWidth);
    const layout = Drawing.layout(this.state.lanes, width, SAVED_HEIGHT);
    const painter = new SvgPainter(width, layout.height, `${this.data.title}, ${this.windowText()}`);
    this.drawing.draw(painter, layout, this.state, this.theme);
    this.drawing.drawCursors(painter, layout, this.state, this.theme);
    return painter.finish();
  }

  windowText() {
    return `samples ${formatCount(this.view.firstSample)} to ${formatCount(this.view.endSample)}`;
  }

  // ---- Tables and words ----

  makeReadout() {
    const body = byId('readout').tBodies[0];
    for (const [name, head] of [['hover', 'pointer'], ['a', 'A'], ['b', 'B'], ['between', 'A to B']]) {
      const row = rowOf(['', '', '', '', '']);
      const header = document.createElement('th');
      header.scope = 'row';
      row.className = `cursor-${name}`;
      row.prepend(header);
      body.append(row);
      if (name === 'a' || name === 'b') header.append(this.makeCursorButton(name, head));
      else header.textContent = head;
    }
  }

  makeCursorButton(name, head) {
    const button = document.createElement('button');
    button.type = 'button';
    button.textContent = head;
    button.setAttribute('aria-label', `Cursor ${head}`);
    button.addEventListener('click', () => this.useCursor(name));
    return button;
  }

  fillReadout() {
    const {a, b} = this.state.cursors;
    const empty = {sample: '', time: '', level: '', plays: '', line: ''};
    const hint = (key) => ({...empty, plays: `click, or key ${key}, to set it`});
    const rows = {
      hover: this.hover === null ? empty : this.words.at(this.hover),
      a: a === null ? hint('1') : this.words.at(a),
      b: b === null ? hint('2') : this.words.at(b),
      between: a === null || b === null ? empty : this.words.between(a, b),
    };
    for (const [name, texts] of Object.entries(rows)) {
      const row = document.querySelector(`#readout .cursor-${name}`);
      Object.values(texts).forEach((text, index) => { row.cells[index + 1].textContent = text; });
      row.querySelector('button')?.setAttribute('aria-pressed', String(this.state.active === name));
    }
  }

  fillRuns() {
    if (!byId('runs').open) return;
    const {rows, isAll} = runRows(this.words, this.view);
    document.querySelector('#runs tbody').replaceChildren(...rows);
    byId('runs-note').textContent = isAll ? `(${rows.length})` : `(the first ${rows.length})`;
  }

  makeKeysTable() {
    const body = document.querySelector('#keys tbody');
    for (const [keys, , what] of KEYS) {
      const row = rowOf(['', what]);
      for (const key of keys) {
        const element = document.createElement('kbd');
        element.textContent = key.replace(/Key|Digit|Arrow/, '').replace(/Numpad/, 'Num ').replace('+', ' + ');
        row.cells[0].append(element, ' ');
      }
      body.append(row);
    }
  }

  // A moment later, so that keys held down say only where they end.
  say(text) {
    clearTimeout(this.saying);
    this.saying = setTimeout(() => { byId('live').textContent = text; }, 250);
  }

  // ---- Lanes ----

  makeLaneMenu() {
    const fieldset = document.querySelector('#lane-menu fieldset');
    for (const lane of this.allLanes) {
      const label = document.createElement('label');
      const box = document.createElement('input');
      box.type = 'checkbox';
      box.value = lane;
      box.addEventListener('change', () => this.chooseLanes());
      label.append(box, lane);
      fieldset.append(label);
      const row = document.createElement('div');
      row.id = `lane-${lane}`;
      row.dataset.lane = lane;
      row.tabIndex = 0;
      row.setAttribute('role', 'application');
      row.setAttribute('aria-roledescription', 'lane');
      row.setAttribute('aria-label', lane);
      byId('rows').append(row);
    }
  }

  // The last one that is shown stays.
  chooseLanes() {
    const boxes = [...document.querySelectorAll('#lane-menu input')];
    const chosen = boxes.filter(({checked}) => checked).map(({value}) => value);
    if (chosen.length > 0) this.state.lanes = chosen;
    this.applyLanes();
    this.refresh();
  }

  applyLanes() {
    for (const box of document.querySelectorAll('#lane-menu input')) {
      box.checked = this.state.lanes.includes(box.value);
      byId(`lane-${box.value}`).hidden = !box.checked;
    }
    byId('scale').textContent = this.state.scale === 'full' ? 'Full scale' : 'Data\u2019s range';
  }

  // ---- What buttons and keys do ----

  // Where zooming holds on to: the pointer, else the cursor in use, else the middle.
  anchor() {
    const cursor = this.state.cursors[this.state.active];
    if (this.hover !== null) return this.hoverShare;
    return cursor !== null && this.view.contains(cursor) ? this.view.xOf(cursor, 1) : 0.5;
  }

  moveWindow(change) {
    change();
    this.say(`Window: ${this.windowText()}`);
    this.refresh();
  }

  zoomIn() { this.moveWindow(() => this.view.zoom(1 / ZOOM_STEP, this.anchor())); }
  zoomOut() { this.moveWindow(() => this.view.zoom(ZOOM_STEP, this.anchor())); }
  panLeft() { this.moveWindow(() => this.view.pan(-PAN_STEP)); }
  panRight() { this.moveWindow(() => this.view.pan(PAN_STEP)); }
  pageLeft() { this.moveWindow(() => this.view.pan(-0.9)); }
  pageRight() { this.moveWindow(() => this.view.pan(0.9)); }
  showWhole() { this.moveWindow(() => this.view.showWhole()); }
  showStart() { this.moveWindow(() => this.view.show(0n, this.view.span)); }
  showEnd() { this.moveWindow(() => this.view.show(this.view.limit - this.view.span, this.view.limit)); }

  showBetween() {
    const {a, b} = this.state.cursors;
    if (a === null || b === null) return this.say('Both cursors have to be set');
    const span = greatest(a > b ? a - b : b - a, 1n) * FINE;
    const from = least(a, b) * FINE;
    return this.moveWindow(() => this.view.show(greatest(0n, from - span / 20n), from + span + span / 20n));
  }

  toggleScale() {
    this.state.scale = this.state.scale === 'full' ? 'data' : 'full';
    this.applyLanes();
    this.say(byId('scale').textContent);
    this.refresh();
  }

  toggleTheme() {
    this.setTheme(this.themeName === 'dark' ? 'light' : 'dark');
    this.refresh();
  }

  showKeys() { byId('keys').showModal(); }
  focusPlace() { byId('place').select(); }

  saveSvg() {
    const link = document.createElement('a');
    link.href = URL.createObjectURL(new Blob([this.svg()], {type: 'image/svg+xml'}));
    link.download = `${this.data.title.replace(/[^\p{L}\p{N}._-]+/gu, '_')}.svg`;
    link.click();
    setTimeout(() => URL.revokeObjectURL(link.href), 10000);
    this.say('Saved');
  }

  // ---- Cursors ----

  setCursor(name, sample) {
    this.state.active = name;
    this.state.cursors[name] = clamp(sample, 0n, this.view.limit / FINE);
    this.say(this.words.announcementOf(name, this.state.cursors[name]));
    this.refresh();
  }

  // Shows it, too; one that is not set yet is put under the pointer or into the middle.
  useCursor(name) {
    const {width, sample} = {width: 1, sample: this.state.cursors[name]};
    this.setCursor(name, sample ?? this.hover ?? this.view.sampleAt(0.5, width));
    this.reveal(this.state.cursors[name]);
  }
  useA() { this.useCursor('a'); }
  useB() { this.useCursor('b'); }

  removeCursor() {
    this.state.cursors[this.state.active] = null;
    this.say(`Cursor ${this.state.active.toUpperCase()} removed`);
    this.refresh();
  }

  reveal(sample) {
    if (!this.view.contains(sample)) this.view.centre(sample);
    this.refresh();
  }

  moveCursor(to) {
    if (to === null) return this.say('No further edge');
    this.setCursor(this.state.active, to);
    return this.reveal(to);
  }
  cursorAt() { return this.state.cursors[this.state.active] ?? this.view.sampleAt(0.5, 1); }
  focusedLane() { return document.activeElement?.dataset?.lane; }
  toPreviousEdge() { this.moveCursor(this.edges.previous(this.cursorAt(), this.focusedLane())); }
  toNextEdge() { this.moveCursor(this.edges.next(this.cursorAt(), this.focusedLane())); }

  // By a pixel, and at least by a sample.
  stepOfCursor() { return BigInt(Math.max(1, Math.floor(this.view.samplesPerPixel(this.layout.plotWidth)))); }
  cursorLeft() { this.moveCursor(greatest(0n, this.cursorAt() - this.stepOfCursor())); }
  cursorRight() { this.moveCursor(this.cursorAt() + this.stepOfCursor()); }

  jumpToLine(line) {
    const step = this.script.stepOfLine.get(line);
    if (step === undefined) return this.say(`Line ${line} plays nothing by itself`);
    const sample = this.timeline.firstPlayOf(step);
    if (sample === null) return this.say(`Line ${line} is never played`);
    const run = this.timeline.whole(this.timeline.runAt(sample));
    const count = least(run.count, extentProduct(this.timeline.steps.samples[step], 1000n));
    if (run.count * FINE * 200n < this.view.span || run.count * FINE > this.view.span) {
      this.view.showSamples(greatest(0n, sample - least(sample, count / 2n)), extentSum(sample, count + count / 2n + 1n));
    }
    this.setCursor(this.state.active, sample);
    return this.reveal(sample);
  }

  // ---- The box ----

  goTo(text) {
    const {timeline} = this;
    const end = this.view.limit / FINE;
    const place = parsePlace(text, this.clock);
    if (place === null) throw new Error('Neither a sample (1000), a time (20ms) nor a range (10ms..20ms)');
    if (place.from > end) throw new Error(`${timeline.sampleCount === BEYOND ? 'Samples count to' : 'The play ends at'} ${formatCount(end)}`);
    if (place.to === undefined) return this.moveCursor(place.from);
    if (place.to <= place.from) throw new Error('The range ends before it begins');
    return this.moveWindow(() => this.view.showSamples(place.from, place.to));
  }

  onGo(event) {
    event.preventDefault();
    const box = byId('place');
    let problem = '';
    try {
      this.goTo(box.value);
    } catch (error) {
      problem = error.message;
    }
    byId('place-error').textContent = problem;
    box.setAttribute('aria-invalid', String(problem !== ''));
  }

  // ---- Events ----

  listen() {
    byId('go').addEventListener('submit', (event) => this.onGo(event));
    byId('place').addEventListener('input', () => { byId('place-error').textContent = ''; });
    byId('runs').addEventListener('toggle', () => this.refresh());
    document.addEventListener('click', (event) => this.onClick(event));
    document.addEventListener('keydown', (event) => this.onKey(event));
    window.addEventListener('hashchange', () => this.onFragment());
    window.addEventListener('beforeprint', () => this.onPrint(true));
    window.addEventListener('afterprint', () => this.onPrint(false));
    matchMedia('(prefers-color-scheme: dark)').addEventListener('change', ({matches}) => {
      this.setTheme(matches ? 'dark' : 'light');
      this.refresh();
    });
    new ResizeObserver(() => {
      this.script.render();
      this.refresh();
    }).observe(byId('lanes'));
    this.listenToPointers(byId('lanes'));
  }

  listenToPointers(lanes) {
    lanes.addEventListener('wheel', (event) => this.onWheel(event), {passive: false});
    lanes.addEventListener('pointerdown', (event) => this.onPointerDown(event));
    lanes.addEventListener('pointermove', (event) => this.onPointerMove(event));
    lanes.addEventListener('pointerup', (event) => this.onPointerUp(event));
    lanes.addEventListener('pointercancel', (event) => this.pointers.delete(event.pointerId));
    lanes.addEventListener('pointerleave', () => {
      this.hover = null;
      this.drawOverlay();
    });
  }

  onClick(event) {
    const {action} = event.target.closest('[data-action]')?.dataset ?? {};
    if (action) this[action]();
    if (!event.target.closest('#lane-menu')) byId('lane-menu').open = false;
  }

  onFragment() {
    if (location.hash === writeFragment(this.state)) return;
    readFragment(location.hash, this.state);
    this.applyLanes();
    this.refresh();
  }

  // Paper is white.
  onPrint(isBegin) {
    if (isBegin) this.themeOnScreen = this.themeName;
    this.setTheme(isBegin ? 'light' : this.themeOnScreen);
    byId('print').innerHTML = isBegin ? this.svg() : '';
    this.refresh();
  }

  onKey(event) {
    const {target} = event;
    if (event.ctrlKey || event.metaKey || event.altKey || byId('keys').open) return;
    if (event.code === 'Escape') byId('lane-menu').open = false;
    if (target.closest('input:not([type=checkbox]), select, textarea')) return;
    const key = (event.shiftKey ? 'Shift+' : '') + event.code;
    const isTaken = target.closest('[data-own-arrows]') && /^(Arrow|Page|Home|End)/.test(event.code);
    const entry = KEYS.find(([keys]) => keys.includes(key));
    if (!entry || isTaken) return;
    event.preventDefault();
    this[entry[1]]();
  }

  // ---- Pointers ----

  shareOf(event) {
    const {left, plotWidth} = this.layout;
    return (event.clientX - byId('lanes').getBoundingClientRect().left - left) / plotWidth;
  }
  clampedShare(event) { return Math.min(1, Math.max(0, this.shareOf(event))); }

  onWheel(event) {
    event.preventDefault();
    const unit = [1, 16, 400][event.deltaMode];
    const sideways = event.shiftKey ? event.deltaY + event.deltaX : event.deltaX;
    if (event.shiftKey || Math.abs(event.deltaX) > Math.abs(event.deltaY)) {
      this.view.pan(sideways * unit / this.layout.plotWidth);
    } else {
      const speed = event.ctrlKey ? 0.01 : 0.0022;  // pinches on a touchpad come as small turns with Ctrl
      this.view.zoom(Math.exp(event.deltaY * unit * speed), this.clampedShare(event));
    }
    this.refresh();
  }

  onPointerDown(event) {
    if (event.button !== 0) return;
    byId('lanes').setPointerCapture(event.pointerId);
    this.pointers.set(event.pointerId, event);
    const share = this.shareOf(event);
    this.grip = {
      x: event.clientX, from: this.view.from, to: this.view.to, isMoved: this.pointers.size > 1,
      cursor: this.cursorNear(share),
    };
    if (this.pointers.size === 2) this.pinch = this.pinchNow();
  }

  cursorNear(share) {
    const {plotWidth} = this.layout;
    const isNear = (name) => {
      const sample = this.state.cursors[name];
      return sample !== null && Math.abs(this.view.xOf(sample, plotWidth) - share * plotWidth) < 6;
    };
    return ['a', 'b'].find(isNear) ?? null;
  }

  onPointerMove(event) {
    if (this.pointers.has(event.pointerId)) this.pointers.set(event.pointerId, event);
    this.hoverShare = this.clampedShare(event);
    this.hover = this.view.sampleAt(this.hoverShare, 1);
    if (this.pointers.size === 2) this.movePinch();
    else if (this.pointers.size === 1 && this.grip) this.drag(event);
    else this.drawOverlay();
  }

  drag(event) {
    const {grip} = this;
    const by = event.clientX - grip.x;
    if (!grip.isMoved && Math.abs(by) < CLICK_PIXELS) return;
    grip.isMoved = true;
    byId('lanes').classList.add('dragging');
    if (grip.cursor !== null) {
      this.setCursor(grip.cursor, this.snapped(event));
    } else {
      const shift = BigInt(Math.round(Number(grip.to - grip.from) * by / this.layout.plotWidth));
      this.view.show(grip.from - shift, grip.to - shift);
    }
    this.refresh();
  }

  // What both fingers lie on stays under them.
  pinchNow() {
    const shares = [...this.pointers.values()].map((event) => this.shareOf(event));
    const [left, right] = [Math.min(...shares), Math.max(...shares)];
    return {left, width: Math.max(0.02, right - left), from: this.view.from, span: Number(this.view.span)};
  }

  movePinch() {
    const now = this.pinchNow();
    const start = this.pinch;
    const span = start.span * start.width / now.width;
    const from = start.from + BigInt(Math.round(start.left * start.span - now.left * span));
    this.view.show(greatest(from, 0n), greatest(from, 0n) + BigInt(Math.round(span)));
    this.refresh();
  }

  onPointerUp(event) {
    const wasAlone = this.pointers.size === 1;
    this.pointers.delete(event.pointerId);
    byId('lanes').classList.remove('dragging');
    if (wasAlone && this.grip && !this.grip.isMoved) this.clickLanes(event);
    this.grip = null;
    if (event.pointerType === 'touch') this.hover = null;
  }

  clickLanes(event) {
    const {active} = this.state;
    const other = active === 'a' ? 'b' : 'a';
    this.setCursor(event.shiftKey ? other : active, this.snapped(event));
    document.elementsFromPoint(event.clientX, event.clientY).find(({dataset}) => dataset.lane)?.focus({preventScroll: true});
  }

  snapped(event) {
    const sample = this.view.sampleAt(this.clampedShare(event), 1);
    if (event.altKey) return sample;
    const reach = this.view.samplesPerPixel(this.layout.plotWidth) * SNAP_PIXELS;
    return this.edges.snap(sample, BigInt(Math.floor(reach)));
  }
}

// Keys by place, the function of Page, and what is said of it.
const KEYS = [
  [['KeyW', 'ArrowUp'], 'zoomIn', 'zoom in, on the pointer, else on the cursor in use'],
  [['KeyS', 'ArrowDown'], 'zoomOut', 'zoom out'],
  [['KeyA', 'ArrowLeft'], 'panLeft', 'move to what was before'],
  [['KeyD', 'ArrowRight'], 'panRight', 'move to what comes'],
  [['PageUp'], 'pageLeft', 'a window back'],
  [['PageDown'], 'pageRight', 'a window on'],
  [['Home'], 'showStart', 'to the start'],
  [['End'], 'showEnd', 'to the end'],
  [['Digit0', 'Numpad0'], 'showWhole', 'the whole play'],
  [['Digit1', 'Numpad1'], 'useA', 'use cursor A, and set it if it is not'],
  [['Digit2', 'Numpad2'], 'useB', 'use cursor B, likewise'],
  [['KeyQ'], 'toPreviousEdge', 'the cursor to the edge before it: of the focused lane, else of any'],
  [['KeyE'], 'toNextEdge', 'the cursor to the next edge'],
  [['Shift+ArrowLeft', 'Shift+KeyA'], 'cursorLeft', 'the cursor back by a pixel, at least a sample'],
  [['Shift+ArrowRight', 'Shift+KeyD'], 'cursorRight', 'the cursor on, likewise'],
  [['KeyC'], 'showBetween', 'the window from one cursor to the other'],
  [['KeyX', 'Delete'], 'removeCursor', 'remove the cursor in use'],
  [['KeyF'], 'toggleScale', 'full scale, or the range of the data'],
  [['KeyG'], 'focusPlace', 'go to a sample, a time or a range'],
  [['KeyH', 'F1'], 'showKeys', 'this list'],
];

const page = new Page(readData());
page.start();
