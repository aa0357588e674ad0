// The wares of the day, as a game's model would hold them.
const wares = [
    { name: 'Saltwind', kind: 'Greatblade', icon: 'blade', rarity: 'legendary', price: '9 600', coin: 'gold', selected: true },
    { name: 'Reed Walker', kind: 'Boots', icon: 'boots', rarity: 'rare', price: '1 850', coin: 'gold' },
    { name: 'Glass Heron', kind: 'Companion', icon: 'bird', rarity: 'epic', price: '420', coin: 'pearl', note: 'NEW' },
    { name: 'Tideward', kind: 'Shield', icon: 'shield', rarity: 'rare', price: '2 300', coin: 'gold' },
    { name: 'Ember Draught', kind: 'Potion · 5', icon: 'potion', rarity: 'common', price: '240', coin: 'gold' },
    { name: 'Moonsilk Hood', kind: 'Hood', icon: 'hood', rarity: 'epic', price: '380', coin: 'pearl' },
    { name: 'Stormcall', kind: 'Focus', icon: 'bolt', rarity: 'epic', price: '5 400', coin: 'gold', note: '-20%' },
    { name: 'Pilgrim Robe', kind: 'Robe', icon: 'robe', rarity: 'common', price: '690', coin: 'gold', owned: true },
    { name: 'Deep Ring', kind: 'Ring', icon: 'ring', rarity: 'rare', price: '1 400', coin: 'gold' },
];

function make(parent, className, text) {
    const element = document.createElement('div');
    element.className = className;
    if (text) element.textContent = text;
    parent.appendChild(element);
    return element;
}

const grid = document.getElementById('grid');
for (const ware of wares) {
    const card = make(grid, 'ware ' + ware.rarity + (ware.selected ? ' selected' : '') + (ware.owned ? ' owned-ware' : ''));
    const art = make(card, 'ware-art');
    make(art, 'shine');
    make(art, 'icon ' + ware.icon);
    if (ware.note) make(card, 'note', ware.note);
    const text = make(card, 'ware-text');
    make(text, 'ware-name', ware.name);
    make(text, 'ware-kind', ware.kind);
    const foot = make(card, 'ware-foot');
    if (ware.owned) {
        make(foot, 'mark');
        make(foot, 'ware-price', 'Owned');
    } else {
        make(foot, 'coin ' + ware.coin);
        make(foot, 'ware-price', ware.price);
    }
}
