// Changes the page after it was built: text, a class, and a new element.
const state = document.getElementById("state");
state.textContent = "ready";

const tile = document.createElement("div");
tile.className = "tile added";
const inner = document.createElement("div");
inner.className = "inner flex";
const label = document.createElement("span");
label.textContent = "four";
inner.appendChild(label);
tile.appendChild(inner);
document.getElementById("tiles").appendChild(tile);

console.log("tiles:", document.getElementsByClassName("tile").length);
