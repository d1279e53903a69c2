# SPDX-License-Identifier: MIT
"""The other side of the air: simulated radios, access points, addresses, a second station.

Radio 0 is the device's own and stays where the program is. All others live in network namespaces
of their own, so that nothing reaches them but what is sent through the air. Every access point
has a network of its own, 10.9.N.0/24 with the access point as 10.9.N.1: an address tells who gave
it."""

import subprocess

from probe import wait_until

AIR = "air"
FAR = "far"
BEYOND = "10.99.0.1"  # beyond the gateways: answers only what is routed
LOGS = "/share/out"

_hostapd = {}  # the process of each radio


def run(*command, netns=None, check=True, **more):
    """Run a command, in a network namespace if one is named, and return what it printed."""
    if netns:
        command = ("ip", "netns", "exec", netns) + command
    done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, **more)
    if check and done.returncode:
        raise RuntimeError(f"{command}: {done.stdout.decode(errors='replace')}")
    return done.stdout.decode(errors="replace")


def start(*command, netns=None, log=None, env=None):
    """Start a command in the background; what it prints is kept in the file LOG."""
    if netns:
        command = ("ip", "netns", "exec", netns) + command
    out = open(f"{LOGS}/{log}", "ab") if log else subprocess.DEVNULL
    return subprocess.Popen(command, stdin=subprocess.DEVNULL, stdout=out, stderr=out,
                            env=env)


def radios(count, multi_link=False):
    """Switch COUNT radios on: wlan0 stays here, the last goes to FAR, the others to AIR. With
    MULTI_LINK they are radios of Wi-Fi 7, to which Linux since 6.3 gives no wireless extensions."""
    run("modprobe", "mac80211_hwsim", f"radios={count}", *(["mlo=1"] if multi_link else []))
    for name in (AIR, FAR):
        run("ip", "netns", "add", name)
        run("ip", "link", "set", "lo", "up", netns=name)
    for number in range(1, count):
        where = FAR if number == count - 1 else AIR
        run("iw", "phy", phy(number), "set", "netns", "name", where)
    run("ip", "addr", "add", f"{BEYOND}/32", "dev", "lo", netns=AIR)


def phy(number):
    """The name of the wiphy that the interface wlanN belongs to."""
    with open(f"/sys/class/net/wlan{number}/phy80211/name") as file:
        return file.read().strip()


def network(name, key=None, wep=None, hidden=False, net=None, wpa3=False):
    """One network as access_point takes it: NAME in bytes, KEY of WPA2 or, with WPA3, of WPA3,
    WEP in hexadecimal digits, NET its subnet's number or None for one without addresses."""
    return {"name": name, "key": key, "wep": wep, "hidden": hidden, "net": net, "wpa3": wpa3}


def access_point(radio, channel, networks, beacon=50, elements=b"", power=20):
    """Start hostapd on a radio of AIR with the given networks; its beacons come every BEACON
    units of 1.024 ms and hold ELEMENTS too. POWER is in dBm."""
    first = f"wlan{radio}"
    lines = [f"interface={first}", "driver=nl80211", f"hw_mode={'g' if channel < 15 else 'a'}",
             f"channel={channel}", f"beacon_int={beacon}", "ctrl_interface=/run/hostapd"]
    for index, one in enumerate(networks):
        if index:
            lines.append(f"bss={first}_{index}")
            lines.append("ctrl_interface=/run/hostapd")
        # The last byte of a simulated radio's address is free for its networks.
        lines.append(f"bssid=02:00:00:00:{radio:02x}:{index:02x}")
        lines.append(f"ssid2={one['name'].hex()}")
        lines.append(f"ignore_broadcast_ssid={int(one['hidden'])}")
        if elements:
            lines.append(f"vendor_elements={elements.hex()}")
        if one["wpa3"]:
            lines += ["wpa=2", "wpa_key_mgmt=SAE", "rsn_pairwise=CCMP", "ieee80211w=2",
                      f"sae_password={one['key']}"]
        elif one["key"]:
            lines += ["wpa=2", "wpa_key_mgmt=WPA-PSK", "rsn_pairwise=CCMP",
                      f"wpa_passphrase={one['key']}"]
        if one["wep"]:
            lines += ["auth_algs=1", "wep_default_key=0", f"wep_key0={one['wep']}"]
        lines += one.get("more", ())
    path = f"/tmp/hostapd-{radio}.conf"
    with open(path, "w") as file:
        file.write("\n".join(lines) + "\n")
    process = _hostapd[radio] = start("hostapd", "-t", path, netns=AIR, log=f"hostapd-{radio}.log")
    last = first if len(networks) == 1 else f"{first}_{len(networks) - 1}"

    def up():
        if process.poll() is not None:
            raise RuntimeError(f"hostapd of radio {radio} ended, see hostapd-{radio}.log")
        return "ssid" in run("iw", "dev", last, "info", netns=AIR, check=False)

    wait_until(up, f"radio {radio} on the air", 120)
    if power != 20:
        run("iw", "dev", first, "set", "txpower", "fixed", str(100 * power), netns=AIR)
    for index, one in enumerate(networks):
        if one["net"] is not None:
            device = f"{first}_{index}" if index else first
            run("ip", "addr", "replace", f"10.9.{one['net']}.1/24", "dev", device, netns=AIR)


def switch_off(radio):
    """Ends the access point on a radio."""
    _hostapd[radio].terminate()
    _hostapd[radio].wait()


def addresses(*nets, more=()):
    """Start the DHCP server for the given subnets, with MORE options. Return the process."""
    options = ["--no-daemon", "--conf-file=/dev/null", "--port=0", "--bind-dynamic",
               "--no-ping", "--leasefile-ro", "--user=root"]
    options += [f"--dhcp-range=10.9.{net}.100,10.9.{net}.150,255.255.255.0,1h" for net in nets]
    options += more
    return start("dnsmasq", *options, netns=AIR, log="dnsmasq.log")
