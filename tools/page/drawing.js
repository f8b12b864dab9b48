// The lanes of a window, drawn with either painter. A drawing costs the same at every length of the play.
const THEMES = {
  light: {
    page: '#ffffff', panel: '#f5f6f8', ink: '#1d2329', pale: '#5c6670', frame: '#b4bac1', grid: '#e8eaed',
    samples: '#1f5a94', marker: '#00695c', manyMarkers: '#7fb3ab', trigger: '#b93a07', wait: '#e9eaec', waitLine: '#b9bdc2', beyond: '#eff0f2',
    cursorA: '#8e24aa', cursorB: '#ad6200', focus: '#0b63ce', lit: '#fff0b8', error: '#b3261e',
    waveforms: ['#9cc3e6', '#f7c48f', '#a9d8a4', '#d9b8e3', '#f3afaf', '#d5ce86', '#a0d9d4', '#d6bca4'],
  },
  dark: {
    page: '#14181d', panel: '#1c2229', ink: '#e8ebee', pale: '#a2acb6', frame: '#4a545e', grid: '#262d35',
    samples: '#6cb0f0', marker: '#4fc3ae', manyMarkers: '#2b655c', trigger: '#ff8a50', wait: '#2a3138', waitLine: '#4c565f', beyond: '#1b2026',
    cursorA: '#d68bea', cursorB: '#f0b35a', focus: '#7ab8ff', lit: '#4a4214', error: '#ff8a80',
    waveforms: ['#2c5f8e', '#8a5a21', '#3c7440', '#6d4a80', '#8a4444', '#716a1f', '#2c726c', '#75583c'],
  },
};
const NAMES_HEIGHT = 44;
const EVENTS_HEIGHT = 26;
const AXIS_HEIGHT = 42;
const GAP = 8;
const LEAST_SAMPLES_HEIGHT = 130;
const TICK_PIXELS = 110;
const MOST_CACHED = 50000;
const MOST_TRIGGER_LINES = 40;

const niceStep = (span, count) => {  // {factor, power} of the step
  const power = Math.floor(Math.log10(span / count));
  const factor = [1, 2, 5].find((candidate) => candidate * 10 ** power >= span / count * (1 - 1e-9));
  return factor ? {factor, power} : {factor: 1, power: power + 1};
};

// {unit, base, ticks: [{x, text}]}: far from the start ticks count from `base`, a text, else null.
function timeTicks(view, clock, width) {
  const window = clock.seconds(view.from, FINE);
  const span = Number(view.span) / Number(FINE) / clock.rate;
  const {factor, power} = niceStep(span, Math.max(2, Math.floor(width / TICK_PIXELS)));
  const [unit, exponent] = TIME_UNITS.find(([, candidate]) => span * 10 ** candidate >= 1) ?? TIME_UNITS.at(-1);
  const up = powerOfTen(Math.max(-power, 0));
  const down = powerOfTen(Math.max(power, 0));
  const step = {numerator: BigInt(factor) * down, denominator: up};  // seconds
  const first = divideUp(window.numerator * step.denominator, window.denominator * step.numerator);
  const far = Math.ceil(Math.log10(span)) + 1;
  const isFar = Number(window.numerator) / Number(window.denominator) * 10 ** exponent >= 1e6;
  const perBase = powerOfTen(far - power);  // of the smallest decimals
  const base = isFar ? first * BigInt(factor) / perBase * perBase : 0n;
  const ticks = [];
  for (let index = first; ; ++index) {
    const fine = divideRounded(index * step.numerator * clock.numerator * FINE, step.denominator * clock.denominator);
    if (fine > view.to) break;
    const value = index * BigInt(factor) - base;  // of 10^power seconds
    const decimals = Math.max(0, -(power + exponent));
    const text = formatFraction(value * powerOfTen(Math.max(0, power + exponent)), powerOfTen(decimals), decimals);
    ticks.push({x: view.xOfFine(fine, width), text});
  }
  return {unit, base: isFar ? `${formatFraction(base * down, up, Math.max(0, -power))} s +` : null, ticks};
}

