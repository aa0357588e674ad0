// The last frames as columns; a game would set them from its own counters.
const spark = document.getElementById('spark');
const frames = [38, 42, 40, 47, 44, 52, 49, 46, 61, 50, 45, 43, 48, 55, 72, 58, 49, 47, 44, 46, 51, 48, 45, 43];
for (const height of frames) {
    const column = document.createElement('div');
    column.className = height > 60 ? 'column slow' : 'column';
    column.style.height = height + '%';
    spark.appendChild(column);
}
