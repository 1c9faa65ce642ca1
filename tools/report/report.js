'use strict';

// Searching: entries, and the lines within them, that hold all words of the query.
(() => {
  const kMostOpened = 300; // lines that a search lays open by itself
  const form = document.getElementById('search');
  const query = document.getElementById('query');
  const matches = document.getElementById('matches');
  const sections = [...document.querySelectorAll('main > section')];
  let entries = null;

  // Made at the first search: a big policy has many lines.
  const indexed = () => [...document.querySelectorAll('.entry')].map((element) => {
    const head = element.querySelector(':scope > summary') || element;
    return {
      element,
      section: element.closest('section'),
      wasOpen: element.open,
      head: head.textContent.toLowerCase(),
      lines: [...element.querySelectorAll('.rules > li')].map((line) => (
        { element: line, text: line.textContent.toLowerCase() }
      )),
      groups: [...element.querySelectorAll('.group')].map((group) => (
        { element: group, wasOpen: group.open }
      )),
    };
  });

  // The lines of an entry that are to be shown; null when the entry is not.
  const found = (entry, words) => {
    const missing = words.filter((word) => !entry.head.includes(word));
    if (missing.length === 0) return { lines: entry.lines, isWhole: true };
    const lines = entry.lines.filter((line) => missing.every((word) => line.text.includes(word)));
    return lines.length === 0 ? null : { lines, isWhole: false };
  };

  const counted = (count, what, ending) => `${count} ${what}${count === 1 ? '' : ending}`;

  const showAll = () => {
    for (const entry of entries) {
      entry.element.hidden = false;
      for (const line of entry.lines) line.element.hidden = false;
      for (const group of entry.groups) {
        group.element.hidden = false;
        group.element.open = group.wasOpen;
      }
      if (entry.element.tagName === 'DETAILS') entry.element.open = entry.wasOpen;
    }
    for (const section of sections) section.hidden = false;
    matches.textContent = '';
  };

  const showEntry = (entry, result, isOpened) => {
    entry.element.hidden = result === null;
    if (result === null) return;
    const shown = new Set(result.lines);
    for (const line of entry.lines) line.element.hidden = !shown.has(line);
    for (const group of entry.groups) {
      group.element.hidden = !result.isWhole && !group.element.querySelector('li:not([hidden])');
      group.element.open = group.wasOpen || (isOpened && !result.isWhole);
    }
    if (entry.element.tagName === 'DETAILS') entry.element.open = isOpened && !result.isWhole;
  };

  const showFound = (words) => {
    const results = entries.map((entry) => found(entry, words));
    const lines = results.reduce((sum, result) => (
      sum + (result && !result.isWhole ? result.lines.length : 0)
    ), 0);
    const sectionsShown = new Set();
    entries.forEach((entry, i) => {
      showEntry(entry, results[i], lines <= kMostOpened);
      if (results[i]) sectionsShown.add(entry.section);
    });
    for (const section of sections) section.hidden = !sectionsShown.has(section);
    const entriesShown = results.filter(Boolean).length;
    matches.textContent = entriesShown === 0 ? 'Nothing matches' :
      `${counted(entriesShown, 'entr', 'ies').replace(/entr$/, 'entry')}, ` +
      `${counted(lines, 'line', 's')}`;
  };

  const search = () => {
    const words = query.value.toLowerCase().split(/\s+/).filter(Boolean);
    const isSearching = words.length > 0;
    const wasSearching = document.body.classList.contains('searching');
    if (!isSearching && !wasSearching) return;
    if (!wasSearching) entries = indexed();
    document.body.classList.toggle('searching', isSearching);
    if (isSearching) showFound(words); else showAll();
    if (isSearching && !wasSearching) window.scrollTo(0, 0);
  };

  const clear = () => {
    query.value = '';
    search();
  };

  // A link leads to an entry that is open and not left out by a search.
  const reveal = (id) => {
    const target = id && document.getElementById(id);
    if (!target) return;
    if (target.closest('[hidden]') || document.body.classList.contains('searching')) clear();
    if (target.tagName === 'DETAILS') target.open = true;
    target.scrollIntoView();
    const summary = target.querySelector(':scope > summary');
    if (summary) summary.focus({ preventScroll: true });
  };
  const idOf = (hash) => decodeURIComponent(hash.slice(1));

  let pending = 0;
  query.addEventListener('input', () => {
    clearTimeout(pending);
    pending = setTimeout(search, 120);
  });
  form.addEventListener('submit', (event) => {
    event.preventDefault();
    search();
  });
  document.addEventListener('keydown', (event) => {
    if (event.key === 'Escape') clear();
    if (event.key === '/' && event.target !== query) {
      event.preventDefault();
      query.focus();
    }
  });
  document.addEventListener('click', (event) => {
    const link = event.target.closest('a[href^="#"]');
    if (link && link.getAttribute('href') === location.hash) reveal(idOf(location.hash));
  });
  window.addEventListener('hashchange', () => reveal(idOf(location.hash)));
  reveal(idOf(location.hash));
  form.hidden = false;
})();

// The drawing: a domain that is pointed at stands out with what it is linked to.
(() => {
  const drawing = document.querySelector('.drawing svg');
  if (!drawing) return;
  const nodes = new Map();
  for (const node of drawing.querySelectorAll('.node')) nodes.set(node.dataset.domain, node);
  // Of very many links, those that leave a domain are one line, which does not say where to.
  const links = [...drawing.querySelectorAll('.link, .texture path')];

  const unmark = () => {
    drawing.classList.remove('marking');
    for (const element of drawing.querySelectorAll('.marked')) element.classList.remove('marked');
  };
  const mark = (event) => {
    unmark();
    const node = event.target.closest('.node');
    if (!node) return;
    drawing.classList.add('marking');
    node.classList.add('marked');
    for (const link of links) {
      const { from, to } = link.dataset;
      if (from !== node.dataset.domain && to !== node.dataset.domain) continue;
      link.classList.add('marked');
      nodes.get(from).classList.add('marked');
      if (to) nodes.get(to).classList.add('marked');
    }
  };
  drawing.addEventListener('mouseover', mark);
  drawing.addEventListener('focusin', mark);
  drawing.addEventListener('mouseleave', unmark);
  drawing.addEventListener('focusout', unmark);
})();
