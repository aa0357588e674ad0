// What the game would set through data binding: the compass strip and the rounds of the magazine.
function add(parent, className, text) {
    const element = document.createElement('div');
    element.className = className;
    if (text) element.textContent = text;
    parent.appendChild(element);
    return element;
}

const strip = document.getElementById('strip');
const names = { 270: 'W', 285: '285', 300: '300', 315: 'NW', 330: '330', 345: '345', 360: 'N' };
for (let bearing = 260; bearing <= 364; bearing += 5) {
    const mark = add(strip, names[bearing] ? 'mark long' : 'mark');
    mark.style.left = ((bearing - 260) / 104 * 100).toFixed(2) + '%';
    if (names[bearing]) add(mark, bearing % 45 ? 'mark-name' : 'mark-name main', names[bearing]);
}

const rounds = document.getElementById('rounds');
for (let i = 0; i < 30; ++i) add(rounds, i < 24 ? 'round' : 'round spent');