class Drawing {
  constructor(model) {
    Object.assign(this, model);  // timeline, levels, clock
    this.shares = new Shares(this.timeline);
    this.envelope = {bucket: 0n, columns: new Map()};
  }

  // Where everything is in a picture of that size, which has room: [{lane, top, height}], and the plot's edges.
  static layout(lanes, width, height) {
    const isNarrow = width < 640;
    const left = isNarrow ? 66 : 92;
    const right = isNarrow ? 12 : 64;
    const heightOf = (lane) => (lane === 'names' ? NAMES_HEIGHT : EVENTS_HEIGHT);
    const others = lanes.filter((lane) => lane !== 'samples');
    const fixed = others.reduce((sum, lane) => sum + heightOf(lane), 0) + GAP * (lanes.includes('samples') ? 2 : 1);
    const room = Math.max(LEAST_SAMPLES_HEIGHT, height - fixed - AXIS_HEIGHT - GAP);
    let top = GAP;
    const rows = lanes.map((lane) => {
      const row = {lane, top, height: lane === 'samples' ? room : heightOf(lane)};
      top += row.height + (lane === 'samples' ? GAP : 0);
      return row;
    });
    return {left, plotWidth: width - left - right, width, rows, bottom: top + GAP / 2, height: top + GAP / 2 + AXIS_HEIGHT};
  }

  draw(painter, layout, state, theme) {
    Object.assign(this, {painter, layout, state, theme, view: state.view});
    painter.rectangle(0, 0, layout.width, layout.height, theme.page);
    this.drawGrid();
    for (const row of layout.rows) this.drawLane(row);
    this.drawBehindTheEnd();
  }

  label(x, y, text, style = {}) {
    this.painter.text(x, y, text, {size: 12, color: this.theme.ink, ...style});
  }
  line(fromX, fromY, toX, toY, color, options) { this.painter.polyline([fromX, fromY, toX, toY], color, options); }
  inPlot(row, draw) { this.painter.clipped(this.layout.left, row.top, this.layout.plotWidth, row.height, draw); }
  xOf(sample) { return this.layout.left + this.view.xOf(sample, this.layout.plotWidth); }

  drawLane(row) {
    const {lane} = row;
    if (lane === 'samples') this.drawSamples(row);
    else if (lane === 'names') this.drawNames(row);
    else if (lane.startsWith('marker')) this.drawMarker(row, Number(lane.slice('marker'.length)));
    else this.drawTrigger(row, lane);
  }

  drawGrid() {
    const {left, plotWidth, bottom} = this.layout;
    const {unit, base, ticks} = timeTicks(this.view, this.clock, plotWidth);
    this.line(left, bottom, left + plotWidth, bottom, this.theme.frame);
    for (const {x, text} of ticks) {
      this.line(left + x, GAP, left + x, bottom, this.theme.grid);
      this.line(left + x, bottom, left + x, bottom + 5, this.theme.frame);
      this.label(left + x, bottom + 19, text, {color: this.theme.pale, align: 'center'});
    }
    this.label(left - 10, bottom + 19, `time (${unit})`, {align: 'right'});
    if (base !== null) this.label(left, bottom + 36, base, {color: this.theme.pale});
  }

  // ---- Samples ----

  levelScale() {
    const {all, fullScale} = this.levels;
    if (this.state.scale === 'full') return {low: -1.04, high: 1.04};
    const low = Math.min(0, all.low / fullScale);
    const high = Math.max(0, all.high / fullScale);
    const room = low === high ? 1 : 0.06 * (high - low);
    return {low: low - room, high: high + room};
  }

