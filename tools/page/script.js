// The text of the script beside the lanes. Only the lines in sight are elements, so that a long script costs no more.
const LINE_HEIGHT = 20;

class ScriptPane {
  // `onJump(line)`: a line was chosen. Lines count from 1.
  constructor(element, text, timeline, onJump) {
    this.element = element;
    this.lines = text.replace(/\n$/, '').split('\n').map((line) => line.replace(/\r$/, ''));
    this.stepOfLine = ScriptPane.stepsByLine(timeline);
    this.onJump = onJump;
    this.lit = 0;
    this.current = 1;
    this.colorOf = () => 'transparent';
    element.style.setProperty('--number-width', `${String(this.lines.length).length + 2}ch`);
    this.spacer = element.appendChild(document.createElement('div'));
    this.spacer.style.height = `${this.lines.length * LINE_HEIGHT}px`;
    this.shown = element.appendChild(document.createElement('div'));
    element.addEventListener('scroll', () => this.render());
    element.addEventListener('click', (event) => this.choose(Number(event.target.closest('[data-line]')?.dataset.line)));
    element.addEventListener('keydown', (event) => this.onKey(event));
  }

  // The first step of each line that plays something: of a loop the first in it.
  static stepsByLine({steps, blocks}) {
    const found = new Map();
    const add = (line, step) => {
      if (line > 0 && !found.has(line)) found.set(line, step);
    };
    for (let step = 0; step < steps.count; ++step) add(steps.line[step], step);
    for (let block = 0; block < blocks.count; ++block) add(blocks.line[block], blocks.first[block]);
    return found;
  }

  render() {
    const {scrollTop, clientHeight} = this.element;
    const first = Math.max(0, Math.floor(scrollTop / LINE_HEIGHT) - 5);
    const end = Math.min(this.lines.length, Math.ceil((scrollTop + clientHeight) / LINE_HEIGHT) + 5);
    const lines = [];
    for (let index = first; index < end; ++index) lines.push(this.makeLine(index + 1));
    this.shown.replaceChildren(...lines);
    this.element.setAttribute('aria-activedescendant', `line-${this.current}`);
  }

  makeLine(number) {
    const step = this.stepOfLine.get(number);
    const line = document.createElement('div');
    line.id = `line-${number}`;
    line.dataset.line = number;
    line.className = `line ${step === undefined ? 'silent' : 'plays'}`;
    line.classList.toggle('lit', number === this.lit);
    line.classList.toggle('current', number === this.current);
    line.style.top = `${(number - 1) * LINE_HEIGHT}px`;
    line.setAttribute('role', 'option');
    line.setAttribute('aria-selected', String(number === this.lit));
    line.setAttribute('aria-posinset', number);
    line.setAttribute('aria-setsize', this.lines.length);
    const [gutter, colour] = [document.createElement('span'), document.createElement('span')];
    gutter.className = 'number';
    gutter.textContent = number;
    colour.className = 'colour';
    if (step !== undefined) colour.style.background = this.colorOf(step);
    line.append(gutter, colour, this.lines[number - 1]);
    return line;
  }

  // 0: none.
  light(line) {
    if (line === this.lit) return;
    this.lit = line;
    if (line > 0) this.reveal(line);
    this.render();
  }

  reveal(line) {
    const top = (line - 1) * LINE_HEIGHT;
    const {scrollTop, clientHeight} = this.element;
    if (top < scrollTop || top + LINE_HEIGHT > scrollTop + clientHeight) this.element.scrollTop = top - clientHeight / 3;
  }

  choose(line) {
    if (!line) return;
    this.current = line;
    this.reveal(line);
    this.render();
    this.onJump(line);
  }

  onKey(event) {
    const moves = {ArrowUp: -1, ArrowDown: 1, PageUp: -20, PageDown: 20, Home: -Infinity, End: Infinity};
    if (event.code === 'Enter' || event.code === 'Space') this.choose(this.current);
    else if (event.code in moves) this.move(moves[event.code]);
    else return;
    event.preventDefault();
    event.stopPropagation();
  }

  move(by) {
    this.current = Math.min(this.lines.length, Math.max(1, this.current + by));
    this.reveal(this.current);
    this.render();
  }
}
