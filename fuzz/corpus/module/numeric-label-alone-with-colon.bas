Function a1:
y