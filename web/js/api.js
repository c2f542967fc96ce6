// Requests to the account program and the reading of its answers.
// Every change and query is one POST of the command's form fields to the CGI
// program; the program answers a small XML document or an empty page.

export const CGI = '/cgi-bin/nas-accounts.cgi';

export class RequestError extends Error {}

// Sends one command with its fields; resolves to { text, xml } (xml is null for an
// empty or non-XML answer).
export async function send(cmd, fields = {}) {
  const body = new URLSearchParams();
  body.append('cmd', cmd);
  for (const [name, value] of Object.entries(fields)) body.append(name, value == null ? '' : String(value));
  return answer(await post(body));
}

// A multipart form (file uploads): the command first, then the form's fields.
export async function upload(cmd, formData) {
  const body = new FormData();
  body.append('cmd', cmd);
  for (const [name, value] of formData.entries()) body.append(name, value);
  return answer(await post(body));
}

async function post(body) {
  let response;
  try {
    response = await fetch(CGI, { method: 'POST', body, cache: 'no-store' });
  } catch (error) {
    throw new RequestError('The device cannot be reached.');
  }
  if (!response.ok) throw new RequestError(`The device answered ${response.status} ${response.statusText}.`);
  return response;
}

async function answer(response) {
  const text = await response.text();
  const type = response.headers.get('Content-Type') || '';
  let xml = null;
  if (text.startsWith('<?xml') || type.includes('xml')) {
    // The domain answers keep a line break after the prologue; the parser takes both.
    const doc = new DOMParser().parseFromString(text.trim(), 'application/xml');
    if (!doc.querySelector('parsererror')) xml = doc;
  }
  return { text, xml };
}

// The text of the first element of that name, or '' when there is none.
export function field(xml, name) {
  const node = xml && xml.getElementsByTagName(name)[0];
  return node ? node.textContent : '';
}

export function fields(xml, name) {
  return xml ? Array.from(xml.getElementsByTagName(name), (node) => node.textContent) : [];
}

// A grid answer: rows of cells, the page echoed and the total counted.
export function grid(xml) {
  const rows = xml ? Array.from(xml.getElementsByTagName('row'), (row) => ({
    id: Number(row.getAttribute('id')),
    cells: Array.from(row.getElementsByTagName('cell'), (cell) => cell.textContent),
  })) : [];
  return { rows, page: field(xml, 'page'), total: Number(field(xml, 'total')) || 0 };
}

// Passwords travel base64-encoded, of their UTF-8 bytes.
export function base64(text) {
  const bytes = new TextEncoder().encode(text);
  let binary = '';
  for (const byte of bytes) binary += String.fromCharCode(byte);
  return btoa(binary);
}

export function unbase64(text) {
  try {
    const binary = atob(text.replace(/ /g, '+'));
    return new TextDecoder().decode(Uint8Array.from(binary, (c) => c.charCodeAt(0)));
  } catch {
    return '';
  }
}

// Lists the program sends joined by "#" (user and group names of the info answers).
export function hashList(text) {
  return text ? text.split('#').filter(Boolean) : [];
}

export function commaList(text) {
  return text ? text.split(',').map((s) => s.trim()).filter(Boolean) : [];
}

// The volumes of the device as the user and group info answers give them.
export async function volumes() {
  const { xml } = await send('cgi_get_group_info');
  const names = fields(xml, 'v_name');
  const sizes = field(xml, 'hddsize').split(',');
  return names.map((name, i) => ({ name, index: i + 1, size: Number(sizes[i]) || 0 }));
}

export async function accounts() {
  const { xml } = await send('cgi_get_user_info');
  return { users: hashList(field(xml, 'all_user')), groups: hashList(field(xml, 'all_group')) };
}

// All local users with their groups, from the user grid (at most 999 rows a page).
export async function usersWithGroups() {
  const all = [];
  for (let page = 1; page < 100; page++) {
    const { xml } = await send('cgi_get_user_list', { page, rp: 999 });
    const g = grid(xml);
    for (const row of g.rows) all.push({ name: row.cells[0], groups: commaList(row.cells[1]) });
    if (page * 999 >= g.total) break;
  }
  return all;
}
