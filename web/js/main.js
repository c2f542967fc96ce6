// The console: one section at a time, chosen by the address's fragment (#users).
import * as users from './users.js';
import * as groups from './groups.js';
import * as quotas from './quotas.js';
import * as nfs from './nfs.js';
import * as dfs from './dfs.js';
import * as bulk from './bulk.js';
import * as domain from './domain.js';
import * as services from './services.js';

const sections = { users, groups, quotas, nfs, dfs, bulk, domain, services };

function show() {
  const id = location.hash.slice(1);
  const name = id in sections ? id : 'users';
  const view = document.getElementById('view');
  view.replaceChildren();
  for (const link of document.querySelectorAll('#sections a')) {
    if (link.getAttribute('href') === `#${name}`) link.setAttribute('aria-current', 'page');
    else link.removeAttribute('aria-current');
  }
  document.title = `${sections[name].title} · NAS administration`;
  sections[name].render(view);
  if (id in sections) view.focus({ preventScroll: true });
}

window.addEventListener('hashchange', show);
show();