  drawSamples(row) {
    const {low, high} = this.levelScale();
    const yOf = (share) => row.top + row.height * (high - share) / (high - low);
    this.drawLevelAxis(row, low, high, yOf);
    const yOfLevel = (level) => yOf(level / this.levels.fullScale);
    const perPixel = this.view.samplesPerPixel(this.layout.plotWidth);
    this.inPlot(row, () => (perPixel >= 1 ? this.drawEnvelope(perPixel, yOfLevel) : this.drawSteps(perPixel, yOfLevel)));
    const {left, plotWidth} = this.layout;
    const [right, bottom] = [left + plotWidth, row.top + row.height];
    this.painter.polyline([left, row.top, right, row.top, right, bottom, left, bottom, left, row.top], this.theme.frame);
  }

  drawLevelAxis(row, low, high, yOf) {
    const {left, plotWidth} = this.layout;
    const {factor, power} = niceStep(high - low, Math.max(2, Math.floor(row.height / 42)));
    const step = factor * 10 ** power;
    for (let index = Math.ceil(low / step); index * step <= high; ++index) {
      const y = yOf(index * step);
      this.line(left, y, left + plotWidth, y, index === 0 ? this.theme.frame : this.theme.grid);
      const text = (index * step).toFixed(Math.max(0, -power)).replace('-', '\u2212');
      this.label(left - 10, y + 4, text, {color: this.theme.pale, align: 'right'});
    }
  }

  // The levels of a bucket, which is the same one wherever the window is.
  levelsOfBucket(bucket, index) {
    const {columns} = this.envelope;
    if (this.envelope.bucket !== bucket || columns.size > MOST_CACHED) {
      columns.clear();
      this.envelope.bucket = bucket;
    }
    let levels = columns.get(index);
    if (levels === undefined) {
      levels = this.levels.over(index * bucket, (index + 1n) * bucket);
      columns.set(index, levels);
    }
    return levels;
  }

  drawEnvelope(perPixel, yOf) {
    const bucket = powerOfTwoUpTo(BigInt(Math.floor(perPixel)));
    const end = least(this.view.endSample, this.timeline.sampleCount);
    const columnWidth = Number(bucket) / perPixel;
    const numbers = [];
    let before = {low: -Infinity, high: Infinity};
    for (let index = this.view.firstSample / bucket; index * bucket < end; ++index) {
      const levels = this.levelsOfBucket(bucket, index);
      // Neighbours always join.
      const top = yOf(Math.max(levels.high, before.low));
      const bottom = yOf(Math.min(levels.low, before.high));
      numbers.push(this.xOf(index * bucket), top - 0.7, columnWidth + 0.6, bottom - top + 1.4);
      before = levels;
    }
    this.painter.rectangles(numbers, this.theme.samples);
  }

  // Every sample holds its level until the next one.
  drawSteps(perPixel, yOf) {
    const end = least(this.view.endSample, this.timeline.sampleCount);
    const points = [];
    const dots = [];
    const blurs = [];
    for (let run = this.timeline.runAt(this.view.firstSample); run && run.first < end; run = this.timeline.next(run)) {
      const stop = least(run.end, end);
      for (let sample = greatest(run.first, this.view.firstSample); sample < stop; ++sample) {
        const {low, high} = this.levels.inRun(run, sample);
        const [x, next] = [this.xOf(sample), this.xOf(sample + 1n)];
        if (low === high) points.push(x, yOf(low), next, yOf(low));
        else blurs.push(x, yOf(high), next - x, yOf(low) - yOf(high));
        if (low === high && next - x >= 8) dots.push(x - 2.5, yOf(low) - 2.5, 5, 5);
      }
    }
    this.painter.rectangles(blurs, this.theme.samples);
    this.painter.polyline(points, this.theme.samples, {width: 1.5});
    this.painter.rectangles(dots, this.theme.samples);
  }

  drawBehindTheEnd() {
    const {left, plotWidth, rows, bottom} = this.layout;
    const x = this.xOf(this.timeline.sampleCount);
    if (x >= left + plotWidth || rows.length === 0) return;
    this.painter.rectangle(Math.max(x, left), GAP + 1, left + plotWidth - Math.max(x, left) - 1, bottom - GAP - 1, this.theme.beyond);
    this.line(x, GAP, x, bottom, this.theme.frame);
  }

