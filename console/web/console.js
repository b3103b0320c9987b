// The page of `tessella-console --web`: the screen of the program, and a bar above it.
import RFB from "@novnc/novnc";

const consoles = 4;
const switchToConsole = 0x1008fe00;  // the key symbol of a console is its number more
const retryPause = 1000;

// What browsers, or the systems that they run on, like to keep for themselves.
const combinations = {
    "Ctrl W": ["ControlLeft", "KeyW"],
    "Ctrl T": ["ControlLeft", "KeyT"],
    "Ctrl N": ["ControlLeft", "KeyN"],
    "Alt Tab": ["AltLeft", "Tab"],
    "Alt F4": ["AltLeft", "F4"],
    "F11": ["F11"],
    "Esc": ["Escape"],
    "Ctrl Alt Del": ["ControlLeft", "AltLeft", "Delete"],
    "Ctrl Alt F1": ["ControlLeft", "AltLeft", "F1"],
    "Ctrl Alt F2": ["ControlLeft", "AltLeft", "F2"],
};

const part = (id) => document.getElementById(id);
const screen = part("screen");
let rfb = null;
let password = null;  // the one that was right, or may be

function tell(state, text) {
    document.body.dataset.state = state;
    part("state").value = text;
}

/// The session begins with an open socket: while there is none to be had, nothing on the page changes.
function connect() {
    const address = new URL("socket", location);
    address.protocol = location.protocol === "https:" ? "wss:" : "ws:";
    const socket = new WebSocket(address);
    socket.onclose = () => setTimeout(connect, retryPause);
    socket.onopen = () => {
        socket.onclose = null;
        begin(socket);
    };
}

function begin(socket) {
    screen.replaceChildren();
    rfb = new RFB(screen, socket);
    rfb.background = "transparent";
    scale();
    rfb.addEventListener("connect", () => {
        tell("connected", "connected");
        rfb.focus();
    });
    rfb.addEventListener("credentialsrequired", () => {
        if (password === null) part("asking").showModal();
        else rfb.sendCredentials({ password });
    });
    rfb.addEventListener("securityfailure", () => {
        tell("waiting", password === null ? "refused" : "wrong password");
        password = null;
    });
    rfb.addEventListener("disconnect", end);
    new ResizeObserver(smooth).observe(screen.querySelector("canvas"));
}

function end() {
    part("asking").close();
    if (document.body.dataset.state === "connected") {
        tell("ended", "ended; waiting for the next program");
        const last = new Image();
        last.src = rfb.toDataURL();
        screen.replaceChildren(last);
    }
    rfb = null;
    setTimeout(connect, retryPause);
}

function scale() {
    if (rfb) rfb.scaleViewport = part("fit").ariaPressed === "true";
}

/// Pixels stay squares when they grow. Where some have to go, it is better that none of them does wholly.
function smooth([{ target, contentRect }]) {
    target.classList.toggle("enlarged", contentRect.width >= target.width);
}

/// Keys are told by their places; what they mean is the program's affair.
function press(codes) {
    for (const code of codes) rfb.sendKey(null, code, true);
    for (const code of codes.toReversed()) rfb.sendKey(null, code, false);
}

function saveScreenshot() {
    const link = document.createElement("a");
    link.href = rfb.toDataURL();
    link.download = "screenshot.png";
    link.click();
}

async function fillDisplay() {
    if (document.fullscreenElement) return document.exitFullscreen();
    await document.documentElement.requestFullscreen();
    await navigator.keyboard?.lock();
}

function toggleFit() {
    part("fit").ariaPressed = part("fit").ariaPressed === "false";
    scale();
}

/// Whatever is clicked, the keys remain the program's.
function onClick(button, act) {
    button.addEventListener("click", () => {
        part("keys").open = false;
        if (rfb) act();
        rfb?.focus();
    });
}

function addButton(parent, text, act) {
    const button = document.createElement("button");
    button.textContent = text;
    parent.append(button);
    onClick(button, act);
    return button;
}

for (let number = 1; number <= consoles; ++number)
    addButton(part("consoles"), number, () => rfb.sendKey(switchToConsole + number)).title =
        number === 1 ? "Console 1, the program's" : `Console ${number}`;
for (const [text, codes] of Object.entries(combinations))
    addButton(part("keys").lastElementChild, text, () => press(codes));
onClick(part("fit"), toggleFit);
onClick(part("screenshot"), saveScreenshot);
onClick(part("full"), fillDisplay);
document.addEventListener("mousedown", (event) => part("asking").open || event.preventDefault());
part("asking").addEventListener("close", () => {
    if (!rfb || document.body.dataset.state === "connected") return;
    password = part("password").value;
    part("password").value = "";
    rfb.sendCredentials({ password });
});

tell("waiting", "connecting");
connect();
