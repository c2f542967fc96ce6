#!/usr/bin/python3
"""The administration console in a real browser (headless Chromium driven by
Selenium), in front of a fresh simulated device per scenario.

Each scenario checks what the page shows and what the device did (its files, the
journal of platform calls, the system log). Any message on the browser's console
fails the scenario; a failing scenario leaves a screenshot in $NAS_BUILD/browser-failures.

    /usr/bin/python3 tests/browser/console_test.py [ConsoleTest.test_...]

The built programs come from $NAS_BUILD (default: build/ in the repository).
"""
import os
import shutil
import signal
import socket
import subprocess
import sys
import tempfile
import time
import unittest
import urllib.request
import warnings

from selenium import webdriver
from selenium.common.exceptions import StaleElementReferenceException, TimeoutException
from selenium.webdriver.chrome.service import Service
from selenium.webdriver.common.by import By
from selenium.webdriver.common.keys import Keys
from selenium.webdriver.support import expected_conditions as EC
from selenium.webdriver.support.ui import WebDriverWait

with warnings.catch_warnings():
    warnings.simplefilter('ignore', DeprecationWarning)
    import crypt

REPO = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
BUILD = os.environ.get('NAS_BUILD', os.path.join(REPO, 'build'))
DEVROOT = os.path.join(REPO, 'scripts', 'devroot')
# A bound on every wait for the page, not a speed requirement.
WAIT = 30


def free_port():
    with socket.socket() as s:
        s.bind(('127.0.0.1', 0))
        return s.getsockname()[1]


