// The stable insertion sort of the fills' small or nearly ordered tables: linear when little is
// out of place, which is the usual case from one sample line to the next.
#ifndef ZV_RASTER_INSERTION_SORT_H
#define ZV_RASTER_INSERTION_SORT_H

// Sorts e[0..count) so that no element comes before one it belongs `after`; elements that are
// not after one another keep their order. `placed(i)` is told each position written.
template <class T, class After, class Placed>
void zvInsertionSort(T* e, int count, After after, Placed placed) {
  for (int i = 1; i < count; ++i) {
    if (!after(e[i - 1], e[i])) continue;
    const T moving = e[i];
    int j = i;
    for (; j > 0 && after(e[j - 1], moving); --j) {
      e[j] = e[j - 1];
      placed(j);
    }
    e[j] = moving;
    placed(j);
  }
}

template <class T, class After>
void zvInsertionSort(T* e, int count, After after) {
  zvInsertionSort(e, count, after, [](int) {});
}

#endif
