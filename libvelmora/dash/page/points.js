// The points of one sensor in the order of time, as two columns of numbers: an object for each would take four times
// the room, and what is collected late.

const firstRoom = 64;

export class Points {
  #times = new Float64Array(firstRoom);
  #values = new Float64Array(firstRoom);
  #begin = 0; // of those that are kept
  #end = 0;

  get size() {
    return this.#end - this.#begin;
  }

  time(index) {
    return this.#times[this.#begin + index];
  }

  value(index) {
    return this.#values[this.#begin + index];
  }

  // One that is not behind the last one is left out.
  add(time, value) {
    if (this.size > 0 && time <= this.#times[this.#end - 1]) return;
    if (this.#end === this.#times.length) this.#makeRoom();
    this.#times[this.#end] = time;
    this.#values[this.#end++] = value;
  }

  // Lets go of what is older than a time, and of the oldest where there are more than so many.
  trim(oldest, most) {
    this.#begin = Math.max(this.#begin + this.indexFrom(oldest), this.#end - most);
  }

  // Where the first point at or behind a time is; size if there is none.
  indexFrom(time) {
    let low = this.#begin;
    let high = this.#end;
    while (low < high) {
      const middle = (low + high) >> 1;
      if (this.#times[middle] < time) low = middle + 1;
      else high = middle;
    }
    return low - this.#begin;
  }

  // Puts further points among these; of a time that is there already nothing is taken.
  merge(times, values) {
    const all = new Map(times.map((time, index) => [time, values[index]]));
    for (let i = 0; i < this.size; ++i) all.set(this.time(i), this.value(i));
    this.#begin = this.#end = 0;
    for (const [time, value] of [...all].sort((a, b) => a[0] - b[0])) this.add(time, value);
  }

  // The points between two indices, of each stretch of so many milliseconds only the first, the lowest, the highest and
  // the last. Stretches begin at whole multiples, so that a point is not in now and out then as time goes on.
  thinned(first, end, stretch, take) {
    for (let begin = first, next; begin < end; begin = next) {
      const place = Math.floor(this.time(begin) / stretch);
      let low = begin;
      let high = begin;
      for (next = begin + 1; next < end && Math.floor(this.time(next) / stretch) === place; ++next) {
        if (this.value(next) < this.value(low)) low = next;
        if (this.value(next) > this.value(high)) high = next;
      }
      let taken = -1;
      for (const index of [begin, Math.min(low, high), Math.max(low, high), next - 1]) {
        if (index > taken) take(this.time(index), this.value(index));
        taken = index;
      }
    }
  }

  // Moves all to the front, and takes more room only where that frees little.
  #makeRoom() {
    const room = this.#times.length * (this.size * 4 > this.#times.length * 3 ? 2 : 1);
    const times = new Float64Array(room);
    const values = new Float64Array(room);
    times.set(this.#times.subarray(this.#begin, this.#end));
    values.set(this.#values.subarray(this.#begin, this.#end));
    this.#end = this.size;
    this.#begin = 0;
    this.#times = times;
    this.#values = values;
  }
}