class Device:
    """A fresh simulated device with its web server on a free loopback port."""

    def __init__(self, workdir):
        self.root = os.path.join(workdir, 'device')
        env = dict(os.environ, NAS_BUILD=BUILD)
        subprocess.run([DEVROOT, 'create', self.root], check=True, env=env, stdout=subprocess.DEVNULL)
        self.port = free_port()
        self.server = subprocess.Popen([DEVROOT, 'serve', self.root, '--port', str(self.port)], env=env,
                                       stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        self.url = f'http://127.0.0.1:{self.port}/'
        for _ in range(200):
            try:
                with urllib.request.urlopen(self.url, timeout=1):
                    return
            except OSError:
                time.sleep(0.05)
        raise RuntimeError('the device\'s web server did not start')

    def stop(self):
        self.server.send_signal(signal.SIGTERM)
        try:
            self.server.wait(timeout=10)
        except subprocess.TimeoutExpired:
            self.server.kill()
            self.server.wait()

    def path(self, name):
        return os.path.join(self.root, name.lstrip('/'))

    def read(self, name):
        with open(self.path(name), encoding='utf-8', errors='replace', newline='') as f:
            return f.read()

    def write(self, name, text):
        with open(self.path(name), 'w', encoding='utf-8') as f:
            f.write(text)

    def exists(self, name):
        return os.path.exists(self.path(name))

    def journal(self):
        """The journal's events, each a list of its fields."""
        def unescape(field):
            return field.replace('\\t', '\t').replace('\\n', '\n').replace('\\\\', '\\')
        return [[unescape(f) for f in line.split('\t')] for line in self.read('/var/log/platform.log').splitlines()]

    def ran(self, prefix):
        """The shell command lines that begin with prefix."""
        return [e[2] for e in self.journal() if e[:2] == ['sh', '-c'] and len(e) > 2 and e[2].startswith(prefix)]

    def calls(self, name):
        return [e[1:] for e in self.journal() if e[0] == name]

    def account(self, name, file='/etc/passwd'):
        for line in self.read(file).splitlines():
            if line.split(':')[0] == name:
                return line.split(':')
        return None

    def members(self, group):
        entry = self.account(group, '/etc/group')
        return entry[3].split(',') if entry and entry[3] else []


class ConsoleTest(unittest.TestCase):
    width = 1280

    def setUp(self):
        self.workdir = tempfile.mkdtemp(prefix='nas-console-')
        self.device = Device(self.workdir)
        self.addCleanup(shutil.rmtree, self.workdir, ignore_errors=True)
        self.addCleanup(self.device.stop)
        options = webdriver.ChromeOptions()
        options.binary_location = '/usr/bin/chromium'
        for arg in ('--headless', '--no-sandbox', '--disable-gpu', '--disable-quic', '--no-first-run',
                    '--disable-background-networking', '--disable-component-update', '--disable-sync',
                    '--disable-dev-shm-usage', f'--user-data-dir={os.path.join(self.workdir, "chromium")}',
                    f'--window-size={self.width},900'):
            options.add_argument(arg)
        options.set_capability('goog:loggingPrefs', {'browser': 'ALL'})
        self.browser = webdriver.Chrome(service=Service('/usr/bin/chromedriver'), options=options)
        self.addCleanup(self.browser.quit)
        # The page redraws its tables after each change: a row found just before is read again.
        self.wait = WebDriverWait(self.browser, WAIT, poll_frequency=0.05, ignored_exceptions=(StaleElementReferenceException,))
        if self.width < 500:
            # A window is never narrower than 500 pixels; a phone's screen is emulated.
            self.browser.execute_cdp_cmd('Emulation.setDeviceMetricsOverride',
                                         {'width': self.width, 'height': 780, 'deviceScaleFactor': 1, 'mobile': True})

    def tearDown(self):
        # A failing scenario leaves a picture of the page.
        outcome = getattr(self, '_outcome', None)
        errors = getattr(getattr(outcome, 'result', None), 'errors', []) + getattr(getattr(outcome, 'result', None), 'failures', [])
        if any(test is self for test, _ in errors) or (outcome and not outcome.success):
            folder = os.path.join(BUILD, 'browser-failures')
            os.makedirs(folder, exist_ok=True)
            shot = os.path.join(folder, f'{self._testMethodName}.png')
            self.browser.save_screenshot(shot)
            print(f'screenshot: {shot}', file=sys.stderr)
        logs = self.browser.get_log('browser')
        self.assertEqual([entry for entry in logs if entry['level'] in ('SEVERE', 'WARNING')], [],
                         'the browser console shows messages')

    # Page helpers.
    def open(self, section):
        self.browser.get(f'{self.device.url}#{section}')
        self.wait.until(EC.presence_of_element_located((By.CSS_SELECTOR, 'main .panel')))

    def find(self, css, root=None):
        return self.wait.until(lambda d: (root or d).find_element(By.CSS_SELECTOR, css))

    def button(self, text, root=None):
        xpath = f'.//button[normalize-space()="{text}"]'
        return self.wait.until(lambda d: next((b for b in (root or d).find_elements(By.XPATH, xpath)
                                               if b.is_displayed() and b.is_enabled()), None))

    def dialog(self):
        return self.find('dialog[open]')

    def fill(self, label, text, root=None):
        """Types into the input that the label names (every input has one)."""
        scope = root or self.browser
        label_node = self.wait.until(lambda d: scope.find_element(By.XPATH, f'.//label[normalize-space()="{label}"]'))
        box = self.browser.find_element(By.ID, label_node.get_attribute('for'))
        if box.get_attribute('type') == 'checkbox':
            if box.is_selected() != bool(text):
                label_node.click()
        else:
            box.clear()
            box.send_keys(text)
        return box

    def row(self, key):
        return self.find(f'tr[data-key="{key}"]')

    def keys(self, table='main table'):
        return self.browser.execute_script(
            'return Array.from(document.querySelectorAll(arguments[0]), (r) => r.dataset.key)', f'{table} tbody tr[data-key]')

    def message(self, kind, text, root=None):
        """Waits for the message line to say text; returns what it says."""
        css = f'.msg.{kind}'
        try:
            return self.wait.until(lambda d: next((m.text for m in (root or d).find_elements(By.CSS_SELECTOR, css)
                                                   if m.is_displayed() and text in m.text), None))
        except TimeoutException:
            shown = [m.text for m in self.browser.find_elements(By.CSS_SELECTOR, '.msg') if m.is_displayed()]
            self.fail(f'no {kind} message "{text}"; the page shows {shown}')

    def idle(self):
        self.wait.until(lambda d: not d.find_elements(By.CSS_SELECTOR, '[aria-busy="true"]'))

    # Scenarios.
    def test_create_find_and_change_a_user(self):
        self.open('users')
        self.button('Add user').click()
        dialog = self.dialog()
        self.fill('Name', 'dave', dialog)
        self.fill('Description (full name)', 'Dave Doe', dialog)
        self.fill('E-mail', 'dave@example.com', dialog)
        self.fill('Password', 's3cret pass', dialog)
        self.fill('Password again', 's3cret pass', dialog)
        self.fill('family', True, dialog)
        self.fill('office', True, dialog)
        self.button('Create', dialog).click()
        self.message('ok', 'User dave created.')
        self.assertIn('family, office'.replace(' ', ''), self.row('dave').text.replace(' ', ''))

        passwd = self.device.account('dave')
        self.assertEqual(passwd[4], 'Dave Doe,,,,dave@example.com')
        hashed = self.device.account('dave', '/etc/shadow')[1]
        self.assertTrue(hashed.startswith('$6$'))
        self.assertEqual(crypt.crypt('s3cret pass', hashed), hashed)
        self.assertIn('dave', self.device.members('family'))
        self.assertIn('dave', self.device.members('office'))
        self.assertIn('<14>SYSTEM: Account "dave" has been created.', self.device.read('/var/log/messages'))

        # The search finds it, and the search stays while the user is changed.
        self.fill('Search by name', 'dav')
        self.button('Search').click()
        self.wait.until(lambda d: self.keys() == ['dave'])
        self.button('Edit', self.row('dave')).click()
        dialog = self.dialog()
        self.fill('office', False, dialog)
        self.fill('New description', 'David Doe', dialog)
        self.button('Save', dialog).click()
        self.message('ok', 'User dave saved.')
        self.wait.until(lambda d: self.keys() == ['dave'] and 'office' not in self.row('dave').text)
        self.assertEqual(self.find('input[type=search]').get_attribute('value'), 'dav')
        self.assertEqual(self.device.account('dave')[4].split(',')[0], 'David Doe')
        self.assertNotIn('dave', self.device.members('office'))
        self.assertIn('dave', self.device.members('family'))
        self.assertEqual(self.device.ran("account -m -u 'dave' -l"), ["account -m -u 'dave' -l 'family'"])

        # A name the device does not take is refused with its reason, and nothing runs.
        self.button('Add user').click()
        dialog = self.dialog()
        self.fill('Name', 'bad name', dialog)
        self.button('Create', dialog).click()
        self.message('error', '"bad name" is not a valid user name', dialog)
        dialog.send_keys(Keys.ESCAPE)
        self.wait.until(lambda d: not d.find_elements(By.CSS_SELECTOR, 'dialog[open]'))
        self.assertEqual(len(self.device.ran('account -a')), 1)

    def test_delete_a_user_after_confirming(self):
        self.open('users')
        self.button('Delete', self.row('bob')).click()
        dialog = self.dialog()
        self.assertIn('Delete bob?', dialog.text)
        self.button('Cancel', dialog).click()
        self.idle()
        self.assertEqual(self.device.ran('account -d'), [])
        self.assertIsNotNone(self.device.account('bob'))

        self.button('Delete', self.row('bob')).click()
        self.button('Delete', self.dialog()).click()
        self.message('ok', 'Deleted bob.')
        self.wait.until(lambda d: 'bob' not in self.keys())
        self.assertEqual(self.keys(), ['alice', 'carol'])
        self.assertIsNone(self.device.account('bob'))
        self.assertEqual(self.device.ran('account -d'), ["account -d -u 'bob'"])
        self.assertIn('<14>SYSTEM: Account "bob" has been deleted.', self.device.read('/var/log/messages'))

    def test_quota_on_a_volume_and_its_bound(self):
        self.open('quotas')
        self.button('Set limits', self.row('alice')).click()
        dialog = self.dialog()
        self.fill('Limit on Volume_1 (MB)', '100', dialog)
        self.button('Save', dialog).click()
        self.message('ok', 'Limits of alice saved.')
        self.wait.until(lambda d: '100 MB' in self.row('alice').text)
        self.assertIn('u\tHD_a2\talice\t102400', self.device.read('/var/lib/platform/quota'))
        self.assertEqual(self.device.calls('LIB_Set_User_Quota'), [['HD_a2', 'alice', '102400']])

        # family gets 500 MB; bob, in family, may not get more.
        self.button('Groups').click()
        self.button('Set limits', self.row('family')).click()
        dialog = self.dialog()
        self.assertIn('at least 100 MB', dialog.text)
        self.fill('Limit on Volume_1 (MB)', '500', dialog)
        self.button('Save', dialog).click()
        self.message('ok', 'Limits of group family saved.')
        self.button('Users').click()
        self.button('Set limits', self.row('bob')).click()
        dialog = self.dialog()
        self.fill('Limit on Volume_1 (MB)', '600', dialog)
        self.button('Save', dialog).click()
        self.message('error', 'The limit of bob on Volume_1 can be at most 500 MB', dialog)
        self.assertEqual([c[1] for c in self.device.calls('LIB_Set_User_Quota')], ['alice'])

    def test_export_a_share_to_a_network(self):
        self.open('nfs')
        self.button('Export', self.row('Public')).click()
        dialog = self.dialog()
        self.fill('Host or network', '192.168.1.0/24 x', dialog)
        self.button('Export', dialog).click()
        self.message('error', 'is not a host, a network', dialog)
        self.fill('Host or network', '192.168.1.0/24', dialog)
        self.button('Export', dialog).click()
        self.message('ok', 'Public exported to 192.168.1.0/24.')
        self.wait.until(lambda d: '192.168.1.0/24, read-write' in self.row('Public').text)
        self.assertEqual(self.device.read('/etc/exports'),
                         '"/nfs/Public" 192.168.1.0/24(rw,all_squash,sync,no_wdelay,insecure_locks,insecure,'
                         'no_subtree_check,anonuid=501,anongid=1000)\n')
        self.assertEqual(self.device.ran('exportfs'), ['exportfs -r > /dev/null 2>&1'])
        self.assertIn('1', self.find('dl.facts').text)

    def test_twenty_numbered_users_with_progress(self):
        # The device's account_mgr waits for a gate file, so the run can be watched.
        self.device.write('/sim/account_mgr.conf', 'delay_ms=20\ngate=/tmp/go\n')
        self.open('bulk')
        self.fill('Name prefix', 'u')
        self.fill('First number', '01')
        self.fill('How many', '20')
        self.fill('Password for all', 'batchpw')
        self.fill('Password again', 'batchpw')
        self.fill('family', True)
        create = self.button('Create users')
        create.click()
        bar = self.find('progress')
        self.wait.until(lambda d: self.device.exists('/tmp/start_create_users'))
        self.wait.until(lambda d: bar.is_displayed() and '0 of 20 created' in self.find('.progress p').text)
        self.assertEqual(bar.get_attribute('value'), '0')
        self.assertFalse(create.is_enabled())
        self.device.write('/tmp/go', '')
        self.message('ok', '20 users created.')
        self.assertEqual((bar.get_attribute('value'), bar.get_attribute('max')), ('20', '20'))
        self.assertIn('Done: all 20 created.', self.find('.progress').text)
        self.assertTrue(create.is_enabled())
        names = [f'u{n:02d}' for n in range(1, 21)]
        self.assertEqual([li.text for li in self.browser.find_elements(By.CSS_SELECTOR, 'ul.results li')],
                         [f'{n}: created' for n in names])
        for name in names:
            self.assertIsNotNone(self.device.account(name), name)
            self.assertIn(name, self.device.members('family'))
        self.assertEqual(len(self.device.read('/tmp/account_batch_info').splitlines()), 20)
        self.assertIn('<14>SYSTEM: Account "u1-u20" has been created.', self.device.read('/var/log/messages'))

    def test_import_a_small_file(self):
        upload = os.path.join(self.workdir, 'people.txt')
        with open(upload, 'w', encoding='utf-8') as f:
            f.write('# two people\r\nerin\terin-pass\toffice\t\t\t\t\r\nfrank\tfrank-pass\t\t\t\t\t\r\n')
        self.open('bulk')
        self.fill('File of users', upload)
        self.button('Upload').click()
        self.message('info', '2 users in the file.')
        self.assertEqual(self.device.read('/tmp/import_users'),
                         '# two people\r\nerin\terin-pass\toffice\t\t\t\t\r\nfrank\tfrank-pass\t\t\t\t\t\r\n')
        self.assertEqual([r.text.split()[0] for r in self.browser.find_elements(By.CSS_SELECTOR, 'form table tbody tr')],
                         ['erin', 'frank'])
        self.button('Create these users').click()
        self.message('ok', '2 users created.')
        self.assertIn('Done: all 2 created.', self.find('.progress:not([hidden])').text)
        self.assertIn('erin', self.device.members('office'))
        self.assertIsNotNone(self.device.account('frank'))
        self.assertEqual(self.device.read('/tmp/account_status'), 'erin:0\nfrank:0\n')


class NarrowConsoleTest(ConsoleTest):
    """The same page on a 360-pixel-wide phone: nothing wider than the screen."""
    width = 360

    def test_every_section_fits(self):
        for section in ('users', 'groups', 'quotas', 'nfs', 'dfs', 'bulk', 'domain', 'services'):
            self.open(section)
            self.idle()
            width = self.browser.execute_script('return document.documentElement.scrollWidth')
            inner = self.browser.execute_script('return window.innerWidth')
            self.assertLessEqual(width, inner, section)
            self.assertEqual(inner, self.width)


# The narrow class runs only its own scenario.
for name in [n for n in vars(ConsoleTest) if n.startswith('test_')]:
    setattr(NarrowConsoleTest, name, None)

if __name__ == '__main__':
    unittest.main()
