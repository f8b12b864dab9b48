// What is said in words of the lanes: the table of cursors, the table of runs, and what a screen reader is told.
const MOST_RUNS = 200;

// Edges of runs and markers, where cursors snap to.
class Edges {
  constructor(timeline) { this.timeline = timeline; }

  markersOf(lane) {
    const {markers} = this.timeline;
    return lane?.startsWith('marker') ? [markers[Number(lane.slice('marker'.length))]] : markers.filter(({isUsed}) => isUsed);
  }

  // The nearest edge behind `sample`, in a lane or, where none is named, in any; null where there is none.
  next(sample, lane) {
    const {timeline} = this;
    const found = this.markersOf(lane).map((marker) => marker.pulse(marker.countBefore(sample + 1n)));
    if (!lane || lane === 'samples' || lane === 'names') found.push(timeline.runAt(sample)?.end ?? null);
    if (lane?.startsWith('trigger')) return this.raised(lane).find((raised) => raised > sample) ?? null;
    return found.filter((edge) => edge !== null && edge !== BEYOND).reduce((a, b) => (a !== null && a < b ? a : b), null);
  }

  // The nearest one before it.
  previous(sample, lane) {
    const {timeline} = this;
    if (lane?.startsWith('trigger')) return this.raised(lane).findLast((raised) => raised < sample) ?? null;
    const found = this.markersOf(lane).map((marker) => {
      const count = marker.countBefore(sample);
      return count === 0n || count === BEYOND ? null : marker.pulse(count - 1n);
    });
    const isOfRuns = !lane || lane === 'samples' || lane === 'names';
    if (isOfRuns && sample > 0n) found.push(timeline.runAt(least(sample, timeline.sampleCount) - 1n).first);
    return found.filter((edge) => edge !== null).reduce((a, b) => (a !== null && a > b ? a : b), null);
  }

  raised(lane) {
    const {samples, triggers} = this.timeline.triggers;
    return Array.from(samples).filter((_, index) => triggerName(triggers[index]) === lane);
  }

  // The edge within so many samples, else the sample itself.
  snap(sample, reach) {
    const candidates = [this.previous(sample + 1n), this.next(sample)].filter((edge) => edge !== null);
    const distance = (edge) => (edge > sample ? edge - sample : sample - edge);
    const near = candidates.filter((edge) => distance(edge) <= reach);
    return near.length === 0 ? sample : near.reduce((a, b) => (distance(b) < distance(a) ? b : a));
  }
}

const MINUS = '\u2212';

class Words {
  constructor({timeline, levels, clock}) { Object.assign(this, {timeline, levels, clock}); }

  // What there is at a sample, as texts; behind the end the level and what follows are empty.
  at(sample) {
    const run = this.timeline.runAt(sample);
    const texts = {sample: formatCount(sample), time: this.clock.format(sample), level: '', plays: 'the end', line: ''};
    if (run === null) return texts;
    const line = this.timeline.steps.line[run.step];
    return {...texts, level: this.level(this.levels.inRun(run, sample)), plays: this.plays(run), line: line || ''};
  }

  plays(run) {
    const name = this.timeline.nameOf(run.step);
    const passes = this.timeline.isCounted(run.block) ? this.timeline.blocks.passes[run.block] : BEYOND;
    if (passes === 1n) return name;
    const of = passes === BEYOND ? '' : ` of ${formatCount(passes)}`;
    return `${name}, pass ${formatCount(run.pass + 1n)}${of}`;
  }

  level({low, high}) {
    const one = (level) => (level / this.levels.fullScale).toFixed(4).replace('-', MINUS);
    return low === high ? `${one(low)} (${String(low).replace('-', MINUS)})` : `${one(low)} to ${one(high)}`;
  }

  between(a, b) {
    const distance = a < b ? b - a : a - b;
    const sign = b < a ? MINUS : '';
    const frequency = distance === 0n ? '' : `1/time ${formatQuantity(this.clock.rate / Number(distance), 'Hz')}`;
    return {
      sample: sign + formatCount(distance), time: sign + this.clock.format(distance), level: '', plays: frequency, line: '',
    };
  }

  announcementOf(name, sample) {
    const {sample: at, time, level, plays, line} = this.at(sample);
    const where = line === '' ? '' : `, line ${line}`;
    return `Cursor ${name.toUpperCase()}: sample ${at}, ${time}, ${plays}${where}${level === '' ? '' : `, level ${level}`}`;
  }

  ofLength() {
    const {length} = this.timeline;
    if (length.kind === 'exact') {
      return `${plural(BigInt(length.samples), 'sample')}  \u00b7  ${this.clock.format(BigInt(length.samples))}`;
    }
    if (length.kind === 'endless') return 'plays without end';
    if (length.kind === 'tooLong') return 'longer than 64 bits count';
    return `waits for ${triggerName(length.trigger)} at line ${length.line} from ${this.clock.format(BigInt(length.since))} on`;
  }
}

const cellOf = (text) => {
  const cell = document.createElement('td');
  cell.textContent = text;
  return cell;
};

function rowOf(texts) {
  const row = document.createElement('tr');
  row.append(...texts.map(cellOf));
  return row;
}

// The runs of the window as rows, and whether these are all.
function runRows(words, view) {
  const {timeline, clock} = words;
  const end = least(view.endSample, timeline.sampleCount);
  const rows = [];
  let run = timeline.runAt(view.firstSample);
  for (; run && run.first < end && rows.length < MOST_RUNS; run = timeline.next(run)) {
    const {steps} = timeline;
    const count = run.count === BEYOND ? 'for ever' : formatCount(run.count);
    rows.push(rowOf([
      formatCount(run.first), clock.format(run.first), count, timeline.nameOf(run.step), steps.line[run.step] || '',
      steps.address[run.step], formatCount(run.pass + 1n), formatCount(run.round + 1n),
    ]));
  }
  return {rows, isAll: !run || run.first >= end};
}
