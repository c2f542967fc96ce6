// What the device accepts, checked before a request is sent, so that a refusal
// comes with its reason. The sizes are the program's form buffers less one byte.
import { Refusal } from './ui.js';

// Account names as the device's account tool takes them.
export function checkName(kind, name) {
  if (!name) throw new Refusal(`Enter a ${kind} name.`);
  if (name.length > 32) throw new Refusal(`A ${kind} name has at most 32 characters.`);
  if (/^[-.]/.test(name)) throw new Refusal(`A ${kind} name may not begin with "-" or ".".`);
  if (!/^[A-Za-z0-9._-]+$/.test(name)) {
    throw new Refusal(`"${name}" is not a valid ${kind} name: use letters, digits, ".", "_" and "-" only.`);
  }
}

// Free texts stored in the account entry (description, e-mail).
export function checkText(label, text, max) {
  if (text.length > max) throw new Refusal(`${label} has at most ${max} characters.`);
  if (/[:,\n]/.test(text)) throw new Refusal(`${label} may not contain ":" or ",".`);
  if (text.includes('`') || text.includes('$(')) throw new Refusal(`${label} may not contain "\`" or "$(".`);
}

export function checkPassword(pw, again, max = 127) {
  if (pw !== again) throw new Refusal('The two passwords differ.');
  if (new TextEncoder().encode(pw).length > max) throw new Refusal(`A password has at most ${max} bytes.`);
}

// A whole number of megabytes, 0 for no limit.
export function megabyteValue(label, text) {
  const value = text.trim() === '' ? 0 : Number(text);
  if (!Number.isInteger(value) || value < 0) throw new Refusal(`${label}: enter a whole number of megabytes (0 for no limit).`);
  if (value > 2 ** 43) throw new Refusal(`${label}: that is more than any volume holds.`);
  return value;
}

// Hosts of NFS rules: an address, a network (address/prefix or address/mask), a
// host name, or "*" for everyone; at most 31 characters.
export function checkHost(host) {
  if (!host) throw new Refusal('Enter the host or network to export to.');
  if (host.length > 31) throw new Refusal('A host or network has at most 31 characters.');
  const octet = '(25[0-5]|2[0-4]\\d|1?\\d?\\d)';
  const ip = `${octet}(\\.${octet}){3}`;
  const network = new RegExp(`^${ip}(/(3[0-2]|[12]?\\d|${ip}))?$`);
  const name = /^(\*|[A-Za-z0-9*?]([A-Za-z0-9.*?-]*[A-Za-z0-9*?])?)$/;
  if (!network.test(host) && !(name.test(host) && !/^[\d.]+$/.test(host))) {
    throw new Refusal(`"${host}" is not a host, a network such as 192.168.1.0/24, or "*".`);
  }
}
