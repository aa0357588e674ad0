// The third line comes to the top of the container.
document.querySelector('.scroll').scrollTop = 44;