  // ---- Names ----

  colorOf(step) {
    const {waveforms, wait} = this.theme;
    const waveform = this.timeline.steps.waveform[step];
    return waveform === NO_WAVEFORM ? wait : waveforms[waveform % waveforms.length];
  }

  drawNames(row) {
    const inner = {top: row.top + 3, height: row.height - 7};
    this.label(this.layout.left - 10, row.top + row.height / 2 + 3, 'playing', {align: 'right'});
    this.inPlot(row, () => {
      for (const box of boxesOf(this.timeline, this.view, this.layout.plotWidth)) this.drawBox(box, inner);
    });
  }

  drawBox(box, row) {
    const {left, plotWidth} = this.layout;
    const [first, end] = [this.xOf(box.first), this.xOf(box.end)];
    const x = Math.max(first, left - 1);
    const width = Math.min(end, left + plotWidth + 1) - x;
    if (box.kind === 'mixture') return this.drawMixture(box, row);
    this.fillBox(box, x, Math.max(width > 4 ? width - 1 : width, 0.6), row);
    return this.writeInBox(box, x, width, row);
  }

  drawMixture(box, row) {
    for (const {first, end, run} of box.runs) {
      const x = this.xOf(first);
      this.painter.rectangle(x, row.top, this.xOf(end) - x + 0.4, row.height, this.colorOf(run.step));
    }
  }

  fillBox(box, x, width, row) {
    if (box.kind === 'run') {
      this.painter.rectangle(x, row.top, width, row.height, this.colorOf(box.run.step));
      if (this.timeline.steps.trigger[box.run.step] !== 0) this.hatch(x, width, row);
      return;
    }
    let {top} = row;
    for (const [step, share] of this.shares.of(box.block)) {
      this.painter.rectangle(x, top, width, row.height * share, this.colorOf(step));
      top += row.height * share;
    }
  }

  hatch(x, width, row) {
    this.painter.clipped(x, row.top, width, row.height, () => {
      for (let at = x - row.height; at < x + width; at += 8) {
        this.line(at, row.top + row.height, at + row.height, row.top, this.theme.waitLine);
      }
    });
  }

  writeInBox(box, x, width, row) {
    const style = {size: 12, isBold: true};
    const text = Ruler.elide(textOf(box, this.timeline, this.shares), width - 10, style);
    if (text === '') return;
    const line = box.kind === 'run' ? this.timeline.steps.line[box.run.step] : this.lineOf(box);
    const lineText = line === 0 ? '' : `line ${line}`;
    const hasLine = lineText !== '' && Ruler.widthOf(lineText, {size: 10.5}) <= width - 10;
    const centre = x + width / 2;
    const middle = row.top + row.height / 2;
    if (box.kind !== 'run' || this.timeline.steps.trigger[box.run.step] !== 0) {
      const half = Ruler.widthOf(text, style) / 2 + 5;
      this.painter.rectangle(centre - half, row.top + 3, 2 * half, row.height - 6, this.colorOf(this.mostOf(box)));
    }
    this.label(centre, middle + (hasLine ? -1 : 4), text, {...style, align: 'center'});
    if (hasLine) this.label(centre, middle + 13, lineText, {size: 10.5, color: this.theme.ink, align: 'center'});
  }

  mostOf(box) { return box.kind === 'passes' ? this.shares.of(box.block)[0][0] : box.run.step; }
  lineOf(box) { return box.block === null ? 0 : this.timeline.blocks.line[box.block]; }

  // ---- Markers and triggers ----

  drawEvents(row, name, count, draw) {
    const {left, plotWidth, width} = this.layout;
    const base = row.top + row.height - 5;
    this.label(left - 10, row.top + row.height / 2 + 5, name, {align: 'right'});
    this.line(left, base, left + plotWidth, base, this.theme.frame);
    this.inPlot(row, draw);
    if (width - left - plotWidth < 40) return;
    const text = this.countText(count, width - left - plotWidth - 10);
    this.label(left + plotWidth + 6, row.top + row.height / 2 + 5, text, {size: 11, color: this.theme.pale});
  }

