# Filled by the installation rules of this project; see README.md.
