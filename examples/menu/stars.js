// Stars at fixed places: a small generator of its own keeps the picture the same on every run.
let seed = 7;
function random() {
    seed = (seed * 16807) % 2147483647;
    return seed / 2147483647;
}
const sky = document.getElementById('stars');
for (let i = 0; i < 90; ++i) {
    const star = document.createElement('div');
    star.className = random() > 0.85 ? 'star bright' : 'star';
    star.style.left = (random() * 100).toFixed(2) + '%';
    star.style.top = (random() * random() * 62).toFixed(2) + '%';
    star.style.opacity = (0.25 + random() * 0.75).toFixed(2);
    sky.appendChild(star);
}