  countText(count, width) {
    if (count === BEYOND) return '\u00d7 \u221e';
    const text = `\u00d7 ${formatCount(count)}`;
    return Ruler.widthOf(text, {size: 11}) <= width ? text : `\u00d7 ${formatQuantity(Number(count), '')}`;
  }

  drawMarker(row, marker) {
    const index = this.timeline.markers[marker];
    const end = least(this.view.endSample, this.timeline.sampleCount);
    const first = index.countBefore(this.view.firstSample);
    const last = index.countBefore(end);
    this.drawEvents(row, `marker${marker}`, last === BEYOND ? BEYOND : last - first, () => this.drawPulses(row, index, first, end));
  }

  // None is drawn twice into a bucket, and passes that are narrower than one are drawn as a whole, paler.
  drawPulses(row, index, first, end) {
    const perPixel = this.view.samplesPerPixel(this.layout.plotWidth);
    const bucket = powerOfTwoUpTo(BigInt(Math.floor(perPixel)));
    const bars = [];
    const many = [];
    let pulse = index.pulse(first);
    while (pulse !== null && pulse < end) {
      const run = this.timeline.runAt(pulse);
      const dense = this.timeline.repetition(run, bucket);
      const from = bucket === 1n ? pulse : pulse / bucket * bucket;
      const to = dense === null ? from + bucket : greatest(least(dense.end, end), from + bucket);
      const x = Math.max(this.xOf(from), this.layout.left - 2);
      (dense === null ? bars : many).push(x, row.top + 4, Math.max(1.6, this.xOf(to) - x), row.height - 9);
      pulse = to >= end ? null : index.pulse(index.countBefore(to));
    }
    this.painter.rectangles(many, this.theme.manyMarkers);
    this.painter.rectangles(bars, this.theme.marker);
  }

  drawTrigger(row, name) {
    const {samples, triggers} = this.timeline.triggers;
    const first = partitionPoint(samples.length, (i) => samples[i] >= this.view.firstSample);
    const end = partitionPoint(samples.length, (i) => samples[i] > this.view.endSample);
    const raised = [];
    for (let i = first; i < end; ++i) {
      if (triggerName(triggers[i]) === name) raised.push(this.xOf(samples[i]));
    }
    this.drawEvents(row, name, BigInt(raised.length), () => {
      let drawn = -Infinity;
      for (const x of raised) {
        if (x < drawn + 1) continue;
        this.painter.polygon([x - 5, row.top + 4, x + 5, row.top + 4, x, row.top + row.height - 6], this.theme.trigger);
        drawn = x;
      }
    });
    if (raised.length <= MOST_TRIGGER_LINES) this.drawTriggerLines(row, raised);
  }

  drawTriggerLines(row, raised) {
    const samples = this.layout.rows.find(({lane}) => lane === 'samples');
    if (!samples) return;
    this.inPlot(samples, () => {
      for (const x of raised) {
        this.line(x, samples.top, x, samples.top + samples.height, this.theme.trigger, {isDashed: true});
      }
    });
  }

  // ---- Cursors ----

  drawCursors(painter, layout, state, theme) {
    for (const name of ['a', 'b']) {
      const sample = state.cursors[name];
      if (sample === null) continue;
      const x = layout.left + state.view.xOf(sample, layout.plotWidth);
      if (x < layout.left - 0.5 || x > layout.left + layout.plotWidth + 0.5) continue;
      const color = name === 'a' ? theme.cursorA : theme.cursorB;
      painter.polyline([x, GAP, x, layout.bottom], color, {width: state.active === name ? 2 : 1.25});
      painter.rectangle(x - 8, 0, 16, 15, color);
      painter.text(x, 11.5, name.toUpperCase(), {size: 11, color: theme.page, isBold: true, align: 'center'});
    }
  }
}
